#include "pages/pages.h"

#include <ostream>

namespace zt_pages {

namespace {

std::string joined(const std::vector<std::string>& words, const char* gap)
{
    std::string text;
    for (const std::string& word : words)
        text += (text.empty() ? "" : gap) + word;
    return text;
}

/// Puts a backslash before every one of `specials`.
std::string escaped(const std::string& text, const std::string& specials)
{
    std::string written;
    for (char character : text) {
        if (specials.find(character) != std::string::npos)
            written += '\\';
        written += character;
    }
    return written;
}

/// Puts a text between single quotes, for bash and zsh.
std::string quoted(const std::string& text)
{
    std::string written = "'";
    for (char character : text)
        written += character == '\'' ? std::string("'\\''")
                                     : std::string(1, character);
    return written + "'";
}

/// The name of the function that completes.
std::string function_of(const Command& command)
{
    std::string name = "_" + command.name;
    for (char& character : name)
        if (character == '-')
            character = '_';
    return name;
}

} // namespace

void WriteBashCompletion(std::ostream& out, const Command& command)
{
    std::string function = function_of(command);
    out << function
        << "()\n{\n"
           "    local current=${COMP_WORDS[COMP_CWORD]}\n"
           "    COMPREPLY=()\n"
           "    case ${COMP_WORDS[COMP_CWORD-1]} in\n";
    std::vector<std::string> names;
    for (const Option& option : command.options) {
        names.insert(names.end(), option.names.begin(), option.names.end());
        if (option.value.empty() || option.files)
            continue;
        // An answer that is empty would make bash offer the names of files.
        out << "    " << joined(option.names, " | ")
            << ")\n        compopt +o default\n        COMPREPLY=($(compgen -W "
            << quoted(joined(option.choices, " "))
            << " -- \"$current\"))\n        return ;;\n";
    }
    out << "    esac\n    [[ $current != -* ]] ||\n"
           "        COMPREPLY=($(compgen -W "
        << quoted(joined(names, " "))
        << " -- \"$current\"))\n}\ncomplete -o default -F " << function << " "
        << command.name << "\n";
}

void WriteZshCompletion(std::ostream& out, const Command& command)
{
    out << "#compdef " << command.name << "\n_arguments -s";
    for (const Option& option : command.options) {
        std::string value;
        if (!option.value.empty()) {
            value.append(":").append(option.value).append(":");
            if (option.files)
                value += "_files";
            else if (!option.choices.empty())
                value += "(" + joined(option.choices, " ") + ")";
        }
        std::string others =
            option.repeats ? "*" : "(" + joined(option.names, " ") + ")";
        std::string rest = "[" + escaped(option.help, "\\[]:") + "]" + value;
        for (const std::string& name : option.names)
            out << " \\\n    " << quoted(joined({others, name, rest}, ""));
    }
    if (!command.words.value.empty())
        out << " \\\n    "
            << quoted(std::string(command.words.repeats ? "*" : "") + ":" +
                      command.words.value + ":" +
                      (command.words.files ? "_files" : ""));
    out << "\n";
}

void WriteFishCompletion(std::ostream& out, const Command& command)
{
    if (!command.words.files)
        out << "complete -c " << command.name << " -f\n";
    for (const Option& option : command.options) {
        out << "complete -c " << command.name;
        for (const std::string& name : option.names) {
            bool is_long = name.compare(0, 2, "--") == 0;
            out << (is_long ? " -l " + name.substr(2)
                            : " -s " + name.substr(1));
        }
        if (!option.value.empty())
            out << (option.files ? " -r" : " -x");
        if (!option.choices.empty())
            out << " -a '" << escaped(joined(option.choices, " "), "\\'")
                << "'";
        out << " -d '" << escaped(option.help, "\\'") << "'\n";
    }
}

void Write(std::ostream& out, const std::string& kind, const Command& command)
{
    if (kind == "man")
        WriteManual(out, command);
    else if (kind == "bash")
        WriteBashCompletion(out, command);
    else if (kind == "zsh")
        WriteZshCompletion(out, command);
    else if (kind == "fish")
        WriteFishCompletion(out, command);
}

} // namespace zt_pages
