#ifndef ZT_TESTS_FAILINGMALLOC_H
#define ZT_TESTS_FAILINGMALLOC_H

/// Makes requests for memory fail while it lives: all from the one with number
/// `first` on, counted from 0 at its making.
///
/// Works in tests that are linked with `zt_failing_malloc`: there `malloc`,
/// `calloc`, `realloc` and `aligned_alloc` of the test and of the library come
/// by here, and with them `new`, which the test support makes of `malloc`.
class FailingMalloc
{
public:
    explicit FailingMalloc(int first);
    ~FailingMalloc();
    FailingMalloc(const FailingMalloc&) = delete;
    FailingMalloc& operator=(const FailingMalloc&) = delete;

    /// Gives how many requests came, those that failed included.
    int Requests() const;
};

/// Runs `operation` again and again, each time with a later request for memory
/// failing and all after it, until it makes none that fails; `check` looks at
/// the outcome each time, with memory again.
///
/// Returns: how often it was run with a failure, so that a test can insist on
///          at least one.
template <class Operation, class Check>
int WithEveryRequestFailing(const Operation& operation, const Check& check)
{
    for (int first = 0;; ++first) {
        int requests = 0;
        {
            FailingMalloc memory(first);
            operation();
            requests = memory.Requests();
        }
        if (requests <= first)
            return first;
        check();
    }
}

#endif
