#include "env/plugins/told.h"

namespace {
ToldClosing closing("two_plugs.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->OfferPlug("first", new ToldObject("first deleted"));
    catalog->OfferPlug("second", new ToldObject("second deleted"));
}
