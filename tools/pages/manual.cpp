#include "pages/pages.h"

#include <algorithm>
#include <cctype>
#include <ostream>
#include <sstream>

namespace zt_pages {

namespace {

/// Hides from the formatter what it would take for its own.
std::string plain(const std::string& text)
{
    std::string written;
    for (char character : text) {
        if (character == '\\')
            written += "\\e";
        else if (character == '-')
            written += "\\-";
        else if (character == '\'')
            written += "\\(aq";
        else if (character == '^')
            written += "\\(ha";
        else if (character == '~')
            written += "\\(ti";
        else if (character == '`')
            written += "\\(ga";
        else
            written += character;
    }
    bool is_request = !written.empty() && written[0] == '.';
    return is_request ? "\\&" + written : written;
}

std::string upper(std::string text)
{
    for (char& character : text)
        character = static_cast<char>(
            std::toupper(static_cast<unsigned char>(character)));
    return text;
}

void write_option(std::ostream& out, const Option& option)
{
    out << ".TP\n";
    const char* gap = "";
    for (const std::string& name : option.names) {
        out << gap << "\\fB" << plain(name) << "\\fR";
        gap = ", ";
    }
    if (!option.value.empty())
        out << (option.names.empty() ? "" : " ") << "\\fI"
            << plain(option.value) << "\\fR";
    out << "\n" << plain(option.help) << ".\n";
}

/// An entry's first line: its first word stands out.
void write_term(std::ostream& out, const std::string& line)
{
    std::size_t end = std::min(line.find(' '), line.size());
    out << ".TP\n\\fB" << plain(line.substr(0, end)) << "\\fR";
    if (end < line.size())
        out << " " << plain(line.substr(end + 1));
    out << "\n";
}

/// A line with blanks in its middle belongs to a table, and stays a line.
bool is_tabular(const std::string& line, std::size_t indent)
{
    return line.find("  ", indent) != std::string::npos;
}

void write_section(std::ostream& out, const Section& section)
{
    constexpr std::size_t entry_indent = 4;
    out << ".SH \"" << plain(upper(section.title)) << "\"\n";
    std::istringstream text(section.text);
    bool in_table = false;
    for (std::string line; std::getline(text, line);) {
        std::size_t indent = line.find_first_not_of(' ');
        if (indent == std::string::npos) {
            out << ".PP\n";
            continue;
        }
        bool is_entry = indent == entry_indent;
        bool to_table = !is_entry && is_tabular(line, indent);
        if (to_table != in_table)
            out << (to_table ? ".nf\n" : ".fi\n");
        in_table = to_table;
        if (is_entry)
            write_term(out, line.substr(indent));
        else
            out << plain(line.substr(indent)) << "\n";
    }
    if (in_table)
        out << ".fi\n";
}

/// A part of the footer in which every line is two blanks, a word, blanks and
/// a text is a list of entries; the line before gives its title.
Section list_of(const std::string& title, std::istringstream& lines)
{
    Section section{title, ""};
    for (std::string line; std::getline(lines, line);) {
        std::size_t word = line.find_first_not_of(' ');
        if (word == 0 || word == std::string::npos) {
            section.text += "\n" + line + "\n";
            continue;
        }
        std::size_t gap = std::min(line.find(' ', word), line.size());
        std::size_t text =
            std::min(line.find_first_not_of(' ', gap), line.size());
        section.text += "    " + line.substr(word, gap - word) + "\n        " +
                        line.substr(text) + "\n";
    }
    return section;
}

/// The footer's paragraphs: the description, and sections for those that
/// begin with a line that ends in a colon.
std::vector<Section> sections_of(const std::string& footer)
{
    std::vector<Section> sections{{"description", ""}};
    for (std::size_t start = 0; start < footer.size();) {
        std::size_t end = std::min(footer.find("\n\n", start), footer.size());
        std::string part = footer.substr(start, end - start);
        start = end + 2;
        std::size_t title = std::min(part.find('\n'), part.size());
        if (title > 0 && part[title - 1] == ':') {
            std::istringstream lines(part.substr(title + 1));
            sections.push_back(list_of(part.substr(0, title - 1), lines));
        } else {
            sections[0].text += "\n" + part + "\n";
        }
    }
    return sections;
}

} // namespace

void WriteManual(std::ostream& out, const Command& command)
{
    std::string purpose = command.purpose;
    if (!purpose.empty() && purpose.back() == '.')
        purpose.pop_back();
    out << ".TH \"" << plain(upper(command.name)) << "\" 1 \"\" \""
        << plain(command.version) << "\"\n.SH NAME\n"
        << plain(command.name) << " \\- " << plain(purpose)
        << "\n.SH SYNOPSIS\n\\fB" << plain(command.name)
        << "\\fR [\\fIOPTIONS\\fR]";
    if (!command.words.value.empty())
        out << " [\\fI" << plain(command.words.value) << "\\fR"
            << (command.words.repeats ? "..." : "") << "]";
    out << "\n";
    std::vector<Section> sections = sections_of(command.footer);
    sections[0].text = command.purpose + "\n" + sections[0].text;
    write_section(out, sections[0]);
    out << ".SH OPTIONS\n";
    if (!command.words.value.empty())
        write_option(out, command.words);
    for (const Option& option : command.options)
        write_option(out, option);
    sections.erase(sections.begin());
    for (const Section& section : command.sections)
        write_section(out, section);
    for (const Section& section : sections)
        write_section(out, section);
}

} // namespace zt_pages
