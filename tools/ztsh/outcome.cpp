#include "outcome.h"

#include <algorithm>

namespace ztsh {

void Outcome::Note(int code)
{
    noted = std::max(noted, code);
}

void Outcome::CountReport()
{
    ++reports;
    Note(ExitReported);
}

void Outcome::Quit()
{
    quitting = true;
}

void Outcome::Quit(int code)
{
    quitting = true;
    quit_code = code;
}

} // namespace ztsh
