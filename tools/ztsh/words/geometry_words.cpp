#include "words/geometry_words.h"

#include <ZT/error.h>

#include <iostream>

namespace ztsh {

namespace {

enum Selector : int { Vec, Mat, Quat, Calc };

constexpr int most_words = 1000;
constexpr int name_position = 1;
constexpr int action_position = 2;
constexpr int expression_position = 3;

const std::vector<Word> words = {
    {"Vec", "[NAME [= EXPRESSION | into VARIABLE | free]]",
     "Makes the vector NAME of 3 or 4 components, puts its numbers into a\n"
     "variable, forgets it, or shows it; lists all vectors without NAME.\n"
     "  Vec p = 1 2 3         of numbers, here a point of three\n"
     "  Vec q = p * m         transformed, and divided by w\n"
     "  + - * / cross         operators; numbers meet every component\n"
     "  direction VECTOR      of length 1\n"
     "  resize VECTOR LENGTH  of that length\n"
     "  point VECTOR, xyz VECTOR\n"
     "                        with w = 1, without w\n"
     "  position MATRIX       its translation\n"
     "  angles MATRIX|QUATERNION|VECTOR\n"
     "                        in degrees, about x, y and z\n"
     "A part has a point: p.x is a number, m.3 the last row of a matrix.",
     0, most_words},
    {"Mat",
     "[NAME [= EXPRESSION | before EXPRESSION | after EXPRESSION | into "
     "VARIABLE | free]]",
     "Makes the matrix NAME, or combines it so that another one acts before "
     "or\n"
     "after it; otherwise as Vec does.\n"
     "  Mat m = a * b         first a, then b; + - / as the library has them\n"
     "  9, 12 or 16 numbers   rows: three of 3, four of 3, four of 4\n"
     "  identity, translate X Y Z, scale FACTOR, scale X Y Z\n"
     "  xrot, yrot, zrot DEGREES, rotate X Y Z DEGREES\n"
     "  euler DEGREES DEGREES DEGREES\n"
     "                        about x, then y, then z\n"
     "  align X Y Z           turns z into that direction\n"
     "  lookat X Y Z X Y Z TWIST\n"
     "                        from an eye to a point\n"
     "  polarview DISTANCE AZIMUTH INCIDENCE TWIST\n"
     "  perspective ANGLE ASPECT NEAR FAR\n"
     "                        the angle in radians: radians DEGREES\n"
     "  window, ortho LEFT RIGHT BOTTOM TOP NEAR FAR\n"
     "  ortho2 LEFT RIGHT BOTTOM TOP\n"
     "  inverse, transpose, adjoint, negate MATRIX\n"
     "  place MATRIX X Y Z    with another translation\n"
     "  mat QUATERNION        its rotation",
     0, most_words},
    {"Quat", "[NAME [= EXPRESSION | into VARIABLE | free]]",
     "Makes the quaternion NAME; otherwise as Vec does.\n"
     "  quat S X Y Z          of its parts\n"
     "  quat MATRIX           of a rotation\n"
     "  Quat q = a * b        first b, then a; + adds part by part\n"
     "  normalize Q, bisect Q Q, double Q Q\n"
     "  slerp Q Q T           from the first, at 0, to the second, at 1\n"
     "  interpolate Q Q Q Q T from the second to the third of four keys",
     0, most_words},
    {"Calc", "EXPRESSION [into VARIABLE]",
     "Writes what an expression gives, or puts its numbers into a variable.\n"
     "Operators and functions are those of Vec, Mat and Quat, and\n"
     "  VECTOR dot VECTOR, length VECTOR, determinant MATRIX\n"
     "  radians DEGREES, degrees RADIANS\n"
     "which give numbers. * / cross and dot go before + and -, ( and ) are\n"
     "words of their own.",
     1, most_words},
};

const char* word_of(int selector)
{
    return words[static_cast<std::size_t>(selector)].name;
}

/// The word behind the name, empty if there is none.
std::string action_of(const KvoStatement& statement)
{
    const char* action = statement.ArgText(action_position);
    return action ? action : "";
}

bool is_of(const Value& value, int selector)
{
    switch (KindOf(value)) {
    case ValueKind::Vector3:
    case ValueKind::Vector4:
        return selector == Vec;
    case ValueKind::Matrix:
        return selector == Mat;
    case ValueKind::Quaternion:
        return selector == Quat;
    case ValueKind::Number:
        break;
    }
    return false;
}

const char* wanted_by(int selector)
{
    return selector == Vec   ? "a vector"
           : selector == Mat ? "a matrix"
                             : "a quaternion";
}

} // namespace

GeometryWords::GeometryWords(Runner& script_runner, Geometry& named_geometry)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      values(named_geometry.values)
{}

void GeometryWords::Do(KvoStatement& statement, int selector)
{
    if (selector == Calc)
        calculate(statement);
    else if (statement.Count() == name_position)
        list(selector);
    else
        act_on(statement, selector);
}

void GeometryWords::act_on(const KvoStatement& statement, int selector)
{
    const std::string name = statement.ArgText(name_position);
    const std::string action = action_of(statement);
    ExpressionReader reader(statement, expression_position, values);
    if (action == "=")
        make(name, reader, selector);
    else if (selector == Mat && (action == "before" || action == "after"))
        combine(name, reader, action == "before");
    else
        look(statement, selector);
}

/// Shows a value, forgets it, or puts it into a variable.
void GeometryWords::look(const KvoStatement& statement, int selector)
{
    const char* name = statement.ArgText(name_position);
    const std::string action = action_of(statement);
    const char* variable = statement.ArgText(expression_position);
    const int count = statement.Count();
    bool stores = action == "into" && count == expression_position + 1;
    bool stands_alone =
        count <= expression_position && (action.empty() || action == "free");
    if (!stores && !stands_alone) {
        Expected(selector);
        return;
    }
    const Value* value = find(name, selector);
    if (!value)
        return;
    if (stores)
        set_variable(word_of(selector), variable, *value);
    else if (action.empty())
        std::cout << StreamText(*value) << "\n";
    else
        values.erase(name);
}

void GeometryWords::make(const std::string& name, ExpressionReader& reader,
                         int selector)
{
    if (!takes_name(name, selector))
        return;
    std::optional<Value> value = reader.Read();
    if (!value || !reader.Ended())
        ZtError("%s: %s\n", word_of(selector), reader.Why().c_str());
    else if (!is_of(*value, selector))
        ZtError("%s: this is %s, not %s\n", word_of(selector),
                NameOf(KindOf(*value)), wanted_by(selector));
    else
        values[name] = *value;
}

/// Puts another matrix before or after the one that is called `name`.
void GeometryWords::combine(const std::string& name, ExpressionReader& reader,
                            bool before)
{
    const Value* found = find(name, Mat);
    if (!found)
        return;
    const KvoMat matrix = std::get<KvoMat>(*found);
    std::optional<Value> other = reader.Read(ValueKind::Matrix);
    if (!other || !reader.Ended()) {
        ZtError("%s: %s\n", word_of(Mat), reader.Why().c_str());
        return;
    }
    const KvoMat& added = std::get<KvoMat>(*other);
    values[name] = before ? added * matrix : matrix * added;
}

void GeometryWords::calculate(const KvoStatement& statement)
{
    ExpressionReader reader(statement, 1, values);
    std::optional<Value> value = reader.Read();
    bool stores = value && reader.Take("into");
    std::string variable = stores ? reader.TakeAny() : "";
    if (!value || !reader.Ended())
        ZtError("%s: %s\n", word_of(Calc), reader.Why().c_str());
    else if (stores)
        set_variable(word_of(Calc), variable, *value);
    else
        std::cout << StreamText(*value) << "\n";
}

void GeometryWords::list(int selector)
{
    for (const auto& [name, value] : values)
        if (is_of(value, selector))
            std::cout << name << (selector == Mat ? ":\n" : ": ")
                      << StreamText(value) << "\n";
}

/// Finds a value for the word of `selector`.
///
/// Reports: an error if there is none, or one of another kind.
const Value* GeometryWords::find(const std::string& name, int selector)
{
    auto found = values.find(name);
    if (found == values.end())
        ZtError("%s: no value is named %s; there %s\n", word_of(selector),
                name.c_str(), ThereAre(values).c_str());
    else if (!is_of(found->second, selector))
        ZtError("%s: %s is %s, not %s\n", word_of(selector), name.c_str(),
                NameOf(KindOf(found->second)), wanted_by(selector));
    else
        return &found->second;
    return nullptr;
}

/// Tells whether a value of the kind of `selector` may have this name.
///
/// Reports: an error if not.
bool GeometryWords::takes_name(const std::string& name, int selector)
{
    if (!Variables::IsName(name)) {
        ZtError("%s: a name is made of letters, digits and _ and does not "
                "begin with a digit, not %s\n",
                word_of(selector), name.c_str());
        return false;
    }
    if (FindFunction(name) || OperatorOf(name)) {
        ZtError("%s: %s is the name of a function\n", word_of(selector),
                name.c_str());
        return false;
    }
    auto found = values.find(name);
    if (found != values.end() && !is_of(found->second, selector)) {
        ZtError("%s: %s is %s; free it first\n", word_of(selector),
                name.c_str(), NameOf(KindOf(found->second)));
        return false;
    }
    return true;
}

/// Reports: an error if that is no name of a variable.
void GeometryWords::set_variable(const char* word, const std::string& name,
                                 const Value& value)
{
    if (Variables::IsName(name))
        runner.variables.Set(name, BareText(value));
    else
        ZtError("%s: expected the name of a variable behind into%s%s\n", word,
                name.empty() ? "" : ", not ", name.c_str());
}

} // namespace ztsh
