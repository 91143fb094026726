#include "env/query_program.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <istream>
#include <streambuf>
#include <string>
#include <string_view>

#include "KVO/KvoToken.h"

#include "platform/process.h"

namespace zt_env {

namespace {

constexpr std::string_view program = "get_quarn_variable";

/// Where programs are looked for when nobody says where; the shell's own
/// default begins or ends with these.
constexpr const char* plain_search_path = "/bin:/usr/bin";

bool is_letter_or_digit(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') ||
           (c >= '0' && c <= '9');
}

/// Whether the shell takes `c` as it stands wherever it is in a command's
/// name. The equals sign is not among these: what stands before one may be
/// taken as the name of a variable.
bool is_plain(char c)
{
    constexpr std::string_view others = "_./+,:@%-";
    return is_letter_or_digit(c) || others.find(c) != others.npos;
}

/// The text as one word of the shell's.
std::string quoted_for_shell(const std::string& text)
{
    if (std::all_of(text.begin(), text.end(), is_plain))
        return text;
    std::string quoted = "'";
    for (const char c : text) {
        if (c == '\'')
            quoted += "'\\'";
        quoted += c;
    }
    return quoted + "'";
}

bool is_program(const std::string& path)
{
    return zt_platform::Processes::current().is_program(path.c_str());
}

/// Whether a directory of the search path holds the program. An empty one is
/// the current directory.
bool is_on_search_path()
{
    const char* const set = std::getenv("PATH");
    std::string_view path = set ? set : plain_search_path;
    while (true) {
        const std::size_t colon = path.find(':');
        std::string candidate(path.substr(0, colon));
        if (!candidate.empty())
            candidate += '/';
        candidate += program;
        if (is_program(candidate))
            return true;
        if (colon == path.npos)
            return false;
        path.remove_prefix(colon + 1);
    }
}

/// The command that starts the program now; empty if it is not there.
std::string command_of(const char* installation)
{
    if (!installation)
        return std::string(is_on_search_path() ? program : "");
    std::string path = installation;
    path += "/bin/";
    path += program;
    return is_program(path) ? quoted_for_shell(path) : std::string();
}

/// The shell line that asks for each of the names.
std::string line_of(const std::string& command,
                    std::span<const char* const> names)
{
    std::string line;
    for (const char* const name : names) {
        if (!line.empty())
            line += ';';
        line.append(command).append(" ").append(name);
    }
    return line;
}

/// What a shell line writes, as the buffer of a stream.
class OutputBuffer : public std::streambuf
{
public:
    explicit OutputBuffer(const char* line) : output(line) {}

protected:
    int_type underflow() override
    {
        const std::size_t got = output.read(piece, sizeof piece);
        setg(piece, piece, piece + got);
        return got == 0 ? traits_type::eof() : traits_type::to_int_type(*piece);
    }

private:
    zt_platform::ShellOutput output;
    char piece[4096];
};

/// Reads the first word of a line, and the line to its end. A list of the
/// line's words would say the same, but would keep them all: a line may be
/// as long as the program likes.
Answer first_word_of_line(std::istream& in)
{
    Answer first;
    KvoToken word("\n");
    while (in.good()) {
        word.Read(in);
        const char start = *word.Text();
        if (!word.Quote() && (start == '\0' || start == '\n'))
            break;
        if (!first)
            first.reset(KvoNewString(word.Text()));
    }
    return first;
}

} // namespace

QueryProgram::QueryProgram(const char* location) : installation(location) {}

void QueryProgram::ask(std::span<const char* const> names,
                       std::span<Answer> answers) const
{
    try {
        const std::string command = command_of(installation);
        if (command.empty())
            return;
        OutputBuffer buffer(line_of(command, names).c_str());
        std::istream in(&buffer);
        for (Answer& answer : answers)
            answer = first_word_of_line(in);
    } catch (const std::exception&) {
        // No memory: what was not answered yet has no answer.
    }
}

bool may_be_asked(const char* name)
{
    return *name != '\0' &&
           std::all_of(name, name + std::strlen(name), [](char c) {
               return is_letter_or_digit(c) || c == '_';
           });
}

} // namespace zt_env
