#include "support/FailingMemory.h"

#include <cstdlib>
#include <new>

namespace {

bool failing = false;
bool failed = false;
long spared_left = 0;
long failures_left = 0;

bool fails_now()
{
    if (!failing || spared_left-- > 0)
        return false;
    if (failures_left == 0)
        return false;
    if (failures_left > 0)
        --failures_left;
    failed = true;
    return true;
}

void* take(std::size_t bytes) noexcept
{
    return fails_now() ? nullptr : std::malloc(bytes == 0 ? 1 : bytes);
}

void* take_or_throw(std::size_t bytes)
{
    if (void* const block = take(bytes))
        return block;
    throw std::bad_alloc();
}

} // namespace

FailingMemory::FailingMemory(long spared, long failures)
{
    spared_left = spared;
    failures_left = failures;
    failed = false;
    failing = true;
}

FailingMemory::~FailingMemory()
{
    failing = false;
}

bool FailingMemory::Failed()
{
    return failed;
}

void* operator new(std::size_t bytes)
{
    return take_or_throw(bytes);
}

void* operator new[](std::size_t bytes)
{
    return take_or_throw(bytes);
}

void* operator new(std::size_t bytes, const std::nothrow_t&) noexcept
{
    return take(bytes);
}

void* operator new[](std::size_t bytes, const std::nothrow_t&) noexcept
{
    return take(bytes);
}

void operator delete(void* block) noexcept
{
    std::free(block);
}

void operator delete[](void* block) noexcept
{
    std::free(block);
}

void operator delete(void* block, std::size_t) noexcept
{
    std::free(block);
}

void operator delete[](void* block, std::size_t) noexcept
{
    std::free(block);
}

void operator delete(void* block, const std::nothrow_t&) noexcept
{
    std::free(block);
}

void operator delete[](void* block, const std::nothrow_t&) noexcept
{
    std::free(block);
}
