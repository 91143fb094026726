#include "platform/number.h"

#include <locale.h>
#include <stdlib.h>

#include <cerrno>

namespace {
// The system keeps the classic locale in static storage: asking for it neither
// allocates nor fails, and it is never given back.
locale_t classic()
{
    static const locale_t the_locale = newlocale(LC_ALL_MASK, "C", locale_t());
    return the_locale;
}
} // namespace

// Reading a number is not a system call to our callers: errno stays as it was,
// so that a report made afterwards still carries the failure that matters.

long zt_platform::parse_long(const char* text)
{
    const int kept = errno;
    const long value = strtol_l(text, nullptr, 10, classic());
    errno = kept;
    return value;
}

double zt_platform::parse_double(const char* text)
{
    const int kept = errno;
    const double value = strtod_l(text, nullptr, classic());
    errno = kept;
    return value;
}
