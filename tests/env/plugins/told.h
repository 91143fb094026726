#ifndef ZT_TESTS_PLUGINS_TOLD_H
#define ZT_TESTS_PLUGINS_TOLD_H

/// \file
/// What the plug-ins of these tests share with the test program.

#include "ZT/plug.h"

/// Tells the test program what has happened in a plug-in; it keeps a list.
extern "C" ZT_API void TellTheTest(const char* what);

/// An object that tells of its end.
class ToldObject : public KvoNamedObject
{
public:
    explicit ToldObject(const char* object_name) : KvoNamedObject(object_name)
    {}
    ~ToldObject() override { TellTheTest(name); }
};

/// Tells when the shared object that it is a variable of is closed.
struct ToldClosing
{
    const char* what;
    explicit constexpr ToldClosing(const char* text) : what(text) {}
    ~ToldClosing() { TellTheTest(what); }
};

#endif
