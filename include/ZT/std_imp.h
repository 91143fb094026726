#ifndef ZT_STD_IMP_H
#define ZT_STD_IMP_H

/// \file
/// The holder of the one implementation object that a host program keeps for
/// the process.

#include <ZT/common.h>

/// The base of a host's implementation object. There is at most one, and the
/// latest wins: making one deletes the one before.
///
/// Objects are made with `new` only.
class ZT_API ZtStdImp
{
public:
    /// Deletes the present instance and becomes it.
    ///
    /// Owner: the instance belongs to this class: the next one deletes it.
    ZtStdImp();

    ZtStdImp(const ZtStdImp&) = delete;
    ZtStdImp& operator=(const ZtStdImp&) = delete;

    /// Leaves the process without an instance.
    virtual ~ZtStdImp();

    static ZtStdImp* theImp; ///< The present instance, or null.
};

#endif
