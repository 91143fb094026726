#ifndef ZT_TESTS_OTHERLOCALE_H
#define ZT_TESTS_OTHERLOCALE_H

#include <locale>
#include <string>

#include "support/TempDir.h"

/// Puts the whole process, C library and streams alike, into another locale
/// while it lives. The locale is compiled for the test, so that it does not
/// depend on what the machine has; that takes the package `locales`.
class OtherLocale
{
public:
    /// `name` as in "de_DE": decimal comma, thousands grouped by points; or
    /// "tr_TR": the small letter of I is not i. Fails the test if it cannot.
    explicit OtherLocale(const std::string& name);
    ~OtherLocale();
    OtherLocale(const OtherLocale&) = delete;
    OtherLocale& operator=(const OtherLocale&) = delete;

private:
    TempDir compiled;
    std::locale before;
};

#endif
