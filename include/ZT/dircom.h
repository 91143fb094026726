#ifndef ZT_DIRCOM_H
#define ZT_DIRCOM_H

/// \file
/// The five commands that every script has: Timer, Echo, Include, cd, System.
///
/// `Echo` and `Timer` write to standard error. A script's last line needs its
/// newline: a statement that runs into the end of the file is not carried out.

#include <ZT/directive.h>
#include <ZT/swatch.h>

/// Gives a dispatcher the built-in commands.
class ZT_API ZtCommonDirectives : public ZtDirector
{
public:
    /// What the commands are registered under, in this order.
    enum Selector : int {
        Timer = 0,
        Echo = 1,
        Included = 2,
        ChangeDirectory = 3,
        Shell = 4
    };

    /// Registers the commands with `dispatcher` and starts the stopwatch.
    ///
    /// Requires: this object outlives the dispatcher's use of the commands.
    explicit ZtCommonDirectives(ZtDispatcher& home_dispatcher);

    ~ZtCommonDirectives() override;

    /// Carries out the command of `selector`; another selector does nothing.
    ///
    /// Timer writes its words, the seconds since the Timer before, and a
    /// newline; Echo its words and a newline; Include reads the script that
    /// its first word names; cd changes the directory of the process; System
    /// gives its words to the shell. Words are written without their quotes.
    /// Failures of cd and System are silent.
    void Act(KvoStatement* statement, int selector) override;

    /// Reads statements from the file `name` and hands each to the dispatcher,
    /// until the file ends. Null and "-" are standard input.
    ///
    /// Scripts may include scripts, to any depth.
    ///
    /// Cursor:    standard input stays where the reading ended; its state is
    ///            not cleared.
    /// By design: the statement that runs into the end of the file is not
    ///            handed on
    ///            (Include.ALastLineWithoutNewlineIsNotCarriedOut);
    ///            a file that cannot be opened is told on standard error, not
    ///            to the error handlers
    ///            (Include.AMissingScriptIsToldAndTheOuterGoesOn).
    void Include(const char* name);

    /// Removes the command word and gives the rest of the statement, one blank
    /// between two words, and a newline to the shell; waits for its end.
    ///
    /// By design: quotes are not restored, so the shell interprets what was
    ///            quoted (CommonDirectives.SystemDoesNotRestoreQuotes).
    void System(KvoStatement* statement);

private:
    ZtStopWatch stopwatch;
};

#endif
