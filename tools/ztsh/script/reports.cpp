#include "script/reports.h"

#include <iostream>
#include <utility>

namespace ztsh {

namespace {
constexpr int warning_level = 3;
}

void TellPlace(const Place& place)
{
    if (!place.name.empty())
        std::cerr << "    at " << place.name << ":" << place.line << "\n";
}

ReportHandler::ReportHandler(Outcome& run_outcome,
                             std::function<Place()> place_teller)
    : ZtErrHandler(0), outcome(run_outcome), where(std::move(place_teller))
{}

void ReportHandler::Handle(ZtErr* error)
{
    int level = error->level;
    ZtErrHandler::Handle(error);
    if (level >= outputLevel)
        TellPlace(where());
    if (level >= warning_level)
        outcome.CountReport();
}

} // namespace ztsh
