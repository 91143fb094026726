#include "geometry/functions.h"
#include "geometry/operators.h"
#include "geometry/value.h"
#include "support/ErrorTrap.h"
#include "support/OtherLocale.h"

#include <ZT/error.h>

#include <limits>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

const Value number = 2.0f;
const Value three = KvoVec3(1, 2, 3);
const Value four = KvoVec4(1, 2, 3, 4);
const Value matrix = KvoMat().InitTrans(1, 2, 3);
const Value quaternion = KvoQuat(1, KvoVec3(2, 3, 4));

/// The kind and the numbers of what an operator gives; "-" for nothing.
std::string Applied(const Value& left, const char* sign, const Value& right)
{
    auto result = Apply(left, *OperatorOf(sign), right);
    return result ? BareText(*result) : "-";
}

std::string Called(const char* name, std::vector<Value> arguments)
{
    const Function* function = FindFunction(name);
    auto result = function->call(arguments);
    return result ? BareText(*result) : "-";
}

} // namespace

TEST(Value, KnowsItsKind)
{
    EXPECT_STREQ(NameOf(KindOf(number)), "a number");
    EXPECT_STREQ(NameOf(KindOf(three)), "a vector of 3");
    EXPECT_STREQ(NameOf(KindOf(four)), "a vector of 4");
    EXPECT_STREQ(NameOf(KindOf(matrix)), "a matrix");
    EXPECT_STREQ(NameOf(KindOf(quaternion)), "a quaternion");
}

TEST(Value, IsWrittenAsTheLibraryWritesIt)
{
    EXPECT_EQ(StreamText(0.1f), "0.1");
    EXPECT_EQ(StreamText(KvoVec3(0.1f, 2, 3)), "[ 0.1000000015, 2, 3 ]");
    EXPECT_EQ(StreamText(four), "[ 1, 2, 3, 4 ]");
    EXPECT_EQ(StreamText(quaternion), "[ 1, [ 2, 3, 4 ] ]");
    EXPECT_EQ(StreamText(matrix), "[ 1, 0, 0, 0 ]\n[ 0, 1, 0, 0 ]\n"
                                  "[ 0, 0, 1, 0 ]\n[ 1, 2, 3, 1 ]");
}

TEST(Value, BareNumbersAreTheShortestThatReadBack)
{
    EXPECT_EQ(BareText(1.0f / 3), "0.33333334");
    EXPECT_EQ(BareText(KvoVec3(0.1f, -2, 1e20f)), "0.1 -2 1e+20");
    EXPECT_EQ(BareText(four), "1 2 3 4");
    EXPECT_EQ(BareText(matrix), "1 0 0 0 0 1 0 0 0 0 1 0 1 2 3 1");
    EXPECT_EQ(BareText(quaternion), "1 2 3 4");
}

TEST(Value, TextsDoNotDependOnTheLocale)
{
    OtherLocale german("de_DE");
    float read = 0;

    EXPECT_EQ(StreamText(KvoVec3(1234.5f, 0, 0)), "[ 1234.5, 0, 0 ]");
    EXPECT_EQ(BareText(1234.5f), "1234.5");
    EXPECT_TRUE(ReadFloat("1234.5", read));
    EXPECT_EQ(read, 1234.5f);
    EXPECT_FALSE(ReadFloat("1,5", read));
}

TEST(ReadFloat, ReadsWholeWordsOnly)
{
    float read = 7;

    EXPECT_TRUE(ReadFloat("-2.5e-1", read));
    EXPECT_EQ(read, -0.25f);
    EXPECT_TRUE(ReadFloat(".5", read));
    EXPECT_EQ(read, 0.5f);
    EXPECT_TRUE(ReadFloat("0010", read));
    EXPECT_EQ(read, 10.0f);
    for (const char* wrong : {"", "-", ".", "1x", "x1", "1 2", "nan", "inf",
                              "-inf", "0x10", "+5", "--5", "1e"})
        EXPECT_FALSE(ReadFloat(wrong, read)) << wrong;
    EXPECT_EQ(read, 10.0f);
}

