#include "time/time_text.h"

#include "words/word_director.h"

#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <vector>

namespace ztsh {

namespace {

struct UnitName
{
    const char* name;
    TimeUnit unit;
};

constexpr UnitName unit_names[] = {
    {"timecode", TimeUnit::Timecode},
    {"frame", TimeUnit::Frames},
    {"frames", TimeUnit::Frames},
    {"tick", TimeUnit::Ticks},
    {"ticks", TimeUnit::Ticks},
    {"ms", TimeUnit::Milliseconds},
    {"millisecond", TimeUnit::Milliseconds},
    {"milliseconds", TimeUnit::Milliseconds},
    {"s", TimeUnit::Seconds},
    {"second", TimeUnit::Seconds},
    {"seconds", TimeUnit::Seconds},
    {"min", TimeUnit::Minutes},
    {"minute", TimeUnit::Minutes},
    {"minutes", TimeUnit::Minutes},
    {"h", TimeUnit::Hours},
    {"hour", TimeUnit::Hours},
    {"hours", TimeUnit::Hours},
};

int ticks_of(TimeUnit unit, int fps)
{
    switch (unit) {
    case TimeUnit::Milliseconds:
        return KvoTime::ticks_per_millisecond;
    case TimeUnit::Seconds:
        return KvoTime::ticks_per_second;
    case TimeUnit::Minutes:
        return KvoTime::ticks_per_minute;
    case TimeUnit::Hours:
        return KvoTime::ticks_per_hour;
    case TimeUnit::Timecode:
    case TimeUnit::Frames:
        return KvoTime(1, fps).Ticks();
    case TimeUnit::Ticks:
        break;
    }
    return 1;
}

/// Converts an amount that is known to fit, as the library does.
KvoTime time_of(double amount, TimeUnit unit, int fps)
{
    auto single = static_cast<float>(amount);
    switch (unit) {
    case TimeUnit::Milliseconds:
        return KvoTime(KvoTime::milliseconds, single);
    case TimeUnit::Seconds:
        return KvoTime(KvoTime::seconds, single);
    case TimeUnit::Minutes:
        return KvoTime(KvoTime::minutes, single);
    case TimeUnit::Hours:
        return KvoTime(KvoTime::hours, single);
    case TimeUnit::Timecode:
    case TimeUnit::Frames:
        return KvoTime(amount, fps);
    case TimeUnit::Ticks:
        break;
    }
    // Single precision has too few digits for these.
    return KvoTime::FromTicks(static_cast<std::int32_t>(amount));
}

bool is_digit(char character)
{
    return character >= '0' && character <= '9';
}

/// Takes a text apart at its colons into whole numbers without signs.
///
/// Returns: no fields at all if one is anything else.
std::vector<long> fields_of(const std::string& text)
{
    constexpr long most = std::numeric_limits<std::int32_t>::max();
    std::vector<long> fields;
    for (std::size_t start = 0; start <= text.size();) {
        std::size_t end = std::min(text.find(':', start), text.size());
        std::string field = text.substr(start, end - start);
        long value = 0;
        if (field.empty() || !is_digit(field[0]) ||
            !ReadNumber(field.c_str(), 0, most, value))
            return {};
        fields.push_back(value);
        start = end + 1;
    }
    return fields;
}

} // namespace

bool UnitOf(const std::string& name, TimeUnit& unit)
{
    for (const UnitName& known : unit_names)
        if (name == known.name) {
            unit = known.unit;
            return true;
        }
    return false;
}

bool ReadRate(const char* text, int& fps)
{
    long rate = 0;
    if (!text || !ReadNumber(text, 1, KvoTime::ticks_per_second, rate))
        return false;
    fps = static_cast<int>(rate);
    return true;
}

TimeReader::TimeReader(const KvoStatement& time_statement, int first,
                       int frame_rate)
    : statement(time_statement), next(first), fps(frame_rate)
{}

bool TimeReader::Read(KvoTime& time)
{
    std::int64_t sum = 0;
    if (!product(sum))
        return false;
    for (;;) {
        bool minus = false;
        if (take("-"))
            minus = true;
        else if (!take("+"))
            break;
        std::int64_t further = 0;
        if (!product(further))
            return false;
        sum += minus ? -further : further;
        if (!fits(sum))
            return false;
    }
    time = KvoTime::FromTicks(static_cast<std::int32_t>(sum));
    return true;
}

bool TimeReader::product(std::int64_t& ticks)
{
    if (!amount(ticks))
        return false;
    for (;;) {
        long whole = 0;
        if (take("*")) {
            if (!factor(whole))
                return false;
            ticks *= whole;
        } else if (take("/")) {
            if (!factor(whole))
                return false;
            if (whole == 0)
                return fail("nothing can be divided by 0");
            ticks /= whole;
        } else {
            return true;
        }
        if (!fits(ticks))
            return false;
    }
}

bool TimeReader::amount(std::int64_t& ticks)
{
    const char* word = statement.ArgText(next);
    if (!word)
        return fail("a time is missing at the end");
    std::string text = word;
    bool right = text.find(':') != text.npos ? timecode(text, ticks)
                                             : number(text, ticks);
    return right && fits(ticks);
}

bool TimeReader::timecode(const std::string& text, std::int64_t& ticks)
{
    constexpr std::size_t most_fields = 4;
    bool minus = text[0] == '-';
    std::vector<long> fields = fields_of(text.substr(minus ? 1 : 0));
    if (fields.empty() || fields.size() > most_fields)
        return fail(text + " is no timecode");
    const int units[most_fields] = {
        KvoTime::ticks_per_hour, KvoTime::ticks_per_minute,
        KvoTime::ticks_per_second, ticks_of(TimeUnit::Frames, fps)};
    const int* unit = std::end(units) - fields.size();
    ticks = 0;
    for (long field : fields)
        ticks += std::int64_t{field} * *unit++;
    if (minus)
        ticks = -ticks;
    ++next;
    return true;
}

bool TimeReader::number(const std::string& text, std::int64_t& ticks)
{
    double value = 0;
    bool minus = text[0] == '-';
    const char* digits = text.c_str() + (minus ? 1 : 0);
    const char* end = text.c_str() + text.size();
    auto [stop, fault] =
        std::from_chars(digits, end, value, std::chars_format::fixed);
    bool begins = is_digit(*digits) || *digits == '.';
    if (!begins || fault != std::errc() || stop != end)
        return fail((text.empty() ? "an empty word" : text) +
                    " is neither a timecode nor a number");
    ++next;
    TimeUnit unit = TimeUnit::Frames;
    const char* name = statement.ArgText(next);
    if (name && UnitOf(name, unit)) {
        if (unit == TimeUnit::Timecode)
            return fail("a number is no timecode");
        ++next;
    }
    value = minus ? -value : value;
    constexpr double too_many = 2147483648.0;
    if (std::abs(value) * ticks_of(unit, fps) >= too_many)
        return fits(std::numeric_limits<std::int64_t>::max());
    ticks = time_of(value, unit, fps).Ticks();
    return true;
}

bool TimeReader::factor(long& whole)
{
    constexpr long most = std::numeric_limits<std::int32_t>::max();
    const char* word = statement.ArgText(next);
    if (!word || !ReadNumber(word, -most, most, whole))
        return fail(std::string(word ? word : "nothing") +
                    " is no whole number to multiply or divide by");
    ++next;
    return true;
}

bool TimeReader::take(const char* sign)
{
    const char* word = statement.ArgText(next);
    if (!word || std::strcmp(word, sign) != 0)
        return false;
    ++next;
    return true;
}

bool TimeReader::fits(std::int64_t ticks)
{
    if (ticks >= std::numeric_limits<std::int32_t>::min() &&
        ticks <= std::numeric_limits<std::int32_t>::max())
        return true;
    return fail("a time goes up to 99 hours either way");
}

bool TimeReader::fail(const std::string& reason)
{
    why = reason;
    return false;
}

std::string TimeText(KvoTime time, TimeUnit unit, int fps)
{
    char text[64];
    if (unit == TimeUnit::Timecode) {
        int parts[4] = {};
        time.Timecode(&parts[0], &parts[1], &parts[2], &parts[3], fps);
        bool minus = false;
        for (int& part : parts) {
            minus = minus || part < 0;
            part = std::abs(part);
        }
        std::snprintf(text, sizeof text, "%s%02d:%02d:%02d:%02d",
                      minus ? "-" : "", parts[0], parts[1], parts[2], parts[3]);
    } else {
        std::snprintf(text, sizeof text, "%.10g",
                      static_cast<double>(time.Ticks()) / ticks_of(unit, fps));
    }
    return text;
}

} // namespace ztsh
