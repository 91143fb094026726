#ifndef ZTSH_SCRIPT_REPORTS_H
#define ZTSH_SCRIPT_REPORTS_H

/// \file
/// What the shell adds to reports: where in the script they were made, and a
/// count for the exit code.

#include "outcome.h"
#include "script/source.h"

#include <ZT/error.h>

#include <functional>

namespace ztsh {

/// Writes "    at NAME:LINE" and a newline to standard error; nothing for a
/// place without a name.
void TellPlace(const Place& place);

/// Lets every report go out as it is, then tells the place of the statement
/// that runs. Warnings and errors are counted.
class ReportHandler : public ZtErrHandler
{
public:
    /// Requires: `run_outcome` outlives the handler.
    ReportHandler(Outcome& run_outcome, std::function<Place()> place_teller);

    void Handle(ZtErr* error) override;

private:
    Outcome& outcome;
    std::function<Place()> where;
};

} // namespace ztsh

#endif
