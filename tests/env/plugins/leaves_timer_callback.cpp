#include "env/plugins/told.h"

#include "ZT/timer.h"

// What it posts is still called after its code has gone.
ZT_PLUGIN("Test:2.1", catalog)
{
    (void)catalog;
    auto* const timer = new ZtTimer(0, KvoTime::FOREVER);
    timer->post_repeat([](ZtTimer*, void*) { TellTheTest("beat"); }, nullptr,
                       1);
    timer->start();
}
