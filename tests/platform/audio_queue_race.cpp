// Two threads and one queue: everything comes out once, whole and in order, but
// for what was discarded. Also built with the checker of data races.

#include "platform/audio_queue.h"

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <thread>
#include <vector>

namespace {
using zt_platform::AudioQueue;

constexpr long capacity = 1000;
constexpr long samples_in_all = 3000000;

std::atomic<bool> is_written = false;
std::atomic<int> faults = 0;

void fault(const char* what)
{
    std::printf("%s\n", what);
    ++faults;
}

std::int16_t sample_number(long number)
{
    return static_cast<std::int16_t>(number % 32000);
}

void write_all(AudioQueue& queue)
{
    std::vector<std::int16_t> block(700);
    for (long number = 0; number < samples_in_all;) {
        const long count =
            std::min(1 + number * 7 % 700, samples_in_all - number);
        for (long place = 0; place < count; ++place)
            block[static_cast<std::size_t>(place)] =
                sample_number(number + place);
        number += queue.write(block.data(), count);
        if (queue.filled() > capacity || queue.fillable() < 0)
            fault("more is filled than fits");
        std::this_thread::yield();
    }
    is_written = true;
}

long read_all(AudioQueue& queue)
{
    std::vector<std::int16_t> block(900);
    long number = 0;
    for (bool last = false; !last;) {
        last = is_written;
        for (;;) {
            const long count = queue.read(block.data(), 1 + number * 3 % 900);
            for (long place = 0; place < count; ++place)
                if (block[static_cast<std::size_t>(place)] !=
                    sample_number(number + place))
                    return number;
            number += count;
            if (count == 0)
                break;
        }
        std::this_thread::yield();
    }
    return number;
}

void nothing_is_lost()
{
    AudioQueue queue;
    if (!queue.make(capacity))
        return fault("no memory");
    std::thread writer([&] { write_all(queue); });
    const long number = read_all(queue);
    writer.join();
    if (number != samples_in_all)
        fault("samples are lost or out of order");
}

// Between two that were discarded each run of samples is whole: a number, and
// the following ones.
void discarding_leaves_whole_runs()
{
    AudioQueue queue;
    if (!queue.make(capacity))
        return fault("no memory");
    is_written = false;
    std::thread writer([&] {
        std::vector<std::int16_t> block(500);
        for (int run = 0; run < 5000; ++run) {
            for (std::size_t place = 0; place < block.size(); ++place)
                block[place] = static_cast<std::int16_t>(place);
            queue.write(block.data(), 500);
            if (run % 3 == 0)
                std::this_thread::yield();
            queue.discard();
            if (queue.filled() != 0)
                fault("a discarded queue is not empty");
            if (run % 2 == 0)
                std::this_thread::yield();
        }
        is_written = true;
    });
    std::vector<std::int16_t> block(300);
    while (!is_written) {
        const long count = queue.read(block.data(), 300);
        for (long place = 1; place < count; ++place) {
            const auto at = static_cast<std::size_t>(place);
            if (block[at] != block[at - 1] + 1 && block[at] != 0)
                fault("a run is not whole");
        }
    }
    writer.join();
}
} // namespace

int main()
{
    nothing_is_lost();
    discarding_leaves_whole_runs();
    std::printf("audio queue: %d faults\n", faults.load());
    return faults == 0 ? 0 : 1;
}
