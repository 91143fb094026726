#include "env/plugins/told.h"

#include "ZT/signals.h"

#include <csignal>

// What it hooks is still called after its code has gone.
ZT_PLUGIN("Test:2.1", catalog)
{
    (void)catalog;
    OnSignal(
        SIGUSR1, [](int, void*) { TellTheTest("signal"); }, nullptr);
}
