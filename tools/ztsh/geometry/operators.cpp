#include "geometry/operators.h"

#include <iterator>
#include <type_traits>

namespace ztsh {

namespace {

constexpr const char* signs[] = {"+", "-", "*", "/", "cross", "dot"};

template <class A, class B>
constexpr bool same = std::is_same_v<A, B>;

template <class A>
constexpr bool is_number = same<A, float>;

template <class A>
constexpr bool is_vector = same<A, KvoVec3> || same<A, KvoVec4>;

template <class A>
constexpr bool is_matrix = same<A, KvoMat>;

template <class A>
constexpr bool is_quaternion = same<A, KvoQuat>;

/// Whether the library combines the two number by number. Asked by the very
/// kinds, since in C++ many pairs would meet by a conversion that nobody wrote.
template <class A, class B>
constexpr bool by_number = !is_quaternion<A> && !is_quaternion<B> &&
                           (same<A, B> || is_number<A> || is_number<B>);

template <class A, class B>
constexpr bool are_quaternions = is_quaternion<A>&& is_quaternion<B>;

/// Gives a product with the homogeneous divisor that its vector had.
template <class Vector>
Value as(const KvoVec4& product)
{
    return Vector(product);
}

template <class A, class B>
std::optional<Value> multiply(const A& a, const B& b)
{
    if constexpr ((by_number<A, B>) || are_quaternions<A, B>)
        return a * b;
    else if constexpr (is_vector<A> && is_matrix<B>)
        return as<A>(KvoVec4(a) * b);
    else if constexpr (is_matrix<A> && is_vector<B>)
        return as<B>(a * KvoVec4(b));
    else
        return std::nullopt;
}

template <class A, class B>
std::optional<Value> divide(const A& a, const B& b)
{
    if constexpr (by_number<A, B>)
        return a / b;
    else
        return std::nullopt;
}

template <class A, class B>
std::optional<Value> add(const A& a, const B& b)
{
    if constexpr ((by_number<A, B>) || are_quaternions<A, B>)
        return a + b;
    else
        return std::nullopt;
}

template <class A, class B>
std::optional<Value> subtract(const A& a, const B& b)
{
    if constexpr (by_number<A, B>)
        return a - b;
    else
        return std::nullopt;
}

template <class A, class B>
std::optional<Value> cross(const A& a, const B& b)
{
    if constexpr (is_vector<A> && same<A, B>)
        return a.Cross(b);
    else
        return std::nullopt;
}

template <class A, class B>
std::optional<Value> dot(const A& a, const B& b)
{
    if constexpr (is_vector<A> && same<A, B>)
        return a.Dot(b);
    else
        return std::nullopt;
}

} // namespace

std::optional<Operator> OperatorOf(const std::string& word)
{
    for (std::size_t i = 0; i < std::size(signs); ++i)
        if (word == signs[i])
            return static_cast<Operator>(i);
    return std::nullopt;
}

const char* NameOf(Operator sign)
{
    return signs[static_cast<std::size_t>(sign)];
}

std::optional<Value> Apply(const Value& left, Operator sign, const Value& right)
{
    return std::visit(
        [sign](const auto& a, const auto& b) -> std::optional<Value> {
            switch (sign) {
            case Operator::Add:
                return add(a, b);
            case Operator::Subtract:
                return subtract(a, b);
            case Operator::Multiply:
                return multiply(a, b);
            case Operator::Divide:
                return divide(a, b);
            case Operator::Cross:
                return cross(a, b);
            case Operator::Dot:
                return dot(a, b);
            }
            return std::nullopt;
        },
        left, right);
}

} // namespace ztsh
