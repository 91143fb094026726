#include "ZT/util.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <new>
#include <type_traits>
#include <utility>

#include "core/format_text.h"

namespace {
constexpr std::size_t ring_size = 100;
char* ring[ring_size];
std::size_t next_slot = 0;

// What a temporary string is when there is no memory for one. Whoever got it
// last may have written into it.
char no_memory[1];

char* empty_text()
{
    no_memory[0] = '\0';
    return no_memory;
}

char* keep_in_ring(char* made)
{
    delete[] std::exchange(ring[next_slot], made);
    next_slot = (next_slot + 1) % ring_size;
    return made;
}

bool is_letter(char c)
{
    return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z');
}

int clamped_to_int(long value)
{
    if (value > std::numeric_limits<int>::max())
        return std::numeric_limits<int>::max();
    if (value < std::numeric_limits<int>::min())
        return std::numeric_limits<int>::min();
    return static_cast<int>(value);
}

// The most negative number divided by -1 does not fit its type: the machine
// would trap. The remainder by -1 is always 0.
template <class Number>
Number divisor_of(Number a, Number b)
{
    while (b != 0) {
        const Number rest = b == -1 ? 0 : a % b;
        a = b;
        b = rest;
    }
    return a;
}

template <class Number>
Number multiple_of(Number a, Number b)
{
    using Wrapping = std::make_unsigned_t<Number>;
    const Number divisor = divisor_of(a, b);
    if (divisor == 0)
        return 0;
    const Wrapping product =
        static_cast<Wrapping>(a) * static_cast<Wrapping>(b);
    if (divisor == -1)
        return static_cast<Number>(Wrapping{0} - product);
    return static_cast<Number>(product) / divisor;
}
} // namespace

char* ZtNewString(const char* text, int extra)
{
    const std::size_t length = text ? std::strlen(text) : 0;
    const std::size_t room = extra > 0 ? static_cast<std::size_t>(extra) : 0;
    char* const copy = new (std::nothrow) char[length + room + 1];
    if (!copy)
        return nullptr;
    if (length != 0)
        std::memcpy(copy, text, length);
    copy[length] = '\0';
    return copy;
}

char* KvoNewString(const char* text, int extra)
{
    return ZtNewString(text, extra);
}

char* ZtNewTempString(const char* text, int extra)
{
    // The copy comes first: the text may be the very string that is freed.
    if (char* const made = ZtNewString(text, extra))
        return keep_in_ring(made);
    return extra > 0 ? nullptr : empty_text();
}

char* ZtFmt(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    const zt_core::FormattedText formatted("", format, arguments);
    va_end(arguments);
    return ZtNewTempString(formatted.Text());
}

const char* ZtQuote(const char* text, char open, char close,
                    const char* specials)
{
    if (!text)
        text = "";
    if (specials && *text && !std::strpbrk(text, specials))
        return text;
    const std::size_t length = std::strlen(text);
    char* const quoted = new (std::nothrow) char[length + 3];
    if (!quoted)
        return empty_text();
    quoted[0] = open;
    std::memcpy(quoted + 1, text, length);
    quoted[length + 1] = close;
    quoted[length + 2] = '\0';
    return keep_in_ring(quoted);
}

const char* KvoQuote(const char* text, char open, char close,
                     const char* specials)
{
    return ZtQuote(text, open, close, specials);
}

int ZtScanInteger(const char* text)
{
    if (!text)
        return 1;
    char* rest = nullptr;
    const long number = std::strtol(text, &rest, 0);
    auto bits =
        static_cast<std::uint32_t>(rest == text ? 1 : clamped_to_int(number));
    for (; is_letter(*rest); ++rest) {
        if (*rest == 'K' || *rest == 'k')
            bits <<= 10;
        else if (*rest == 'M' || *rest == 'm')
            bits <<= 20;
        else
            break;
    }
    return static_cast<int>(bits);
}

void ZtEatArg(int& argc, char** argv, int index)
{
    if (!argv || index < 0 || index >= argc)
        return;
    for (int place = index; place + 1 < argc; ++place)
        argv[place] = argv[place + 1];
    --argc;
    argv[argc] = nullptr;
}

std::uint32_t ZtHash(const char* text)
{
    std::uint32_t hash = 0;
    for (; text && *text; ++text)
        hash = hash * 33 + static_cast<unsigned char>(*text);
    return hash;
}

int ZtGCD(int a, int b)
{
    return divisor_of(a, b);
}

long ZtGCD(long a, long b)
{
    return divisor_of(a, b);
}

int ZtLCM(int a, int b)
{
    return multiple_of(a, b);
}

long ZtLCM(long a, long b)
{
    return multiple_of(a, b);
}
