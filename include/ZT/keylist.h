#ifndef ZT_KEYLIST_H
#define ZT_KEYLIST_H

/// \file
/// Objects ordered by key, for code that is written against the utility layer.

#include <KVO/KvoSkipList.h>

#endif
