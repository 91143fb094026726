#include "geometry/expression.h"
#include "support/ErrorTrap.h"

#include <algorithm>
#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

KvoStatement StatementOf(const std::string& text)
{
    KvoStatement statement;
    std::istringstream in(text + "\n");
    statement.Append(in);
    return statement;
}

class Expression : public testing::Test
{
protected:
    Expression()
    {
        values["p"] = KvoVec3(1, 2, 3);
        values["h"] = KvoVec4(1, 2, 3, 4);
        values["m"] = KvoMat().InitTrans(1, 2, 3);
        values["q"] = KvoQuat(1, KvoVec3(2, 3, 4));
    }

    /// The numbers of what an expression gives, or why it gives none.
    std::string Read(const std::string& text)
    {
        ExpressionReader reader(StatementOf(text), 0, values);
        auto read = reader.Read();
        if (!read || !reader.Ended())
            return reader.Why();
        return BareText(*read);
    }

    ValueTable values;
};

} // namespace

TEST_F(Expression, NumbersThatFollowEachOtherAreOneValue)
{
    EXPECT_EQ(Read("5"), "5");
    EXPECT_EQ(Read("1 2 3"), "1 2 3");
    EXPECT_EQ(Read("1 2 3 4"), "1 2 3 4");
    EXPECT_EQ(Read("1 2 3 4 5 6 7 8 9"), "1 2 3 0 4 5 6 0 7 8 9 0 0 0 0 1");
    EXPECT_EQ(Read("1 2 3 4 5 6 7 8 9 10 11 12"),
              "1 2 3 0 4 5 6 0 7 8 9 0 10 11 12 1");
    EXPECT_EQ(Read("1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16"),
              "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16");
    EXPECT_EQ(Read("1 2"), "2 numbers are no value; 1 is a number, 3 or 4 a "
                           "vector, 9, 12 or 16 a matrix");
    EXPECT_EQ(Read("1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 17").substr(0, 10),
              "17 numbers");
}

TEST_F(Expression, AWordWithBlanksIsSeveral)
{
    EXPECT_EQ(Read("\"1 2  3\" + ' p '"), "2 4 6");
    EXPECT_EQ(Read("'' p"), "1 2 3");
}

TEST_F(Expression, ProductsGoBeforeSumsAndBothFromTheLeft)
{
    EXPECT_EQ(Read("1 + 2 * 3"), "7");
    EXPECT_EQ(Read("7 - 4 - 2"), "1");
    EXPECT_EQ(Read("24 / 4 / 2"), "3");
    EXPECT_EQ(Read("2 * 3 - 8 / 4"), "4");
    EXPECT_EQ(Read("p dot p - 4"), "10");
    EXPECT_EQ(Read("p cross p + p"), "1 2 3");
    EXPECT_EQ(Read("( 1 + 2 ) * 3"), "9");
    EXPECT_EQ(Read("2 * ( 7 - ( 4 - 2 ) )"), "10");
}

TEST_F(Expression, ASignBelongsToItsNumber)
{
    EXPECT_EQ(Read("5 - -3"), "8");
    EXPECT_EQ(Read("p -3"), "-3 makes no sense where it stands");
}

TEST_F(Expression, NamesStandForValuesAndPointsForTheirParts)
{
    EXPECT_EQ(Read("p"), "1 2 3");
    EXPECT_EQ(Read("p.x + p.z"), "4");
    EXPECT_EQ(Read("p.1"), "2");
    EXPECT_EQ(Read("h.w"), "4");
    EXPECT_EQ(Read("q.s"), "1");
    EXPECT_EQ(Read("q.z"), "4");
    EXPECT_EQ(Read("m.3"), "1 2 3 1");
    EXPECT_EQ(Read("m.3.y"), "2");
}

TEST_F(Expression, PartsThatDoNotExistAreRefused)
{
    EXPECT_EQ(Read("p.w"), "p, a vector of 3, has no part w");
    EXPECT_EQ(Read("p.xy"), "p, a vector of 3, has no part xy");
    EXPECT_EQ(Read("p."), "p, a vector of 3, has no part ");
    EXPECT_EQ(Read("p.-1"), "p, a vector of 3, has no part -1");
    EXPECT_EQ(Read("p.99999999999"),
              "p, a vector of 3, has no part 99999999999");
    EXPECT_EQ(Read("m.x"), "m, a matrix, has no part x");
    EXPECT_EQ(Read("m.3.s"), "m.3, a vector of 4, has no part s");
    EXPECT_EQ(Read("p.x.x"), "p.x, a number, has no part x");
    EXPECT_EQ(Read("q.w"), "q, a quaternion, has no part w");
    EXPECT_EQ(Read("q.0"), "q, a quaternion, has no part 0");
}

TEST_F(Expression, TheLibraryChecksNumbersOfParts)
{
    ErrorTrap reports;

    Read("p.3");
    Read("h.4");
    Read("m.4");

    EXPECT_EQ(reports.Text(), "Warning: KvoVec3 - Illegal index [3].\n"
                              "Warning: KvoVec4 - Illegal index [4].\n"
                              "Warning: KvoMat - Illegal index [4].\n");
}

