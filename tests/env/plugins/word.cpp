#include "env/plugins/told.h"

#include "ZT/directive.h"

namespace {
ToldClosing closing("word.so closed");

class Hail : public ZtDirective
{
public:
    Hail() : ZtDirective("Hail") {}
    ~Hail() override { TellTheTest("Hail deleted"); }
    void Act(KvoStatement* statement) override
    {
        TellTheTest(statement->ArgText(1));
    }
};
} // namespace

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->AddPlug("Hail", new Hail);
}
