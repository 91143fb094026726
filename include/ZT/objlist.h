#ifndef ZT_OBJLIST_H
#define ZT_OBJLIST_H

/// \file
/// Lists of objects, for code that is written against the utility layer.

#include <KVO/KvoObjList.h>

#endif
