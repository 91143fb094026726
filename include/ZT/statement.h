#ifndef ZT_STATEMENT_H
#define ZT_STATEMENT_H

/// \file
/// Front door of the utility layer to statements.

#include <KVO/KvoStatement.h>

#endif
