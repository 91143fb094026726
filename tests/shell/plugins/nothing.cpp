#include <ZT/plug.h>

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    (void)catalog;
}
