#include "env/plugins/told.h"

namespace {
ToldClosing closing("entry_throws_late.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->OfferPlug("late", new ToldObject("late deleted"));
    throw 7;
}
