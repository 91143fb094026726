#ifndef ZT_ARRAY_H
#define ZT_ARRAY_H

/// \file
/// Growable arrays, for code that is written against the utility layer.

#include <KVO/KvoArray.h>

#endif
