#include "env/plugins/told.h"

#include <chrono>
#include <thread>

// Its thread's code is unmapped while the thread is in it.
ZT_PLUGIN("Test:2.1", catalog)
{
    (void)catalog;
    std::thread([] {
        for (;;)
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }).detach();
}
