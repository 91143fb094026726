#ifndef ZT_TESTS_GEOMETRY_SAMPLES_H
#define ZT_TESTS_GEOMETRY_SAMPLES_H

/// \file
/// Random values for the tests of the geometry room, always the same ones, and
/// the comparison of two values bit for bit.

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <type_traits>

#include "KVO/KvoVec.h"

class Samples
{
public:
    /// Gives a number from -range to range.
    float Number(float range = 2)
    {
        return std::uniform_real_distribution<float>(-range, range)(random);
    }

    /// Gives any number there is, often a whole one, zero, infinity or NaN.
    float AnyNumber()
    {
        constexpr float limit = std::numeric_limits<float>::infinity();
        constexpr float special[] = {
            0.0f, -0.0f, 1.0f,   -1.0f,
            2.0f, limit, -limit, std::numeric_limits<float>::quiet_NaN()};
        const std::uint32_t pick = static_cast<std::uint32_t>(random());
        if (pick % 4 == 0)
            return special[pick / 4 % 8];
        if (pick % 4 == 1)
            return static_cast<float>(static_cast<int>(pick / 4 % 7) - 3);
        if (pick % 4 == 2)
            return Number();
        const std::uint32_t bits = static_cast<std::uint32_t>(random());
        float number;
        std::memcpy(&number, &bits, sizeof number);
        return number;
    }

    KvoVec3 Vec3(float range = 2)
    {
        const float x = Number(range), y = Number(range), z = Number(range);
        return KvoVec3(x, y, z);
    }

    KvoVec4 Vec4(float range = 2)
    {
        const float x = Number(range), y = Number(range), z = Number(range);
        return KvoVec4(x, y, z, Number(range));
    }

    KvoVec4 AnyVec4()
    {
        const float x = AnyNumber(), y = AnyNumber(), z = AnyNumber();
        return KvoVec4(x, y, z, AnyNumber());
    }

    KvoMat Mat(float range = 2)
    {
        KvoMat m;
        for (KvoVec4& row : m.rows)
            row = Vec4(range);
        return m;
    }

    KvoMat AnyMat()
    {
        KvoMat m;
        for (KvoVec4& row : m.rows)
            row = AnyVec4();
        return m;
    }

    /// Gives a quaternion of length 1.
    KvoQuat Rotation()
    {
        const float s = Number();
        return KvoQuat(s, Vec3()).Normalize();
    }

private:
    std::mt19937 random{20011};
};

/// Says whether two values of floats have the same bits, -0 and 0 told apart;
/// one NaN is as good as another.
template <class Value>
bool SameBits(const Value& a, const Value& b)
{
    static_assert(std::is_trivially_copyable_v<Value>);
    constexpr std::size_t count = sizeof(Value) / sizeof(float);
    float left[count];
    float right[count];
    std::memcpy(left, &a, sizeof a);
    std::memcpy(right, &b, sizeof b);
    for (std::size_t i = 0; i < count; ++i)
        if (std::memcmp(&left[i], &right[i], sizeof(float)) != 0 &&
            !(std::isnan(left[i]) && std::isnan(right[i])))
            return false;
    return true;
}

#endif
