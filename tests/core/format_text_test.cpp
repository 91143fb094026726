#include "core/format_text.h"

#include <climits>
#include <cstdio>
#include <functional>
#include <random>
#include <string>

#include <gtest/gtest.h>

namespace {

__attribute__((format(printf, 1, 2))) std::string Ours(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    const zt_core::FormattedText formatted("", format, arguments);
    va_end(arguments);
    EXPECT_EQ(formatted.View(), formatted.Text());
    return formatted.Text();
}

__attribute__((format(printf, 1, 2))) std::string Systems(const char* format,
                                                          ...)
{
    char text[5000];
    va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    EXPECT_GE(length, 0);
    return text;
}

__attribute__((format(printf, 2, 3))) std::string
Behind(const char* prefix, const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    const zt_core::FormattedText formatted(prefix, format, arguments);
    va_end(arguments);
    return std::string(formatted.View());
}

// The compiler does not see the functions through the call, and so does not ask
// for a format that it can check.
template <class... Arguments>
void ExpectAsTheSystemDoes(const std::string& format, Arguments... arguments)
{
    EXPECT_EQ(std::invoke(Ours, format.c_str(), arguments...),
              std::invoke(Systems, format.c_str(), arguments...))
        << format;
}

} // namespace

TEST(FormattedText, IsThatOfTheSystemForNumbers)
{
    for (const int number : {0, 1, -1, 9, 10, 12345, INT_MAX, INT_MIN})
        for (const char* format :
             {"%d", "%i", "%u", "%x", "%X", "%o", "%5d", "%-5d|", "%05d", "%+d",
              "% d", "%.3d", "%hd", "%hhd", "<%d>", "%d%%"})
            ExpectAsTheSystemDoes(format, number);
}

TEST(FormattedText, IsThatOfTheSystemForLongNumbers)
{
    for (const long number : {0L, -1L, 1234567890123L, LONG_MAX, LONG_MIN})
        for (const char* format :
             {"%ld", "%li", "%lu", "%lx", "%20ld", "%lld", "%zd", "%jd"})
            ExpectAsTheSystemDoes(format, number);
}

TEST(FormattedText, IsThatOfTheSystemForTexts)
{
    for (int length = 0; length < 1100; length = length * 5 / 4 + 1)
        for (const char* format : {"%s", "<%s>", "%10s|", "%-10s|", "%.3s"})
            ExpectAsTheSystemDoes(
                format,
                std::string(static_cast<std::size_t>(length), 'x').c_str());
}

TEST(FormattedText, IsThatOfTheSystemWhereItsRoomEnds)
{
    for (int length = 1000; length < 1030; ++length) {
        const std::string text(static_cast<std::size_t>(length), 'x');
        ExpectAsTheSystemDoes("%s", text.c_str());
        ExpectAsTheSystemDoes("%s%d", text.c_str(), 123456);
        ExpectAsTheSystemDoes("%d%s", -7, text.c_str());
        ExpectAsTheSystemDoes("%s%c", text.c_str(), 'y');
        ExpectAsTheSystemDoes("%s%%", text.c_str());
        ExpectAsTheSystemDoes(text);
        ExpectAsTheSystemDoes(text + "%d", 5);
    }
}

TEST(FormattedText, IsThatOfTheSystemForOddArguments)
{
    ExpectAsTheSystemDoes("%s.", static_cast<const char*>(nullptr));
    ExpectAsTheSystemDoes("%p", static_cast<const void*>("x"));
    ExpectAsTheSystemDoes("%f %g", 0.5, 1e20);
    ExpectAsTheSystemDoes("%*d", 6, 12);
    ExpectAsTheSystemDoes("%2$d %1$s", "x", 12);
    ExpectAsTheSystemDoes("%c%c", 'a', '\n');
}

TEST(FormattedText, EndsAtACharacterThatIsNul)
{
    EXPECT_EQ(Ours("one%ctwo", 0), "one");
}

TEST(FormattedText, IsThatOfTheSystemForFormatsMadeAtRandom)
{
    const char* const literals[] = {"", " ", "frame ", "%%", "\n", "of 100%% "};
    const char* const numbers[] = {"%d", "%i", "%u", "%4d", "%x", "%-3d"};
    const char* const texts[] = {"%s", "%5s", "%.2s", "%s"};
    const char* const long_numbers[] = {"%ld", "%lu", "%li", "%lx"};
    std::minstd_rand random(7);
    const auto pick = [&](const auto& choices) {
        return choices[random() % std::size(choices)];
    };

    for (int round = 0; round < 5000; ++round) {
        std::string format = pick(literals);
        format = format + pick(numbers) + pick(literals) + pick(texts) +
                 pick(literals) + pick(long_numbers) + pick(literals) + "%c" +
                 pick(texts) + pick(literals) + pick(numbers) +
                 pick(long_numbers);
        const int number = static_cast<int>(random()) - (1 << 30);
        const std::string text(random() % 40, 't');
        ExpectAsTheSystemDoes(format, number, text.c_str(), number * 4000L, 'c',
                              "short", -number % 100, -1L * number);
    }
}

TEST(FormattedText, StandsBehindItsPrefix)
{
    const std::string text(3000, 'x');

    EXPECT_EQ(Behind("Error: ", "%d", 5), "Error: 5");
    EXPECT_EQ(Behind("Error: ", "%4d", 5), "Error:    5");
    EXPECT_EQ(Behind("Error: ", "%s", text.c_str()), "Error: " + text);
    EXPECT_EQ(Behind("", "%s", text.c_str()), text);
}

TEST(FormattedText, ThatTheSystemRefusesStandsBehindItsPrefixToo)
{
    const wchar_t unknown[] = {wchar_t(0x7fffffff), 0}; // is no character
    const std::string format = std::string(3000, 'x') + "%ls";

    EXPECT_EQ(Behind("Error: ", "%ls!", unknown), "Error: %ls!");
    EXPECT_EQ(std::invoke(Behind, "Error: ", format.c_str(), unknown),
              "Error: " + format);
}
