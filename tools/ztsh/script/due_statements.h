#ifndef ZTSH_SCRIPT_DUE_STATEMENTS_H
#define ZTSH_SCRIPT_DUE_STATEMENTS_H

/// \file
/// Statements that become due by themselves, while others run or while the
/// shell waits.

#include "script/source.h"

#include <memory>
#include <vector>

namespace ztsh {

using Statements = std::vector<StoredStatement>;

/// Where such statements come from.
class DueStatements
{
public:
    DueStatements() = default;
    DueStatements(const DueStatements&) = delete;
    DueStatements& operator=(const DueStatements&) = delete;
    virtual ~DueStatements() = default;

    /// Tells whether any are due.
    virtual bool Any() const = 0;

    /// Gives what is due by now, in the order in which it became so; from then
    /// on it is not due any more.
    ///
    /// Owner: what is withdrawn before its turn has come is gone.
    virtual std::vector<std::weak_ptr<const Statements>> Take() = 0;
};

} // namespace ztsh

#endif
