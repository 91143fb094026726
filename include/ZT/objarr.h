#ifndef ZT_OBJARR_H
#define ZT_OBJARR_H

/// \file
/// Arrays of objects, for code that is written against the utility layer.

#include <KVO/KvoObjArr.h>

#endif