TEST_F(Expression, FunctionsTakeNoMoreNumbersThanTheyNeed)
{
    EXPECT_EQ(Read("rotate 0 0 1 0"), Read("identity"));
    EXPECT_EQ(Read("translate 1 2 3"), Read("m"));
    EXPECT_EQ(Read("translate p"), Read("m"));
    EXPECT_EQ(Read("translate p * scale 2"), Read("m * ( scale 2 )"));
    EXPECT_EQ(Read("resize p length p"), "1 2 3");
    EXPECT_EQ(Read("quat 1 2 3 4"), "1 2 3 4");
    EXPECT_EQ(Read("quat h"), "1 2 3 4");
    EXPECT_EQ(Read("translate 1 2 3 4"), "4 makes no sense where it stands");
}

TEST_F(Expression, FunctionsSayWhatTheyTake)
{
    EXPECT_EQ(Read("inverse p"), "inverse takes a matrix, not a vector of 3");
    EXPECT_EQ(Read("translate h"),
              "translate takes a vector of 3, not a vector of 4");
    EXPECT_EQ(Read("xrot p"), "xrot takes a number, not a vector of 3");
    EXPECT_EQ(Read("slerp q m 0.5"), "slerp takes a quaternion, not a matrix");
    EXPECT_EQ(Read("length m"), "length does not take a matrix");
    EXPECT_EQ(Read("translate 1 2"), "a number is missing at the end");
    EXPECT_EQ(Read("translate 1 p 2"),
              "p is no number, and one more is needed");
    EXPECT_EQ(Read("translate"), "something is missing at the end");
}

TEST_F(Expression, WhatMakesNoSenseIsNamed)
{
    EXPECT_EQ(Read("p +"), "something is missing at the end");
    EXPECT_EQ(Read("nosuch"),
              "no value is named nosuch; there are: h, m, p, q");
    EXPECT_EQ(Read("*"), "* is neither a number, a value nor a function");
    EXPECT_EQ(Read("p p"), "p makes no sense where it stands");
    EXPECT_EQ(Read("1x"), "1x is no number of single precision");
    EXPECT_EQ(Read("1e39"), "1e39 is no number of single precision");
    EXPECT_EQ(Read("( p"), "a ) is missing at the end");
    EXPECT_EQ(Read("( p q )"), "a ) is missing before q");
    EXPECT_EQ(Read("p )"), ") makes no sense where it stands");
    EXPECT_EQ(Read("p + m"), "a vector of 3 + a matrix has no meaning");
    EXPECT_EQ(Read("1 / 0"), "a number cannot be divided by 0");
    values.clear();
    EXPECT_EQ(Read("p"), "no value is named p; there are none");
}

TEST_F(Expression, IsNotNestedWithoutEnd)
{
    std::string deep;
    for (int i = 0; i < 99; ++i)
        deep += "( ";
    std::string end = deep;
    std::replace(end.begin(), end.end(), '(', ')');

    EXPECT_EQ(Read(deep + "1 " + end), "1");
    EXPECT_EQ(Read("( ( " + deep + "1 " + end + ") )"),
              "more than 100 operands within each other");
    std::string negations;
    for (int i = 0; i < 10000; ++i)
        negations += "negate ";
    EXPECT_EQ(Read(negations + "1"),
              "more than 100 operands within each other");
}

TEST_F(Expression, StopsWhereNoOperatorFollows)
{
    ExpressionReader reader(StatementOf("Wire p + 1 view m rest"), 1, values);

    EXPECT_EQ(BareText(*reader.Read()), "2 3 4");
    EXPECT_FALSE(reader.Take("by"));
    EXPECT_TRUE(reader.Take("view"));
    EXPECT_TRUE(reader.Read(ValueKind::Matrix));
    EXPECT_FALSE(reader.AtEnd());
    EXPECT_EQ(reader.TakeAny(), "rest");
    EXPECT_TRUE(reader.AtEnd());
    EXPECT_EQ(reader.TakeAny(), "");
    EXPECT_FALSE(reader.Take("view"));
}

TEST_F(Expression, GivesTheKindThatIsNeeded)
{
    ExpressionReader reader(StatementOf("Wire p"), 1, values);
    EXPECT_FALSE(reader.Read(ValueKind::Matrix));
    EXPECT_EQ(reader.Why(), "this is a vector of 3, expected was a matrix");

    ExpressionReader numbers(StatementOf("1 2 3 4 h"), 0, values);
    EXPECT_EQ(BareText(*numbers.ReadVector3()), "1 2 3");
    EXPECT_EQ(numbers.TakeAny(), "4");
    EXPECT_FALSE(numbers.ReadVector3());
    EXPECT_EQ(numbers.Why(),
              "this is a vector of 4, expected was a vector of 3");
}
