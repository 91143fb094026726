#include <ZT/plug.h>

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("Thing", new KvoObject);
}
