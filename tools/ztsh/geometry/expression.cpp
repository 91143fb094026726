#include "geometry/expression.h"

#include "words/variables.h"

#include <array>
#include <charconv>

namespace ztsh {

namespace {

constexpr int most_depth = 100;

/// Takes a word apart at its blanks.
void split(const char* word, std::vector<std::string>& words)
{
    std::string part;
    for (; *word; ++word) {
        if (static_cast<unsigned char>(*word) > ' ') {
            part += *word;
        } else if (!part.empty()) {
            words.push_back(part);
            part.clear();
        }
    }
    if (!part.empty())
        words.push_back(part);
}

/// The index that a field names, x y z w in their order; -1 if it is none.
int index_of(const std::string& field)
{
    constexpr std::string_view letters = "xyzw";
    if (field.size() == 1 && letters.find(field[0]) != letters.npos)
        return static_cast<int>(letters.find(field[0]));
    int index = 0;
    const char* end = field.data() + field.size();
    auto [stop, fault] = std::from_chars(field.data(), end, index);
    bool whole = fault == std::errc() && stop == end && !field.empty();
    return whole && index >= 0 ? index : -1;
}

/// Gives a part of a value: a component by its letter, a component or a row by
/// its number. The library is asked with a number that it has to check itself.
///
/// Returns: nothing if the value has no such part.
std::optional<Value> part_of(const Value& value, const std::string& field)
{
    int index = index_of(field);
    bool by_letter = index >= 0 && field[0] > '9';
    if (const KvoQuat* q = std::get_if<KvoQuat>(&value)) {
        constexpr int lengths = 3;
        if (field == "s")
            return q->s;
        return by_letter && index < lengths ? std::optional<Value>(q->v[index])
                                            : std::nullopt;
    }
    if (index < 0)
        return std::nullopt;
    if (const KvoVec3* v = std::get_if<KvoVec3>(&value))
        return by_letter && field == "w" ? std::nullopt
                                         : std::optional<Value>((*v)[index]);
    if (const KvoVec4* v = std::get_if<KvoVec4>(&value))
        return (*v)[index];
    const KvoMat* m = std::get_if<KvoMat>(&value);
    return m && !by_letter ? std::optional<Value>((*m)[index]) : std::nullopt;
}

/// What an argument has to be.
struct Wanted
{
    std::size_t numbers;           ///< So many if numbers follow; 0 for all.
    std::optional<ValueKind> kind; ///< Left to the function if there is none.
};

Wanted wanted_by(Argument argument)
{
    switch (argument) {
    case Argument::Number:
        return {1, ValueKind::Number};
    case Argument::Vector3:
        return {3, ValueKind::Vector3};
    case Argument::Matrix:
        return {0, ValueKind::Matrix};
    case Argument::Quaternion:
        return {0, ValueKind::Quaternion};
    case Argument::Four:
        return {4, std::nullopt};
    case Argument::Any:
        break;
    }
    return {0, std::nullopt};
}

} // namespace

ExpressionReader::ExpressionReader(const KvoStatement& statement, int first,
                                   const ValueTable& known_values)
    : values(known_values)
{
    for (int i = first; i < statement.Count(); ++i)
        split(statement.ArgText(i), words);
}

std::optional<Value> ExpressionReader::Read()
{
    return sum();
}

std::optional<Value> ExpressionReader::Read(ValueKind kind)
{
    std::optional<Value> read = sum();
    if (read && KindOf(*read) != kind)
        return fail(std::string("this is ") + NameOf(KindOf(*read)) +
                    ", expected was " + NameOf(kind));
    return read;
}

std::optional<KvoVec3> ExpressionReader::ReadVector3()
{
    constexpr std::size_t components = 3;
    std::optional<Value> read =
        numbers_ahead() > 0 ? numbers(components) : operand();
    if (!read)
        return std::nullopt;
    if (const KvoVec3* v = std::get_if<KvoVec3>(&*read))
        return *v;
    return fail(std::string("this is ") + NameOf(KindOf(*read)) +
                ", expected was " + NameOf(ValueKind::Vector3));
}

bool ExpressionReader::Take(const char* word)
{
    if (AtEnd() || words[next] != word)
        return false;
    ++next;
    return true;
}

std::string ExpressionReader::TakeAny()
{
    return AtEnd() ? "" : words[next++];
}

bool ExpressionReader::Ended()
{
    if (!AtEnd())
        fail(words[next] + " makes no sense where it stands");
    return AtEnd();
}

std::optional<Value> ExpressionReader::sum()
{
    std::optional<Value> result = product();
    while (result) {
        auto sign = take_operator(Operator::Add, Operator::Subtract);
        if (!sign)
            break;
        std::optional<Value> right = product();
        result = right ? apply(*result, *sign, *right) : std::nullopt;
    }
    return result;
}

std::optional<Value> ExpressionReader::product()
{
    std::optional<Value> result = operand();
    while (result) {
        auto sign = take_operator(Operator::Multiply, Operator::Dot);
        if (!sign)
            break;
        std::optional<Value> right = operand();
        result = right ? apply(*result, *sign, *right) : std::nullopt;
    }
    return result;
}

std::optional<Value> ExpressionReader::operand()
{
    if (AtEnd())
        return fail("something is missing at the end");
    if (depth == most_depth)
        return fail("more than " + std::to_string(most_depth) +
                    " operands within each other");
    ++depth;
    std::optional<Value> result;
    if (LooksLikeNumber(words[next])) {
        result = all_numbers();
    } else {
        const std::string word = words[next++];
        const Function* function = FindFunction(word);
        result = word == "(" ? in_parentheses()
                 : function  ? call(*function)
                             : named(word);
    }
    --depth;
    return result;
}

std::optional<Value> ExpressionReader::in_parentheses()
{
    std::optional<Value> inside = sum();
    if (inside && !Take(")"))
        return fail(AtEnd() ? "a ) is missing at the end"
                            : "a ) is missing before " + words[next]);
    return inside;
}

/// Reads so many numbers, as the value that they make.
std::optional<Value> ExpressionReader::numbers(std::size_t count)
{
    std::array<float, 16> read = {};
    for (std::size_t i = 0; i < count; ++i) {
        if (AtEnd())
            return fail("a number is missing at the end");
        if (!ReadFloat(words[next], read[i]))
            return fail(words[next] + " is no number" +
                        (LooksLikeNumber(words[next])
                             ? " of single precision"
                             : ", and one more is needed"));
        ++next;
    }
    const float* n = read.data();
    switch (count) {
    case 1:
        return n[0];
    case 3:
        return KvoVec3(n);
    case 4:
        return KvoVec4(n);
    case 9:
        return KvoMat(KvoVec3(n), KvoVec3(n + 3), KvoVec3(n + 6));
    case 12:
        return KvoMat(KvoVec3(n), KvoVec3(n + 3), KvoVec3(n + 6),
                      KvoVec3(n + 9));
    case 16:
        return KvoMat(n);
    default:
        return std::nullopt;
    }
}

std::optional<Value> ExpressionReader::all_numbers()
{
    std::size_t count = numbers_ahead();
    constexpr std::size_t counts[] = {1, 3, 4, 9, 12, 16};
    for (std::size_t known : counts)
        if (count == known)
            return numbers(count);
    return fail(std::to_string(count) +
                " numbers are no value; 1 is a number, 3 or 4 a vector, "
                "9, 12 or 16 a matrix");
}

std::optional<Value> ExpressionReader::call(const Function& function)
{
    std::vector<Value> given;
    for (const char* kind = function.arguments; *kind; ++kind) {
        auto read = argument(function, static_cast<Argument>(*kind));
        if (!read)
            return std::nullopt;
        given.push_back(*read);
    }
    std::optional<Value> result = function.call(given);
    if (!result)
        return fail(std::string(function.name) + " does not take " +
                    NameOf(KindOf(given[0])));
    return result;
}

std::optional<Value> ExpressionReader::argument(const Function& function,
                                                Argument kind)
{
    const Wanted wanted = wanted_by(kind);
    auto read = wanted.numbers > 0 && numbers_ahead() > 0
                    ? numbers(wanted.numbers)
                    : operand();
    if (read && wanted.kind && KindOf(*read) != *wanted.kind)
        return fail(std::string(function.name) + " takes " +
                    NameOf(*wanted.kind) + ", not " + NameOf(KindOf(*read)));
    return read;
}

/// Gives the value of a name, or the part of it that the fields behind its
/// points name.
std::optional<Value> ExpressionReader::named(const std::string& word)
{
    std::size_t point = word.find('.');
    std::string name = word.substr(0, point);
    if (!Variables::IsName(name))
        return fail(word + " is neither a number, a value nor a function");
    auto found = values.find(name);
    if (found == values.end())
        return fail("no value is named " + name + "; there " +
                    ThereAre(values));
    Value value = found->second;
    while (point != word.npos) {
        std::size_t end = word.find('.', point + 1);
        std::string field = word.substr(point + 1, end - point - 1);
        std::optional<Value> part = part_of(value, field);
        if (!part)
            return fail(word.substr(0, point) + ", " + NameOf(KindOf(value)) +
                        ", has no part " + field);
        value = *part;
        point = end;
    }
    return value;
}

std::optional<Value> ExpressionReader::apply(const Value& left, Operator sign,
                                             const Value& right)
{
    const float* a = std::get_if<float>(&left);
    const float* b = std::get_if<float>(&right);
    if (a && b && sign == Operator::Divide && *b == 0)
        return fail("a number cannot be divided by 0");
    std::optional<Value> result = Apply(left, sign, right);
    if (!result)
        return fail(std::string(NameOf(KindOf(left))) + " " + NameOf(sign) +
                    " " + NameOf(KindOf(right)) + " has no meaning");
    return result;
}

std::optional<Operator> ExpressionReader::take_operator(Operator first,
                                                        Operator last)
{
    if (AtEnd())
        return std::nullopt;
    std::optional<Operator> sign = OperatorOf(words[next]);
    if (!sign || *sign < first || *sign > last)
        return std::nullopt;
    ++next;
    return sign;
}

/// How many of the next words are meant as numbers.
std::size_t ExpressionReader::numbers_ahead() const
{
    std::size_t count = 0;
    while (next + count < words.size() && LooksLikeNumber(words[next + count]))
        ++count;
    return count;
}

std::nullopt_t ExpressionReader::fail(const std::string& reason)
{
    why = reason;
    return std::nullopt;
}

} // namespace ztsh
