#ifndef ZT_MATH_H
#define ZT_MATH_H

/// \file
/// Front door of the utility layer to vectors, matrices and quaternions.

#include <KVO/KvoVec.h>

#endif
