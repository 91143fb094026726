#include <ZT/directive.h>
#include <ZT/plug.h>

// A word that the shell has.
ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("ECHO", new ZtDirective("ECHO"));
}