TEST(ReadFloat, WhatIsTooLargeIsRefusedAndWhatIsTooSmallIsZero)
{
    float read = 7;

    EXPECT_FALSE(ReadFloat("1e39", read));
    EXPECT_FALSE(ReadFloat("-1e999", read));
    EXPECT_EQ(read, 7.0f);
    EXPECT_TRUE(ReadFloat("3.4028234e38", read));
    EXPECT_EQ(read, std::numeric_limits<float>::max());
    EXPECT_TRUE(ReadFloat("1e-60", read));
    EXPECT_EQ(read, 0.0f);
    EXPECT_TRUE(ReadFloat("1e-999", read));
    EXPECT_EQ(read, 0.0f);
}

TEST(LooksLikeNumber, TellsNumbersFromOperatorsAndNames)
{
    for (const char* word : {"1", "-1", ".5", "-.5", "1x", "+5"})
        EXPECT_TRUE(LooksLikeNumber(word)) << word;
    for (const char* word : {"", "-", "+", ".", "-.", "a1", "--1", "("})
        EXPECT_FALSE(LooksLikeNumber(word)) << word;
}

TEST(Operators, AreThoseOfTheLibrary)
{
    EXPECT_EQ(Applied(number, "+", number), "4");
    EXPECT_EQ(Applied(three, "-", number), "-1 0 1");
    EXPECT_EQ(Applied(number, "-", three), "1 0 -1");
    EXPECT_EQ(Applied(three, "*", three), "1 4 9");
    EXPECT_EQ(Applied(four, "/", number), "0.5 1 1.5 2");
    EXPECT_EQ(Applied(three, "cross", KvoVec3(0, 0, 1)), "2 -1 0");
    EXPECT_EQ(Applied(four, "cross", KvoVec4(0, 0, 1, 9)), "2 -1 0 0");
    EXPECT_EQ(Applied(three, "dot", three), "14");
    EXPECT_EQ(Applied(four, "dot", four), "30");
    EXPECT_EQ(Applied(quaternion, "+", quaternion), "2 4 6 8");
    EXPECT_EQ(Applied(quaternion, "*", KvoQuat(0, KvoVec3(1, 0, 0))),
              "-2 1 4 -3");
    EXPECT_EQ(Applied(matrix, "+", number), "3 2 2 2 2 3 2 2 2 2 3 2 3 4 5 3");
    EXPECT_EQ(Applied(number, "*", matrix), "2 0 0 0 0 2 0 0 0 0 2 0 2 4 6 2");
}

TEST(Operators, TheMatrixOnTheLeftActsFirst)
{
    Value twice = KvoMat().InitScale(2);

    EXPECT_EQ(Applied(matrix, "*", twice), "2 0 0 0 0 2 0 0 0 0 2 0 2 4 6 1");
    EXPECT_EQ(Applied(twice, "*", matrix), "2 0 0 0 0 2 0 0 0 0 2 0 1 2 3 1");
}

TEST(Operators, PointsAreRowsOnTheLeftAndColumnsOnTheRight)
{
    EXPECT_EQ(Applied(three, "*", matrix), "2 4 6");
    EXPECT_EQ(Applied(KvoVec4(1, 1, 1, 0), "*", matrix), "1 1 1 0");
    EXPECT_EQ(Applied(matrix, "*", KvoVec4(1, 1, 1, 1)),
              "0.14285715 0.14285715 0.14285715 1");
    EXPECT_EQ(Applied(matrix, "*", KvoVec3(1, 1, 1)),
              "0.14285715 0.14285715 0.14285715");
}

