#ifndef ZT_TESTS_INACHILD_H
#define ZT_TESTS_INACHILD_H

#include <cstddef>
#include <functional>

/// What a child process may use before it is ended.
struct ChildBounds
{
    std::size_t memory_bytes = std::size_t{64} << 20; ///< Beyond the parent's.
    int cpu_seconds = 1;
};

/// Runs `body`, checks included, in a child process within the bounds, and
/// fails the test if a check fails there, if the child dies, or if it goes
/// over its bounds. Sanitizers keep memory of their own and are slow: under
/// them memory is unbounded and time ten times as long.
///
/// Tests that call this have "InAChild" in their names, for tools that follow
/// one process only.
void RunInAChild(const std::function<void()>& body, ChildBounds bounds = {});

#endif
