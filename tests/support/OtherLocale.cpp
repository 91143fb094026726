#include "support/OtherLocale.h"

#include <clocale>
#include <cstdlib>
#include <stdexcept>

#include <gtest/gtest.h>

#if defined(__SANITIZE_ADDRESS__)
#include <sanitizer/lsan_interface.h>
#endif

namespace {

/// While it lives, nobody asks who frees what is allocated: the C library
/// never frees what it makes of LOCPATH.
class LeaksAllowed
{
public:
    LeaksAllowed() { set(true); }
    ~LeaksAllowed() { set(false); }

private:
    static void set([[maybe_unused]] bool allowed)
    {
#if defined(__SANITIZE_ADDRESS__)
        allowed ? __lsan_disable() : __lsan_enable();
#endif
    }
};

} // namespace

OtherLocale::OtherLocale(const std::string& name)
{
    const std::string full = name + ".UTF-8";
    const std::string command = "localedef -c -i " + name + " -f UTF-8 " +
                                compiled.Path(full) + " >/dev/null 2>&1";
    if (std::system(command.c_str()) == -1)
        ADD_FAILURE() << "cannot run localedef";
    setenv("LOCPATH", compiled.Path("").c_str(), 1);
    try {
        LeaksAllowed during_this;
        std::locale::global(std::locale(full));
    } catch (const std::runtime_error&) {
        ADD_FAILURE() << "no locale " << full
                      << ": install the package `locales`";
    }
    unsetenv("LOCPATH");
}

OtherLocale::~OtherLocale()
{
    std::locale::global(before);
    std::setlocale(LC_ALL, "C");
}
