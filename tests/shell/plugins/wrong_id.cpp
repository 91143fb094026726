#include <ZT/plug.h>

ZT_PLUGIN("Directive:2.0", catalog)
{
    (void)catalog;
}
