#ifndef ZT_TESTS_ERRORTRAP_H
#define ZT_TESTS_ERRORTRAP_H

#include <string>
#include <vector>

#include "ZT/error.h"

/// Keeps what is posted while it lives, so that nothing is printed and nothing
/// aborts. Like every handler it is destroyed in the reverse order of making.
class ErrorTrap : public ZtErrHandler
{
public:
    struct Report
    {
        int code;
        int level;
        int system_error;
        std::string text;
    };

    ErrorTrap();
    ~ErrorTrap() override;

    /// Takes the error over and keeps what it says; forgets it when there is
    /// no memory for that.
    void Handle(ZtErr* error) override;

    /// Gives the texts of all reports, one after the other.
    std::string Text() const;

    /// Forgets what was kept.
    void Clear();

    std::vector<Report> reports; ///< Oldest first.
};

#endif
