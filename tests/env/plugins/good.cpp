#include "env/plugins/told.h"

namespace {
ToldClosing closing("good.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->OfferPlug("good", new ToldObject("good deleted"));
}