TEST(Operators, DoNotConvertWhatNobodyAskedToConvert)
{
    EXPECT_EQ(Applied(three, "+", four), "-");
    EXPECT_EQ(Applied(three, "*", four), "-");
    EXPECT_EQ(Applied(three, "dot", four), "-");
    EXPECT_EQ(Applied(three, "cross", four), "-");
    EXPECT_EQ(Applied(quaternion, "*", matrix), "-");
    EXPECT_EQ(Applied(matrix, "*", quaternion), "-");
    EXPECT_EQ(Applied(quaternion, "*", four), "-");
    EXPECT_EQ(Applied(quaternion, "*", number), "-");
    EXPECT_EQ(Applied(number, "+", quaternion), "-");
    EXPECT_EQ(Applied(quaternion, "-", quaternion), "-");
    EXPECT_EQ(Applied(quaternion, "/", quaternion), "-");
    EXPECT_EQ(Applied(quaternion, "dot", quaternion), "-");
    EXPECT_EQ(Applied(three, "+", matrix), "-");
    EXPECT_EQ(Applied(three, "/", matrix), "-");
    EXPECT_EQ(Applied(matrix, "dot", matrix), "-");
    EXPECT_EQ(Applied(number, "cross", number), "-");
}

TEST(Operators, ReportWhatTheLibraryReports)
{
    ErrorTrap reports;

    EXPECT_EQ(Applied(three, "/", KvoVec3(1, 0, 1)), "0 0 0");
    EXPECT_EQ(Applied(matrix, "/", 0.0f), "0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0");

    EXPECT_EQ(reports.Text(), "Warning: KvoVec3 - Division by zero.\n"
                              "Warning: KvoMat - Division by zero.\n");
}

TEST(Functions, BuildWhatTheLibraryBuilds)
{
    auto expect = [](const char* name, std::vector<Value> arguments,
                     const Value& want) {
        EXPECT_EQ(Called(name, std::move(arguments)), BareText(want)) << name;
    };
    const KvoVec3 v(1, 2, 3);
    const KvoVec3 w(4, -5, 7);
    expect("identity", {}, KvoMat());
    expect("translate", {v}, KvoMat().InitTrans(v));
    expect("scale", {2.0f}, KvoMat().InitScale(2));
    expect("scale", {v}, KvoMat().InitScale(v));
    expect("xrot", {10.0f}, KvoMat().InitXrot(10));
    expect("yrot", {10.0f}, KvoMat().InitYrot(10));
    expect("zrot", {10.0f}, KvoMat().InitZrot(10));
    expect("rotate", {v, 10.0f}, KvoMat().InitRotate(v, 10));
    expect("align", {v}, v.VecToRotmatrix());
    expect("perspective", {1.0f, 1.5f, 2.0f, 9.0f},
           KvoMat().InitPerspective(1, 1.5f, 2, 9));
    expect("window", {-1.0f, 2.0f, -3.0f, 4.0f, 5.0f, 9.0f},
           KvoMat().InitWindow(-1, 2, -3, 4, 5, 9));
    expect("ortho", {-1.0f, 2.0f, -3.0f, 4.0f, 5.0f, 9.0f},
           KvoMat().InitOrtho(-1, 2, -3, 4, 5, 9));
    expect("ortho2", {-1.0f, 2.0f, -3.0f, 4.0f},
           KvoMat().InitOrtho2(-1, 2, -3, 4));
    expect("polarview", {5.0f, 10.0f, 20.0f, 30.0f},
           KvoMat().InitPolarview(5, 10, 20, 30));
    expect("lookat", {v, w, 15.0f}, KvoMat().InitLookat(v, w, 15));
    expect("place", {KvoMat().InitScale(2), v},
           KvoMat().InitScale(2).SetPos(v));
}

