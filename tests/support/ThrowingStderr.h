#ifndef ZT_TESTS_THROWINGSTDERR_H
#define ZT_TESTS_THROWINGSTDERR_H

/// \file
/// A standard error that a host has told to throw, and that nothing reaches.

#include <ios>
#include <iostream>
#include <streambuf>

/// Makes standard error fail, and throw when it does; gives it back as it was.
class ThrowingStderr
{
public:
    ThrowingStderr() : before(std::cerr.rdbuf(&refusing))
    {
        std::cerr.exceptions(std::ios::badbit | std::ios::failbit);
    }
    ~ThrowingStderr()
    {
        std::cerr.exceptions(std::ios::goodbit);
        std::cerr.rdbuf(before); // clears the state too
    }

private:
    class Refusing : public std::streambuf
    {};

    Refusing refusing;
    std::streambuf* before;
};

#endif
