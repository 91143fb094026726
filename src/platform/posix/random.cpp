#include "platform/random.h"

#include <stdlib.h>
#include <time.h>

namespace zt_platform {

namespace {

// Calls the global functions, so that a host that replaces or seeds them has
// the last word.
class PosixRandom final : public Random
{
public:
    long draw() override { return ::random(); }

    void seed_from_time() override
    {
        ::srandom(static_cast<unsigned>(::time(nullptr)));
    }

    void seed(unsigned number) override { ::srandom(number); }
};

constinit PosixRandom posix_random;
constinit Random* installed = nullptr;

} // namespace

Random& Random::current()
{
    return installed ? *installed : posix_random;
}

Random* Random::install(Random* other)
{
    Random* before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
