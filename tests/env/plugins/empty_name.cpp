#include "env/plugins/told.h"

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->OfferPlug("", new ToldObject("nameless deleted"));
    catalog->OfferPlug(nullptr, nullptr);
}
