#include "platform/portaudio/pa_worker.h"

#include <chrono>

namespace zt_platform {

namespace {
constexpr std::chrono::milliseconds between_looks(20);
}

bool PaWorker::call(Work work, void* data)
{
    if (!thread.runs()) {
        is_ending = false;
        if (!thread.start(run, this, QuietThread::Output::Away))
            return false;
    }
    std::unique_lock<std::mutex> lock(mutex);
    work_data = data;
    work_to_do = work;
    changed.notify_all();
    changed.wait(lock, [this] { return !work_to_do; });
    return true;
}

void PaWorker::end()
{
    if (!thread.runs())
        return;
    {
        const std::lock_guard<std::mutex> lock(mutex);
        is_ending = true;
    }
    changed.notify_all();
    thread.join();
}

void PaWorker::run(void* worker)
{
    static_cast<PaWorker*>(worker)->loop();
}

void PaWorker::loop()
{
    std::unique_lock<std::mutex> lock(mutex);
    for (bool goes_on = false;;) {
        const auto is_called = [this] { return work_to_do || is_ending; };
        if (goes_on)
            changed.wait_for(lock, between_looks, is_called);
        else
            changed.wait(lock, is_called);
        if (work_to_do) {
            work_to_do(work_data);
            work_to_do = nullptr;
            changed.notify_all();
        }
        goes_on = tend(tended);
        if (!is_ending)
            continue;
        if (!goes_on) {
            finish(tended);
            return;
        }
        // Nothing will be called any more: what is left runs out by itself.
        changed.wait_for(lock, between_looks);
    }
}

} // namespace zt_platform
