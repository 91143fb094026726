#include "words/variables.h"

#include <set>
#include <string>

#include <gtest/gtest.h>

using ztsh::Variables;

namespace {

std::string Expanded(const std::string& text)
{
    Variables variables;
    variables.Set("a", "one");
    variables.Set("a_1", "two");
    variables.Set("dollar", "$a");
    variables.Set("empty", "");
    std::vector<std::string> unknown;
    std::string expanded = variables.Expand(text, unknown);
    for (const std::string& name : unknown)
        expanded += " ?" + name;
    return expanded;
}

} // namespace

TEST(Variables, ExpandsNamesAndNamesInBraces)
{
    EXPECT_EQ(Expanded("$a"), "one");
    EXPECT_EQ(Expanded("${a}"), "one");
    EXPECT_EQ(Expanded("x$a-${a}y$a"), "xone-oneyone");
}

TEST(Variables, TakesTheLongestName)
{
    EXPECT_EQ(Expanded("$a_1"), "two");
    EXPECT_EQ(Expanded("${a}_1"), "one_1");
}

TEST(Variables, DoesNotExpandWhatCameOutOfAVariable)
{
    EXPECT_EQ(Expanded("$dollar"), "$a");
}

TEST(Variables, AnEmptyValueIsAValue)
{
    EXPECT_EQ(Expanded("[$empty]"), "[]");
}

TEST(Variables, ANameThatIsNotSetStaysAndIsTold)
{
    EXPECT_EQ(Expanded("$none/${b}/$a"), "$none/${b}/one ?none ?b");
}

TEST(Variables, ADollarWithoutNameIsACharacter)
{
    EXPECT_EQ(Expanded("$ $1 $$a ${ ${} ${1} ${a"),
              "$ $1 $one ${ ${} ${1} ${a");
    EXPECT_EQ(Expanded("$"), "$");
    EXPECT_EQ(Expanded(""), "");
}

TEST(Variables, RemoveForgets)
{
    Variables variables;
    variables.Set("a", "x");

    variables.Remove("a");

    EXPECT_EQ(variables.Find("a"), nullptr);
}

TEST(Variables, SetAgainReplaces)
{
    Variables variables;
    variables.Set("a", "x");

    variables.Set("a", "longer than before");

    EXPECT_STREQ(variables.Find("a"), "longer than before");
    EXPECT_EQ(variables.Names(), std::set<std::string>{"a"});
}

TEST(Variables, WhatWasForgottenMayBeSetAgain)
{
    Variables variables;
    variables.Set("a", "x");
    variables.Remove("a");
    variables.Remove("a");

    EXPECT_TRUE(variables.Names().empty());
    variables.Set("a", "");
    EXPECT_STREQ(variables.Find("a"), "");
}

TEST(Variables, AreListedInTheOrderOfTheirNames)
{
    Variables variables;
    for (const char* name : {"b", "a_", "a", "B"})
        variables.Set(name, "x");

    std::string all;
    for (const std::string& name : variables.Names())
        all += name + " ";
    EXPECT_EQ(all, "B a a_ b ");
}

TEST(Variables, ACopyIsAStoreOfItsOwn)
{
    Variables variables;
    variables.Set("kept", "1");
    variables.Set("changed", "1");
    variables.Set("removed", "1");

    Variables copy = variables;
    copy.Set("changed", "2");
    copy.Set("added", "2");
    copy.Remove("removed");

    EXPECT_STREQ(variables.Find("changed"), "1");
    EXPECT_STREQ(variables.Find("removed"), "1");
    EXPECT_EQ(variables.Find("added"), nullptr);
    EXPECT_STREQ(copy.Find("kept"), "1");
    EXPECT_STREQ(copy.Find("changed"), "2");
}

TEST(Variables, AssignmentLeavesNothingOfBefore)
{
    Variables variables, others;
    variables.Set("before", "1");
    variables.Set("both", "1");
    others.Set("both", "2");

    variables = others;
    variables = *&variables;

    EXPECT_EQ(variables.Names(), std::set<std::string>{"both"});
    EXPECT_STREQ(variables.Find("both"), "2");
    EXPECT_EQ(variables.Find("before"), nullptr);
}

TEST(Variables, NamesAreLettersDigitsAndUnderscores)
{
    EXPECT_TRUE(Variables::IsName("a"));
    EXPECT_TRUE(Variables::IsName("_9Z"));
    EXPECT_FALSE(Variables::IsName(""));
    EXPECT_FALSE(Variables::IsName("9"));
    EXPECT_FALSE(Variables::IsName("a-b"));
    EXPECT_FALSE(Variables::IsName("\xC3\xA4"));
}
