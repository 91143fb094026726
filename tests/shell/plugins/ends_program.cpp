#include <ZT/plug.h>

#include <cstdlib>

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    (void)catalog;
    std::_Exit(7);
}
