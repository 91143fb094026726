#include "KVO/KvoArray.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "platform/large_memory.h"

namespace {
/// Tells whether so many elements may be asked of the system at all.
bool can_be_asked_for(int count, int element_bytes)
{
    return count <= PTRDIFF_MAX / element_bytes;
}

std::size_t bytes_of(int count, int element_bytes)
{
    return static_cast<std::size_t>(count) *
           static_cast<std::size_t>(element_bytes);
}
} // namespace

KvoArray::KvoArray(int element_bytes, int initial_size)
    : data(nullptr), capacity(0), size(0),
      elementSize(std::max(element_bytes, 1))
{
    SetSize(initial_size);
}

KvoArray::KvoArray(const KvoArray& other)
    : KvoObject(other), data(nullptr), capacity(0), size(0),
      elementSize(other.elementSize)
{
    SetSize(other.size);
    take_elements(other, 0, other.held());
}

KvoArray::~KvoArray()
{
    std::free(data);
}

KvoArray& KvoArray::operator=(const KvoArray& other)
{
    if (this == &other)
        return *this;
    // The own block is given up only when the new one is there.
    KvoArray copy(elementSize, other.size);
    if (copy.size == std::max(other.size, 0)) {
        copy.take_elements(other, 0, other.held());
        std::swap(data, copy.data);
        std::swap(capacity, copy.capacity);
        size = copy.size;
    }
    return *this;
}

KvoArray& KvoArray::operator+=(const KvoArray& other)
{
    const int own = size;
    const int added = other.size;
    const int readable = other.held();
    const long long total = static_cast<long long>(own) + added;
    if (added <= 0 || total > INT_MAX)
        return *this;
    SetSize(static_cast<int>(total));
    if (size == total)
        take_elements(other, own, readable);
    return *this;
}

void KvoArray::SetSize(int new_size)
{
    if (new_size != capacity)
        Allocate(new_size);
    if (new_size > capacity)
        return;
    const int old_size = size;
    size = std::max(new_size, 0);
    ZeroElements(data, old_size, size - old_size);
}

void KvoArray::Allocate(int new_capacity)
{
    if (new_capacity <= 0) {
        std::free(data);
        data = nullptr;
        capacity = 0;
        return;
    }
    if (!can_be_asked_for(new_capacity, elementSize))
        return;
    void* block = std::realloc(data, bytes_of(new_capacity, elementSize));
    if (!block)
        return;
    const int kept = held();
    data = block;
    capacity = new_capacity;
    if (kept < capacity)
        zt_platform::clear_new_memory(static_cast<char*>(data) +
                                          bytes_of(kept, elementSize),
                                      bytes_of(capacity - kept, elementSize));
}

void KvoArray::CopyElements(void* to, const void* from, int to_index,
                            int from_index, int count) const
{
    if (!to || !from || count <= 0)
        return;
    std::memmove(static_cast<char*>(to) + bytes_of(to_index, elementSize),
                 static_cast<const char*>(from) +
                     bytes_of(from_index, elementSize),
                 bytes_of(count, elementSize));
}

void KvoArray::ZeroElements(void* block, int index, int count) const
{
    if (!block || count <= 0)
        return;
    std::memset(static_cast<char*>(block) + bytes_of(index, elementSize), 0,
                bytes_of(count, elementSize));
}

bool KvoArray::bring_into_use(int index)
{
    if (index >= size)
        resize_with_slack(index + 1LL);
    return holds(index);
}

// The band between three quarters of the capacity and the whole of it is where
// the block is left alone; outside of it it is made anew.
void KvoArray::resize_with_slack(long long new_size)
{
    new_size = std::max(new_size, 0LL);
    if (new_size == size || new_size > INT_MAX)
        return;
    if (3LL * capacity >= 4 * new_size)
        Allocate(static_cast<int>(new_size));
    else if (capacity < new_size)
        Allocate(
            static_cast<int>(std::min<long long>(new_size * 5 / 4, INT_MAX)));
    if (new_size > capacity)
        return;
    const int old_size = size;
    size = static_cast<int>(new_size);
    ZeroElements(data, old_size, size - old_size);
}

// Expects the elements from `at` on to be zero, which is what those that
// `other` cannot fill stay.
void KvoArray::take_elements(const KvoArray& other, int at, int count)
{
    count = std::min(count, held() - at);
    if (elementSize == other.elementSize) {
        CopyElements(data, other.data, at, 0, count);
        return;
    }
    const int common = std::min(elementSize, other.elementSize);
    char* to = static_cast<char*>(data) + bytes_of(at, elementSize);
    const char* from = static_cast<const char*>(other.data);
    for (int i = 0; i < count; ++i) {
        std::memcpy(to, from, static_cast<std::size_t>(common));
        to += elementSize;
        from += other.elementSize;
    }
}
