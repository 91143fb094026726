#ifndef ZT_TESTS_LITERALTOKENIZER_H
#define ZT_TESTS_LITERALTOKENIZER_H

#include <algorithm>
#include <cstddef>
#include <istream>
#include <ostream>
#include <string>
#include <vector>

/// A token as the reference reads it.
struct LiteralToken
{
    std::string text;
    char quote = 0;

    bool operator==(const LiteralToken&) const = default;
    friend std::ostream& operator<<(std::ostream& out, const LiteralToken& t)
    {
        return out << '[' << (t.quote ? t.quote : '-') << ' ' << t.text << ']';
    }
};

/// The language's rules written down as they are told, one `get` a character
/// and one `putback` at most: what the library's tokenizer is compared with,
/// for its results and for its speed.
class LiteralTokenizer
{
public:
    LiteralTokenizer(const std::string& special, const std::string& end_set)
        : end(end_set), actions(256, 0)
    {
        std::fill_n(actions.begin(), 32, blank);
        for (const char c : std::string(" \t\f\n\r\v"))
            add(c, blank);
        for (const char c : special + end)
            add(c, special_one);
        for (const char c : std::string("\"'\\"))
            add(c, quote_or_escape);
    }

    LiteralToken ReadToken(std::istream& in) const
    {
        LiteralToken token;
        char c;
        while (get(in, c) && (action(c) & blank) && !(action(c) & special_one))
            ;
        if (!in.fail())
            put_back(in, c);
        for (bool more = get(in, c); more; more = get(in, c)) {
            if (action(c) & special_one) {
                if (!token.quote && token.text.empty())
                    token.text.push_back(c);
                else
                    put_back(in, c);
                return token;
            }
            if (action(c) & quote_or_escape)
                read_quoted(in, c, token);
            else if (action(c) & blank)
                return token;
            else
                token.text.push_back(c);
        }
        return token;
    }

    void AppendList(std::istream& in, std::vector<LiteralToken>& list) const
    {
        while (in.good()) {
            LiteralToken token = ReadToken(in);
            if (!token.quote &&
                (token.text.empty() || end.find(token.text[0]) != end.npos))
                return;
            list.push_back(token);
        }
    }

    void AppendStatement(std::istream& in,
                         std::vector<LiteralToken>& list) const
    {
        const std::size_t held = list.size();
        do {
            AppendList(in, list);
            if (!in.good())
                return;
            clean(list);
        } while (list.size() == held);
    }

private:
    static constexpr unsigned char blank = 1;
    static constexpr unsigned char special_one = 2;
    static constexpr unsigned char quote_or_escape = 4;

    void add(char c, unsigned char bit)
    {
        unsigned char& bits = actions[static_cast<unsigned char>(c)];
        bits = static_cast<unsigned char>(bits | bit);
    }

    unsigned char action(char c) const
    {
        return actions[static_cast<unsigned char>(c)];
    }

    // Streams may have been told to throw; what counts is their state.
    static bool get(std::istream& in, char& c)
    {
        try {
            in.get(c);
        } catch (...) {
        }
        return !in.fail();
    }

    static void put_back(std::istream& in, char c)
    {
        try {
            in.putback(c);
        } catch (...) {
        }
    }

    static void read_quoted(std::istream& in, char quote, LiteralToken& token)
    {
        char c;
        token.quote = quote;
        if (quote == '\\') {
            if (get(in, c))
                token.text.push_back(c);
        } else {
            while (get(in, c) && c != quote)
                token.text.push_back(c);
        }
    }

    static void clean(std::vector<LiteralToken>& list)
    {
        for (std::size_t i = 0; i < list.size(); ++i) {
            const char first = list[i].text.empty() ? '\0' : list[i].text[0];
            const auto here = list.begin() + static_cast<std::ptrdiff_t>(i);
            if (first == '!' || first == '#')
                list.erase(here, list.end());
            else if (first == '\n')
                list.erase(here);
        }
    }

    std::string end;
    std::vector<unsigned char> actions;
};

#endif
