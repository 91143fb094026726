#include "support/FailingMalloc.h"

#include <cstddef>

#include "support/FailingMemory.h"

namespace {

// Brings in the `new` that is made of `malloc`, also where a sanitizer has one
// of its own to offer.
[[maybe_unused]] bool (*const own_new)() = FailingMemory::Failed;

bool counting;
bool only_first;
int first_to_fail;
int requests;

/// Counts a request and tells whether it is to fail.
bool fails()
{
    if (!counting)
        return false;
    int request = requests++;
    return only_first ? request == first_to_fail : request >= first_to_fail;
}

} // namespace

extern "C" {

void* __real_malloc(std::size_t bytes);
void* __real_calloc(std::size_t count, std::size_t bytes);
void* __real_realloc(void* block, std::size_t bytes);
void* __real_aligned_alloc(std::size_t alignment, std::size_t bytes);

void* __wrap_malloc(std::size_t bytes)
{
    return fails() ? nullptr : __real_malloc(bytes);
}

void* __wrap_calloc(std::size_t count, std::size_t bytes)
{
    return fails() ? nullptr : __real_calloc(count, bytes);
}

void* __wrap_realloc(void* block, std::size_t bytes)
{
    return fails() ? nullptr : __real_realloc(block, bytes);
}

void* __wrap_aligned_alloc(std::size_t alignment, std::size_t bytes)
{
    return fails() ? nullptr : __real_aligned_alloc(alignment, bytes);
}
}

FailingMalloc::FailingMalloc(int first, bool only_one)
{
    only_first = only_one;
    requests = 0;
    first_to_fail = first;
    counting = true;
}

FailingMalloc::~FailingMalloc()
{
    counting = false;
}

int FailingMalloc::Requests() const
{
    return requests;
}
