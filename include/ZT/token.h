#ifndef ZT_TOKEN_H
#define ZT_TOKEN_H

/// \file
/// Front door of the utility layer to the tokenizer and token lists.

#include <KVO/KvoToken.h>

#endif
