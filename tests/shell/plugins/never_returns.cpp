#include <ZT/plug.h>

#include <unistd.h>

ZT_PLUGIN("Directive:1.0", catalog)
{
    (void)catalog;
    for (;;)
        pause();
}
