#include "KVO/KvoTime.h"

#include <algorithm>
#include <charconv>
#include <cstring>
#include <istream>
#include <limits>
#include <ostream>

#include "KVO/KvoToken.h"

#include "core/number_text.h"
#include "core/truncate.h"

namespace {
std::int32_t truncated(double tick_amount)
{
    return zt_core::truncate_to<std::int32_t>(tick_amount);
}

bool is_blank(char character)
{
    return character == ' ' || (character >= '\t' && character <= '\r');
}

bool is_digit(char character)
{
    return character >= '0' && character <= '9';
}

/// Reads a decimal integer at `at`, blanks and a sign before it allowed, and
/// moves `at` behind it. A number beyond the range of int is its nearest end.
///
/// Returns: whether there was one; if not, `number` stays as it was.
bool scan_integer(const char*& at, int& number)
{
    const char* digits = at;
    while (is_blank(*digits))
        ++digits;
    const bool negative = *digits == '-';
    if (*digits == '-' || *digits == '+')
        ++digits;
    if (!is_digit(*digits))
        return false;
    using limits = std::numeric_limits<int>;
    const long long nearest_end =
        negative ? -static_cast<long long>(limits::min()) : limits::max();
    long long amount = 0;
    for (at = digits; is_digit(*at); ++at)
        amount = std::min(amount * 10 + (*at - '0'), nearest_end);
    number = static_cast<int>(negative ? -amount : amount);
    return true;
}

/// Gives the integer that leads `text`, 0 if none does.
int leading_integer(const char* text)
{
    int number = 0;
    scan_integer(text, number);
    return number;
}

bool is_separator(const KvoToken& token)
{
    const char* text = token.Text();
    return !token.Quote() && (*text == ':' || *text == '.');
}

/// Writes `number`, 0 to 99, as two digits; gives the end.
char* put_two_digits(char* at, int number)
{
    at[0] = static_cast<char>('0' + number / 10);
    at[1] = static_cast<char>('0' + number % 10);
    return at + 2;
}

/// Writes any number with two digits or more; gives the end.
char* put_frames(char* at, char* end, int number)
{
    if (number >= 0 && number < 100)
        return put_two_digits(at, number);
    return std::to_chars(at, end, number).ptr;
}

/// The binary form: the value as it lies in memory.
struct TickBytes
{
    char bytes[sizeof(std::int32_t)];
};

TickBytes to_bytes(std::int32_t ticks)
{
    TickBytes form;
    std::memcpy(form.bytes, &ticks, sizeof form.bytes);
    return form;
}

std::int32_t from_bytes(const TickBytes& form)
{
    std::int32_t ticks;
    std::memcpy(&ticks, form.bytes, sizeof form.bytes);
    return ticks;
}

/// Runs a step on a stream that its owner may have told to throw; the stream's
/// state bits tell what happened.
template <class Step>
void quietly(Step step)
{
    try {
        step();
    } catch (...) {
    }
}
} // namespace

constinit std::int32_t KvoTime::default_fps = 30;
constinit std::int32_t KvoTime::binaryIO = 0;

KvoTime::KvoTime(double frames, int fps)
    : tick_count(truncated(frames * frame_ticks(fps)))
{}

KvoTime::KvoTime(float frames, int fps)
    : tick_count(truncated(frames * static_cast<float>(frame_ticks(fps))))
{}

KvoTime::KvoTime(Unit unit, float amount) : tick_count(0)
{
    if (unit == milliseconds)
        tick_count = truncated(static_cast<double>(amount) * 6.0);
    else
        SetTime(unit, amount);
}

KvoTime::KvoTime(const char* text, int fps) : tick_count(0)
{
    int fields[4] = {};
    const char* at = text ? text : "";
    for (int field = 0; scan_integer(at, fields[field]) && *at == ':'; ++at)
        if (++field == 4)
            break;
    SetTimecode(fields[0], fields[1], fields[2], fields[3], fps);
}

void KvoTime::SetTime(Unit unit, float amount)
{
    switch (unit) {
    case ticks:
        tick_count = truncated(amount);
        break;
    case milliseconds:
        tick_count = truncated(amount * 6.0f);
        break;
    case seconds:
        tick_count = truncated(amount * 6000.0f);
        break;
    case minutes:
        tick_count = truncated(amount * 6000.0f * 60.0f);
        break;
    case hours:
        tick_count = truncated(amount * 6000.0f * 60.0f * 60.0f);
        break;
    }
}

float KvoTime::Time(Unit unit) const
{
    const auto amount = static_cast<float>(tick_count);
    switch (unit) {
    case ticks:
        return amount;
    case milliseconds:
        return amount / 6.0f;
    case seconds:
        return amount / 6000.0f;
    case minutes:
        return amount / 360000.0f;
    case hours:
        return amount / 21600000.0f;
    }
    return 0.0f;
}

void KvoTime::Write(std::ostream& out) const
{
    int hh = 0;
    int mm = 0;
    int ss = 0;
    int ff = 0;
    Wrap().Timecode(&hh, &mm, &ss, &ff);
    char text[24];
    char* end = put_two_digits(text, hh);
    *end++ = ':';
    end = put_two_digits(end, mm);
    *end++ = ':';
    end = put_two_digits(end, ss);
    *end++ = ':';
    end = put_frames(end, text + sizeof text, ff);
    out.width(0);
    quietly([&] { out.write(text, end - text); });
}

void KvoTime::Read(std::istream& in)
{
    KvoTokenList words(":.", ";\n");
    words.Read(in);
    if (words.Count() == 0)
        return;
    if (words.Count() == 1) {
        *this = KvoTime(zt_core::text_to_float(words.ArgText(0)));
        return;
    }
    // From the last word backward: frames, seconds, minutes, hours.
    int fields[4] = {};
    int field = 0;
    for (int index = words.Count() - 1; index >= 0 && field < 4;) {
        const KvoToken& word = *words.Find(index);
        if (is_separator(word)) {
            index -= 1;
        } else {
            fields[field++] = leading_integer(word.Text());
            index -= 2;
        }
    }
    SetTimecode(fields[3], fields[2], fields[1], fields[0], 0);
}

void KvoTime::WriteBinary(std::ostream& out) const
{
    if (out.fail())
        return;
    const TickBytes form = to_bytes(tick_count);
    quietly([&] { out.write(form.bytes, sizeof form.bytes); });
    if (out.bad())
        quietly([&] { out.setstate(std::ios_base::failbit); });
}

void KvoTime::ReadBinary(std::istream& in)
{
    TickBytes form;
    quietly([&] { in.read(form.bytes, sizeof form.bytes); });
    if (in.gcount() == sizeof form.bytes)
        tick_count = from_bytes(form);
}
