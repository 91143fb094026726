#ifndef ZT_TOOLS_COMMON_NUMBER_OPTION_H
#define ZT_TOOLS_COMMON_NUMBER_OPTION_H

/// \file
/// Numbers with a fraction on a command line.

#include <sstream>
#include <string>

#include <CLI/CLI.hpp>

namespace zt_tools {

/// Checks that the value of an option is a number in a range. The parser's own
/// check would let "nan" pass, which is in no range.
inline CLI::Validator NumberFromTo(double least, double most)
{
    const auto fault_of = [least, most](const std::string& text) {
        double number = 0;
        if (CLI::detail::lexical_cast(text, number) && number >= least &&
            number <= most)
            return std::string();
        std::ostringstream fault;
        fault << "Value " << text << " not in range " << least << " to "
              << most;
        return fault.str();
    };
    return CLI::Validator(fault_of, "");
}

} // namespace zt_tools

#endif
