#ifndef ZT_TESTS_CAPTUREDSTDERR_H
#define ZT_TESTS_CAPTUREDSTDERR_H

#include <string>

/// Collects what reaches file descriptor 2 while it lives, by whatever way it
/// was written: `std::cerr`, stdio, `write`, a child process.
class CapturedStderr
{
public:
    CapturedStderr();
    ~CapturedStderr();
    CapturedStderr(const CapturedStderr&) = delete;
    CapturedStderr& operator=(const CapturedStderr&) = delete;

    /// Gives everything written since the start.
    std::string Text() const;

private:
    int kept;  ///< The standard error of the test program.
    int taken; ///< An unlinked file that stands in for it.
};

#endif
