#ifndef ZT_LIST_H
#define ZT_LIST_H

/// \file
/// Linked lists, for code that is written against the utility layer.

#include <KVO/KvoList.h>

#endif
