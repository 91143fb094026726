#include <ZT/directive.h>
#include <ZT/plug.h>

#include <iostream>

namespace {
class Well : public ZtDirective
{
public:
    Well() : ZtDirective("Well") {}
    ~Well() override { std::cout << "Well is withdrawn\n"; }
    void Act(KvoStatement* statement) override
    {
        std::cout << "Well " << statement->Count() - 1 << "\n";
    }
};
} // namespace

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("Well", new Well);
}
