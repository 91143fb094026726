#include "support/InAChild.h"

#include <cstdio>
#include <fstream>
#include <iostream>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define ZT_TESTS_SANITIZED
#endif
#elif defined(__SANITIZE_ADDRESS__)
#define ZT_TESTS_SANITIZED
#endif

namespace {

#ifdef ZT_TESTS_SANITIZED
constexpr bool sanitized = true;
#else
constexpr bool sanitized = false;
#endif

constexpr int longest_wait_seconds = 100;

rlim_t memory_in_use()
{
    std::ifstream in("/proc/self/statm");
    rlim_t pages = 0;
    in >> pages;
    return pages * static_cast<rlim_t>(sysconf(_SC_PAGESIZE));
}

void limit(int resource, rlim_t amount)
{
    rlimit both = {amount, amount};
    setrlimit(static_cast<__rlimit_resource>(resource), &both);
}

[[noreturn]] void be_the_child(const std::function<void()>& body,
                               ChildBounds bounds)
{
    limit(RLIMIT_CORE, 0);
    if (!sanitized)
        limit(RLIMIT_AS, memory_in_use() + bounds.memory_bytes);
    limit(RLIMIT_CPU,
          static_cast<rlim_t>(bounds.cpu_seconds) * (sanitized ? 10 : 1));
    alarm(longest_wait_seconds); // For one that waits and uses no time.
    body();
    std::cout.flush();
    std::fflush(stdout);
    _exit(testing::Test::HasFailure() ? 1 : 0);
}

} // namespace

void RunInAChild(const std::function<void()>& body, ChildBounds bounds)
{
    std::cout.flush();
    std::fflush(stdout);
    pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0)
        be_the_child(body, bounds);
    int status = 0;
    while (waitpid(child, &status, 0) < 0 && errno == EINTR)
        ;
    EXPECT_FALSE(WIFSIGNALED(status)) << "signal " << WTERMSIG(status);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0)
        << "the child failed, see above";
}
