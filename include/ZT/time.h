#ifndef ZT_TIME_H
#define ZT_TIME_H

/// \file
/// Time values, for code that is written against the utility layer.

#include <KVO/KvoTime.h>

#endif
