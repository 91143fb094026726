#ifndef ZT_RECOGNIZER_H
#define ZT_RECOGNIZER_H

/// \file
/// Recognizers, for code that is written against the utility layer.

#include <KVO/KvoRecognizer.h>

#endif
