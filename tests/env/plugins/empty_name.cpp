#include "env/plugins/told.h"

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->AddPlug("", new ToldObject("nameless deleted"));
    catalog->AddPlug(nullptr, nullptr);
}
