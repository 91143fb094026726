#include "geometry/value.h"

#include <charconv>
#include <locale>
#include <sstream>

namespace ztsh {

namespace {

bool is_digit(char c)
{
    return c >= '0' && c <= '9';
}

std::string shortest(float number)
{
    char digits[32];
    auto [end, fault] = std::to_chars(digits, digits + sizeof digits, number);
    return fault == std::errc() ? std::string(digits, end) : "";
}

void add(std::string& text, float number)
{
    text += (text.empty() ? "" : " ") + shortest(number);
}

void add(std::string& text, const KvoVec3& v)
{
    for (float number : {v.x, v.y, v.z})
        add(text, number);
}

void add(std::string& text, const KvoVec4& v)
{
    for (float number : {v.x, v.y, v.z, v.w})
        add(text, number);
}

void add(std::string& text, const KvoMat& m)
{
    for (const KvoVec4& row : m.rows)
        add(text, row);
}

void add(std::string& text, const KvoQuat& q)
{
    add(text, q.s);
    add(text, q.v);
}

} // namespace

ValueKind KindOf(const Value& value)
{
    return static_cast<ValueKind>(value.index());
}

const char* NameOf(ValueKind kind)
{
    constexpr const char* names[] = {"a number", "a vector of 3",
                                     "a vector of 4", "a matrix",
                                     "a quaternion"};
    return names[static_cast<std::size_t>(kind)];
}

std::string StreamText(const Value& value)
{
    if (const float* number = std::get_if<float>(&value))
        return shortest(*number);
    std::ostringstream text;
    text.imbue(std::locale::classic());
    std::visit([&](const auto& it) { text << it; }, value);
    std::string written = text.str();
    // A matrix ends its last row itself.
    if (!written.empty() && written.back() == '\n')
        written.pop_back();
    return written;
}

std::string BareText(const Value& value)
{
    std::string text;
    std::visit([&](const auto& it) { add(text, it); }, value);
    return text;
}

bool LooksLikeNumber(const std::string& word)
{
    std::size_t at = 0;
    if (at < word.size() && (word[at] == '-' || word[at] == '+'))
        ++at;
    if (at < word.size() && word[at] == '.')
        ++at;
    return at < word.size() && is_digit(word[at]);
}

bool ReadFloat(const std::string& word, float& number)
{
    const char* end = word.data() + word.size();
    float read = 0;
    auto [stop, fault] = std::from_chars(word.data(), end, read);
    if (stop != end || !LooksLikeNumber(word))
        return false;
    if (fault == std::errc::result_out_of_range) {
        // Too small and too large are the same fault here; a stream tells them
        // apart.
        std::istringstream again(word);
        again.imbue(std::locale::classic());
        if (!(again >> read))
            return false;
    }
    number = read;
    return true;
}

} // namespace ztsh
