#ifndef ZTSH_WORDS_COMMON_WORDS_H
#define ZTSH_WORDS_COMMON_WORDS_H

/// \file
/// The library's five common directives as the shell offers them.

#include "script/runner.h"

#include <ZT/dircom.h>

namespace ztsh {

/// Timer, Echo, Include, cd and System.
///
/// They do what the library makes them do. Only `Include` reads its script
/// with the shell's runner, which knows lines and counts how deep scripts
/// nest; and a safe shell refuses `cd` and `System`.
class CommonWords : public ZtCommonDirectives
{
public:
    /// Requires: `script_runner` outlives the director.
    explicit CommonWords(Runner& script_runner);

    void Act(KvoStatement* statement, int selector) override;
    void Info(std::ostream& out, char* name, int selector, int number) override;

private:
    void include(KvoStatement& statement);

    Runner& runner;
};

} // namespace ztsh

#endif
