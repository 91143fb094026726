#include "support/ErrorTrap.h"

ErrorTrap::ErrorTrap() = default;

ErrorTrap::~ErrorTrap()
{
    Release();
}

void ErrorTrap::Handle(ZtErr* error)
{
    reports.push_back(
        {error->code, error->level, error->SystemError(), error->Message()});
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
