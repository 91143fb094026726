#include "platform/pages.h"

#include <cerrno>
#include <sys/mman.h>

namespace zt_platform {

namespace {

constexpr std::size_t least_bytes = 1;

class PosixPages final : public Pages
{
public:
    void* map(std::size_t bytes) override
    {
        void* const memory =
            mmap(nullptr, bytes ? bytes : least_bytes, PROT_READ | PROT_WRITE,
                 MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
        return memory == MAP_FAILED ? nullptr : memory;
    }

    void unmap(void* memory, std::size_t bytes) override
    {
        if (memory)
            munmap(memory, bytes ? bytes : least_bytes);
    }
};

constinit PosixPages posix_pages;
constinit Pages* installed = nullptr;

} // namespace

Pages& Pages::current()
{
    return installed ? *installed : posix_pages;
}

Pages* Pages::install(Pages* other)
{
    Pages* const before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform
