#include "geometry/functions.h"

#include <type_traits>

namespace ztsh {

namespace {

using Arguments = std::vector<Value>;
using Result = std::optional<Value>;

constexpr KvoMatMultType after = 1;
constexpr float degrees_per_radian = 57.29578f;

float number(const Arguments& given, std::size_t i)
{
    return std::get<float>(given[i]);
}

const KvoVec3& vector(const Arguments& given, std::size_t i)
{
    return std::get<KvoVec3>(given[i]);
}

const KvoMat& matrix(const Arguments& given, std::size_t i)
{
    return std::get<KvoMat>(given[i]);
}

const KvoQuat& quaternion(const Arguments& given, std::size_t i)
{
    return std::get<KvoQuat>(given[i]);
}

/// Calls `known` with a vector of either length, and knows nothing else.
template <class Known>
Result of_vector(const Value& value, Known known)
{
    if (const KvoVec3* three = std::get_if<KvoVec3>(&value))
        return known(*three);
    if (const KvoVec4* four = std::get_if<KvoVec4>(&value))
        return known(*four);
    return std::nullopt;
}

Result scale(const Arguments& given)
{
    if (const float* same = std::get_if<float>(&given[0]))
        return KvoMat().InitScale(*same);
    if (const KvoVec3* three = std::get_if<KvoVec3>(&given[0]))
        return KvoMat().InitScale(*three);
    return std::nullopt;
}

/// Makes the rotation that `angles` takes apart.
Result euler(const Arguments& given)
{
    const KvoVec3& degrees = vector(given, 0);
    return KvoMat()
        .InitXrot(degrees.x)
        .Yrot(degrees.y, after)
        .Zrot(degrees.z, after);
}

Result angles(const Arguments& given)
{
    if (const KvoMat* m = std::get_if<KvoMat>(&given[0]))
        return m->Rotations();
    if (const KvoQuat* q = std::get_if<KvoQuat>(&given[0]))
        return KvoMat(*q).Rotations();
    if (const KvoVec3* v = std::get_if<KvoVec3>(&given[0]))
        return v->VecToAngles();
    return std::nullopt;
}

Result to_quaternion(const Arguments& given)
{
    if (const KvoMat* m = std::get_if<KvoMat>(&given[0]))
        return KvoQuat(*m);
    if (const KvoVec4* parts = std::get_if<KvoVec4>(&given[0]))
        return KvoQuat(*parts);
    return std::nullopt;
}

Result negate(const Arguments& given)
{
    return std::visit(
        [](const auto& value) -> Result {
            if constexpr (std::is_same_v<decltype(value), const KvoQuat&>)
                return std::nullopt;
            else
                return -value;
        },
        given[0]);
}

Result position(const Arguments& given)
{
    KvoVec3 found;
    matrix(given, 0).ExtractPos(found);
    return found;
}

using G = const Arguments&;

/// The library's names, without its `Init`, where they are words.
const std::vector<Function> functions = {
    {"identity", "", [](G) -> Result { return KvoMat(); }},
    {"translate", "v",
     [](G g) -> Result { return KvoMat().InitTrans(vector(g, 0)); }},
    {"scale", "a", scale},
    {"xrot", "n",
     [](G g) -> Result { return KvoMat().InitXrot(number(g, 0)); }},
    {"yrot", "n",
     [](G g) -> Result { return KvoMat().InitYrot(number(g, 0)); }},
    {"zrot", "n",
     [](G g) -> Result { return KvoMat().InitZrot(number(g, 0)); }},
    {"rotate", "vn",
     [](G g) -> Result {
         return KvoMat().InitRotate(vector(g, 0), number(g, 1));
     }},
    {"euler", "v", euler},
    {"align", "v", [](G g) -> Result { return vector(g, 0).VecToRotmatrix(); }},
    {"perspective", "nnnn",
     [](G g) -> Result {
         return KvoMat().InitPerspective(number(g, 0), number(g, 1),
                                         number(g, 2), number(g, 3));
     }},
    {"window", "nnnnnn",
     [](G g) -> Result {
         return KvoMat().InitWindow(number(g, 0), number(g, 1), number(g, 2),
                                    number(g, 3), number(g, 4), number(g, 5));
     }},
    {"ortho", "nnnnnn",
     [](G g) -> Result {
         return KvoMat().InitOrtho(number(g, 0), number(g, 1), number(g, 2),
                                   number(g, 3), number(g, 4), number(g, 5));
     }},
    {"ortho2", "nnnn",
     [](G g) -> Result {
         return KvoMat().InitOrtho2(number(g, 0), number(g, 1), number(g, 2),
                                    number(g, 3));
     }},
    {"polarview", "nnnn",
     [](G g) -> Result {
         return KvoMat().InitPolarview(number(g, 0), number(g, 1), number(g, 2),
                                       number(g, 3));
     }},
    {"lookat", "vvn",
     [](G g) -> Result {
         return KvoMat().InitLookat(vector(g, 0), vector(g, 1), number(g, 2));
     }},
    {"place", "mv",
     [](G g) -> Result { return KvoMat(matrix(g, 0)).SetPos(vector(g, 1)); }},
    {"inverse", "m", [](G g) -> Result { return matrix(g, 0).Invert(); }},
    {"transpose", "m", [](G g) -> Result { return matrix(g, 0).Transpose(); }},
    {"adjoint", "m", [](G g) -> Result { return matrix(g, 0).Adjoint(); }},
    {"determinant", "m", [](G g) -> Result { return matrix(g, 0).Det(); }},
    {"position", "m", position},
    {"mat", "q", [](G g) -> Result { return KvoMat(quaternion(g, 0)); }},
    {"angles", "a", angles},
    {"quat", "4", to_quaternion},
    {"normalize", "q",
     [](G g) -> Result { return KvoQuat(quaternion(g, 0)).Normalize(); }},
    {"bisect", "qq",
     [](G g) -> Result { return quaternion(g, 0).qbisect(quaternion(g, 1)); }},
    {"double", "qq",
     [](G g) -> Result { return quaternion(g, 0).qdouble(quaternion(g, 1)); }},
    {"slerp", "qqn",
     [](G g) -> Result {
         return Slerp(quaternion(g, 0), quaternion(g, 1), number(g, 2));
     }},
    {"interpolate", "qqqqn",
     [](G g) -> Result {
         return Interp(quaternion(g, 0), quaternion(g, 1), quaternion(g, 2),
                       quaternion(g, 3), number(g, 4));
     }},
    {"length", "a",
     [](G g) -> Result {
         return of_vector(g[0], [](const auto& v) { return v.Mag(); });
     }},
    {"direction", "a",
     [](G g) -> Result {
         return of_vector(g[0], [](const auto& v) { return v.Dir(); });
     }},
    {"resize", "an",
     [](G g) -> Result {
         return of_vector(g[0], [&](auto v) { return v.Scale(number(g, 1)); });
     }},
    {"negate", "a", negate},
    {"point", "v", [](G g) -> Result { return KvoVec4(vector(g, 0)); }},
    {"xyz", "a",
     [](G g) -> Result {
         return of_vector(g[0], [](const auto& v) { return KvoVec3(v); });
     }},
    {"radians", "n",
     [](G g) -> Result { return number(g, 0) / degrees_per_radian; }},
    {"degrees", "n",
     [](G g) -> Result { return number(g, 0) * degrees_per_radian; }},
};

} // namespace

const Function* FindFunction(const std::string& name)
{
    for (const Function& function : functions)
        if (name == function.name)
            return &function;
    return nullptr;
}

const std::vector<Function>& Functions()
{
    return functions;
}

} // namespace ztsh
