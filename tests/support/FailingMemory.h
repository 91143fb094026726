#ifndef ZT_TESTS_FAILINGMEMORY_H
#define ZT_TESTS_FAILINGMEMORY_H

/// \file
/// A heap that runs out. A test that uses it gets its own `operator new`;
/// what is taken with `malloc` is not touched.

/// While it lives, `new` fails.
class FailingMemory
{
public:
    /// Lets `spared` allocations succeed, then fails `failures` of them; all
    /// of them when `failures` is below 0.
    explicit FailingMemory(long spared = 0, long failures = -1);
    ~FailingMemory();
    FailingMemory(const FailingMemory&) = delete;
    FailingMemory& operator=(const FailingMemory&) = delete;

    /// Tells whether an allocation has failed yet; also after it has ended.
    static bool Failed();
};

#endif
