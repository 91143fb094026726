#include "env/plugins/told.h"

namespace {
ToldClosing closing("name_taken.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->OfferPlug("good", new ToldObject("refused object deleted"));
}
