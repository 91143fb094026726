#ifndef ZT_OBJECT_H
#define ZT_OBJECT_H

/// \file
/// Front door of the utility layer to the base object and class information.

#include <KVO/KvoObject.h>

#endif
