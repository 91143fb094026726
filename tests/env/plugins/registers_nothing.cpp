#include "env/plugins/told.h"

namespace {
ToldClosing closing("registers_nothing.so closed");
}

ZT_PLUGIN("Test:2.1", catalog)
{
    TellTheTest(catalog ? "entered" : "entered without a catalog");
}
