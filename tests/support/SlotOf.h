#ifndef ZT_TESTS_SLOTOF_H
#define ZT_TESTS_SLOTOF_H

#include <cstddef>
#include <cstring>

/// Gives the slot of a virtual operation, counted from 0, in its class's table,
/// through which plug-ins call it.
template <class Operation>
std::ptrdiff_t SlotOf(Operation operation)
{
    // A pointer to a virtual member holds its offset in the table, on some
    // processors with one added as a mark.
    std::ptrdiff_t word = 0;
    static_assert(sizeof operation == 2 * sizeof word);
    std::memcpy(&word, &operation, sizeof word);
    return word / static_cast<std::ptrdiff_t>(sizeof(void*));
}

#endif
