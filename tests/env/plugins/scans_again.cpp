#include "env/plugins/told.h"

#include <cstdlib>

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->AddPlug("before", nullptr);
    catalog->ScanDirectory(std::getenv("ZT_TEST_INNER_DIRECTORY"));
    catalog->AddPlug("after", nullptr);
}
