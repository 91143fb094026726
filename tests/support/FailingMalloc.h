#ifndef ZT_TESTS_FAILINGMALLOC_H
#define ZT_TESTS_FAILINGMALLOC_H

#include <initializer_list>

/// Makes requests for memory fail while it lives: the one with number `first`,
/// counted from 0 at its making, and all after it unless it is `only_one`.
///
/// Works in tests that are linked with `zt_failing_malloc`: there `malloc`,
/// `calloc`, `realloc` and `aligned_alloc` of the test and of the library come
/// by here, and with them `new`, which the test support makes of `malloc`.
class FailingMalloc
{
public:
    explicit FailingMalloc(int first, bool only_one = false);
    ~FailingMalloc();
    FailingMalloc(const FailingMalloc&) = delete;
    FailingMalloc& operator=(const FailingMalloc&) = delete;

    /// Gives how many requests came, those that failed included.
    int Requests() const;
};

/// Runs `operation` again and again, each time with a later request for memory
/// failing, alone and with all after it, until it makes none that fails;
/// `check` looks at the outcome each time, with memory again.
///
/// Returns: how many requests failed, so that a test can insist on one.
template <class Operation, class Check>
int WithEveryRequestFailing(const Operation& operation, const Check& check)
{
    for (int first = 0;; ++first)
        for (bool only_one : {false, true}) {
            int requests = 0;
            {
                FailingMalloc memory(first, only_one);
                operation();
                requests = memory.Requests();
            }
            if (requests <= first)
                return first;
            check();
        }
}

#endif
