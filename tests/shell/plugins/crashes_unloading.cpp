#include <ZT/directive.h>
#include <ZT/plug.h>

#include <csignal>

namespace {
class Crash : public ZtDirective
{
public:
    Crash() : ZtDirective("Crash") {}
    ~Crash() override { std::raise(SIGKILL); }
};
} // namespace

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("Crash", new Crash);
}
