#include "env/plugins/told.h"

namespace {
ToldClosing closing("two_plugs.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->AddPlug("first", new ToldObject("first deleted"));
    catalog->AddPlug("second", new ToldObject("second deleted"));
}
