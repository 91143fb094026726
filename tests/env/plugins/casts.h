#ifndef ZT_TESTS_PLUGINS_CASTS_H
#define ZT_TESTS_PLUGINS_CASTS_H

/// \file
/// A class that the test program and a plug-in both define, each for itself,
/// as a host and its plug-ins do that share a header.

#include "ZT/plug.h"

class Shape : public KvoNamedObject
{
public:
    explicit Shape(const char* shape_name) : KvoNamedObject(shape_name) {}
    virtual double Area() { return 0; }
    KVO_DECLARE_CLASS_INFO();
};

#endif
