#include "support/ErrorTrap.h"

#include <new>

ErrorTrap::ErrorTrap() = default;

ErrorTrap::~ErrorTrap()
{
    Release();
}

void ErrorTrap::Handle(ZtErr* error)
{
    try {
        reports.push_back({error->code, error->level, error->SystemError(),
                           error->Message()});
    } catch (const std::bad_alloc&) {
        // The test has taken the memory away and looks at something else.
    }
    delete error;
}

std::string ErrorTrap::Text() const
{
    std::string text;
    for (const Report& report : reports)
        text += report.text;
    return text;
}

void ErrorTrap::Clear()
{
    reports.clear();
}
