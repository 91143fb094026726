#include "prompt/completion.h"

#include "prompt/quote_state.h"

#include <algorithm>
#include <filesystem>
#include <strings.h>

namespace ztsh {

namespace {

bool starts_with_blind(const std::string& word, const std::string& start)
{
    return word.size() >= start.size() &&
           strncasecmp(word.c_str(), start.c_str(), start.size()) == 0;
}

std::vector<std::string> matching_words(const std::vector<std::string>& words,
                                        const std::string& start)
{
    std::vector<std::string> found;
    for (const std::string& word : words)
        if (starts_with_blind(word, start))
            found.push_back(word);
    return found;
}

/// The files whose path begins with `start`; directories end with a slash.
std::vector<std::string> matching_files(const std::string& start)
{
    std::size_t slash = start.rfind('/');
    std::string head =
        slash == std::string::npos ? "" : start.substr(0, slash + 1);
    std::string tail = start.substr(head.size());
    std::vector<std::string> found;
    std::error_code fault;
    std::filesystem::directory_iterator entry(head.empty() ? "." : head, fault);
    for (; !fault && entry != std::filesystem::directory_iterator();
         entry.increment(fault)) {
        std::string name = entry->path().filename().string();
        if (name.compare(0, tail.size(), tail) != 0 ||
            (tail.empty() && name[0] == '.'))
            continue;
        std::error_code ignored;
        found.push_back(head + name +
                        (entry->is_directory(ignored) ? "/" : ""));
    }
    std::sort(found.begin(), found.end());
    return found;
}

/// What all words begin with; the first one's letters where only the case
/// differs.
std::string common_start(const std::vector<std::string>& words)
{
    std::string common = words.front();
    for (const std::string& word : words) {
        std::size_t same = 0;
        while (same < common.size() && same < word.size() &&
               strncasecmp(&common[same], &word[same], 1) == 0)
            ++same;
        common.resize(same);
    }
    return common;
}

/// Writes a word so that the tokenizer reads it back: inside the quote that is
/// open, or with escapes.
std::string quoted(const std::string& text, char quote)
{
    if (quote != '\0')
        return quote + text;
    std::string escaped;
    for (char character : text) {
        bool blank = static_cast<unsigned char>(character) <= ' ';
        if (blank || std::string_view("\"'\\;!").find(character) !=
                         std::string_view::npos)
            escaped += '\\';
        escaped += character;
    }
    return escaped;
}

} // namespace

WordAtCursor FindWord(std::string_view line)
{
    WordAtCursor word;
    QuoteState quotes;
    int position = 0; // of the word in its statement
    bool escaped = false;
    for (std::size_t i = 0; i < line.size(); ++i) {
        char character = line[i];
        char quote_before = quotes.Quote();
        bool literal = escaped || (quote_before && quote_before != character);
        escaped = !literal && character == '\\';
        quotes.Add(line.substr(i, 1));
        bool ends = character == ';' || character == '!';
        bool blank = static_cast<unsigned char>(character) <= ' ';
        if (!literal && (ends || blank)) {
            position = ends ? 0 : position + (i > word.start ? 1 : 0);
            word.start = i + 1;
            word.text.clear();
        } else if (literal || (!escaped && quotes.Quote() == quote_before)) {
            word.text += character;
        }
    }
    word.quote = quotes.Quote();
    word.is_command = position == 0;
    return word;
}

Completion Complete(std::string_view line,
                    const std::vector<std::string>& commands)
{
    WordAtCursor word = FindWord(line);
    std::string_view before = line.substr(0, word.start);
    std::size_t statement = before.find_last_of(';');
    if (statement != std::string_view::npos)
        before.remove_prefix(statement + 1);
    std::string first(before);
    first.erase(0, first.find_first_not_of(" \t"));
    bool help = strncasecmp(first.c_str(), "help ", 5) == 0;

    Completion completion;
    completion.start = word.start;
    bool words = word.is_command || help;
    completion.candidates =
        words ? matching_words(commands, word.text) : matching_files(word.text);
    if (completion.candidates.empty())
        return completion;
    completion.text = quoted(common_start(completion.candidates), word.quote);
    if (completion.candidates.size() == 1 && completion.text.back() != '/') {
        if (word.quote != '\0')
            completion.text += word.quote;
        completion.text += ' ';
    }
    return completion;
}

std::string InColumns(const std::vector<std::string>& words, int columns)
{
    std::size_t widest = 0;
    for (const std::string& word : words)
        widest = std::max(widest, word.size());
    std::size_t room = static_cast<std::size_t>(std::max(columns, 1));
    std::size_t across = std::max<std::size_t>(1, (room + 2) / (widest + 2));
    std::size_t down = (words.size() + across - 1) / across;
    std::string text;
    for (std::size_t row = 0; row < down; ++row) {
        for (std::size_t i = row; i < words.size(); i += down) {
            text += words[i];
            if (i + down < words.size())
                text.append(widest + 2 - words[i].size(), ' ');
        }
        text += '\n';
    }
    return text;
}

} // namespace ztsh
