#include "words/variables.h"

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

TEST(Variables, NamesAreLettersDigitsAndUnderscores)
{
    EXPECT_TRUE(Variables::IsName("a"));
    EXPECT_TRUE(Variables::IsName("_9Z"));
    EXPECT_FALSE(Variables::IsName(""));
    EXPECT_FALSE(Variables::IsName("9"));
    EXPECT_FALSE(Variables::IsName("a-b"));
    EXPECT_FALSE(Variables::IsName("\xC3\xA4"));
}
