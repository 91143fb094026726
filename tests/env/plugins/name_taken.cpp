#include "env/plugins/told.h"

namespace {
ToldClosing closing("name_taken.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    auto* object = new ToldObject("refused object deleted");
    if (catalog->AddPlug("good", object)->object != object)
        delete object;
}
