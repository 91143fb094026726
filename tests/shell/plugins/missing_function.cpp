#include <ZT/directive.h>
#include <ZT/plug.h>

void FunctionThatIsNowhere();

namespace {
class Missing : public ZtDirective
{
public:
    Missing() : ZtDirective("Missing") {}
    void Act(KvoStatement*) override { FunctionThatIsNowhere(); }
};
} // namespace

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("Missing", new Missing);
}
