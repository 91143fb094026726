#include "env/plugins/told.h"

#include <cstdlib>

namespace {
class OtherCatalog : public ZtPlugCatalog
{
public:
    OtherCatalog() : ZtPlugCatalog("Other:1.0") {}
    const char* Extension() override { return "other"; }
};
} // namespace

ZT_PLUGIN("Test:2.1", catalog)
{
    OtherCatalog others;
    others.ScanDirectory(std::getenv("ZT_TEST_INNER_DIRECTORY"));
    catalog->AddPlug("scans_as_another_kind", nullptr);
}