TEST(Functions, AskWhatTheLibraryAnswers)
{
    const KvoMat m =
        KvoMat().InitRotate(KvoVec3(1, 2, 3), 40).Trans(4, 5, 6, 1);
    auto expect = [](const char* name, const Value& argument,
                     const Value& want) {
        EXPECT_EQ(Called(name, {argument}), BareText(want)) << name;
    };
    expect("inverse", m, m.Invert());
    expect("transpose", m, m.Transpose());
    expect("adjoint", m, m.Adjoint());
    expect("determinant", m, m.Det());
    expect("position", m, KvoVec3(4, 5, 6));
    expect("negate", m, -m);
    expect("angles", m, m.Rotations());
    expect("quat", m, KvoQuat(m));
    expect("mat", KvoQuat(m), KvoMat(KvoQuat(m)));
    expect("angles", KvoQuat(m), KvoMat(KvoQuat(m)).Rotations());
    // Not known to the compiler, whose own arc tangent may round differently.
    volatile float two = 2;
    const KvoVec3 v(1, two, 3);
    expect("angles", v, v.VecToAngles());
    expect("length", KvoVec3(3, 0, 4), 5.0f);
    expect("length", KvoVec4(1, 1, 1, 1), 2.0f);
    expect("direction", KvoVec3(0, 0, 4), KvoVec3(0, 0, 1));
    expect("direction", KvoVec4(0, 0, 4, 0), KvoVec4(0, 0, 1, 0));
    expect("negate", KvoVec3(1, 2, 3), KvoVec3(-1, -2, -3));
    expect("negate", 5.0f, -5.0f);
    expect("point", KvoVec3(1, 2, 3), KvoVec4(1, 2, 3, 1));
    expect("xyz", KvoVec4(1, 2, 3, 4), KvoVec3(1, 2, 3));
    expect("quat", KvoVec4(1, 2, 3, 4), KvoQuat(1, KvoVec3(2, 3, 4)));
    expect("normalize", KvoQuat(2, KvoVec3(0, 0, 0)), KvoQuat(1, KvoVec3()));
    EXPECT_EQ(Called("resize", {KvoVec3(0, 2, 0), 5.0f}), "0 5 0");
    EXPECT_NEAR(std::get<float>(*FindFunction("radians")->call({180.0f})),
                3.14159265f, 1e-6f);
    EXPECT_NEAR(std::get<float>(*FindFunction("degrees")->call({3.14159265f})),
                180, 1e-4f);
}

TEST(Functions, GoBetweenQuaternionsAsTheLibraryDoes)
{
    const KvoQuat a(1, KvoVec3(0, 0, 0));
    const KvoQuat b(0.8f, KvoVec3(0.6f, 0, 0));
    const KvoQuat c(0, KvoVec3(1, 0, 0));
    const KvoQuat d(0, KvoVec3(0, 1, 0));

    EXPECT_EQ(Called("slerp", {a, b, 0.3f}), BareText(Slerp(a, b, 0.3f)));
    EXPECT_EQ(Called("interpolate", {a, b, c, d, 0.3f}),
              BareText(Interp(a, b, c, d, 0.3f)));
    EXPECT_EQ(Called("bisect", {a, c}), BareText(a.qbisect(c)));
    EXPECT_EQ(Called("double", {a, b}), BareText(a.qdouble(b)));
}

TEST(Functions, EulerPutsTogetherWhatAnglesTakesApart)
{
    Value turned = *FindFunction("euler")->call({KvoVec3(10, 20, 30)});
    Value apart = *FindFunction("angles")->call({turned});

    const KvoVec3 angles = std::get<KvoVec3>(apart);
    EXPECT_NEAR(angles.x, 10, 1e-4);
    EXPECT_NEAR(angles.y, 20, 1e-4);
    EXPECT_NEAR(angles.z, 30, 1e-4);
}

TEST(Functions, SayWhichKindsTheyDoNotKnow)
{
    EXPECT_EQ(Called("scale", {four}), "-");
    EXPECT_EQ(Called("angles", {number}), "-");
    EXPECT_EQ(Called("quat", {three}), "-");
    EXPECT_EQ(Called("negate", {quaternion}), "-");
    EXPECT_EQ(Called("length", {quaternion}), "-");
    EXPECT_EQ(Called("direction", {matrix}), "-");
    EXPECT_EQ(Called("resize", {number, number}), "-");
    EXPECT_EQ(Called("xyz", {number}), "-");
}

TEST(Functions, AreFoundByNameOnly)
{
    EXPECT_EQ(FindFunction("nosuch"), nullptr);
    EXPECT_EQ(FindFunction("Inverse"), nullptr);
    for (const Function& function : Functions())
        EXPECT_EQ(FindFunction(function.name), &function) << function.name;
}
