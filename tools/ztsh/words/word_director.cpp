#include "words/word_director.h"

#include <ZT/error.h>

#include <charconv>
#include <cstring>
#include <sstream>

namespace ztsh {

void WriteInfo(std::ostream& out, const Word& word, int number)
{
    out << "    " << word.name << (*word.arguments ? " " : "") << word.arguments
        << "\n";
    if (number == InfoUsage)
        return;
    std::istringstream help(word.help);
    for (std::string line; std::getline(help, line);)
        out << "        " << line << "\n";
}

WordDirector::WordDirector(ZtDispatcher& home_dispatcher,
                           const std::vector<Word>& word_table)
    : ZtDirector(home_dispatcher), table(word_table)
{
    for (std::size_t i = 0; i < table.size(); ++i)
        AddDirective(static_cast<int>(i), table[i].name);
}

void WordDirector::Act(KvoStatement* statement, int selector)
{
    if (selector == each_selector) {
        SeeEach(*statement);
        return;
    }
    const Word& word = table[static_cast<std::size_t>(selector)];
    int arguments = statement->Count() - 1;
    if (arguments < word.least || arguments > word.most)
        Expected(selector);
    else
        Do(*statement, selector);
}

void WordDirector::Info(std::ostream& out, char*, int selector, int number)
{
    WriteInfo(out, table[static_cast<std::size_t>(selector)], number);
}

void WordDirector::SeeEach(KvoStatement&) {}

void WordDirector::Expected(int selector) const
{
    const Word& word = table[static_cast<std::size_t>(selector)];
    ZtError("%s: expected: %s%s%s\n", word.name, word.name,
            *word.arguments ? " " : "", word.arguments);
}

namespace {

template <class Number>
bool read_whole(const char* text, Number least, Number most, Number& number)
{
    Number read = 0;
    const char* end = text + std::strlen(text);
    auto [stop, fault] = std::from_chars(text, end, read);
    // In this form not-a-number is out of range.
    if (fault != std::errc() || stop != end || !(read >= least && read <= most))
        return false;
    number = read;
    return true;
}

} // namespace

bool ReadNumber(const char* text, long least, long most, long& number)
{
    return read_whole(text, least, most, number);
}

bool ReadReal(const char* text, double least, double most, double& number)
{
    return read_whole(text, least, most, number);
}

} // namespace ztsh
