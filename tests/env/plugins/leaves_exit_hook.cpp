#include "env/plugins/told.h"

#include <cstdlib>

ZT_PLUGIN("Test:2.1", catalog)
{
    (void)catalog;
    std::atexit([] { TellTheTest("exit hook"); });
}
