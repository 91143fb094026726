#ifndef ZT_TESTS_DIAG_REPORTS_H
#define ZT_TESTS_DIAG_REPORTS_H

#include <csignal>
#include <string>

#include <gtest/gtest.h>

#include "ZT/error.h"
#include "support/CapturedStderr.h"

/// Puts the levels and the output stream back to what they are at first.
class SettingsKept
{
public:
    SettingsKept() = default;
    ~SettingsKept()
    {
        ZtErrHandler::outputLevel = 3;
        ZtErrHandler::abortLevel = 5;
        ZtErrHandler::SetOutputStream(nullptr);
    }
    SettingsKept(const SettingsKept&) = delete;
    SettingsKept& operator=(const SettingsKept&) = delete;
};

/// What `action` prints on standard error.
template <class Action>
std::string Printed(Action action)
{
    CapturedStderr captured;
    action();
    return captured.Text();
}

inline void PostText(const char* text, int level = 4)
{
    (new ZtErr(text, 0, level))->Post();
}

/// For death tests: the process was ended by abort().
inline bool aborted(int status)
{
    return testing::KilledBySignal(SIGABRT)(status);
}

#endif
