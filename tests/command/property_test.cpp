#include "ZT/property.h"

#include "support/FailingMemory.h"
#include "support/OtherLocale.h"

#include <climits>
#include <cmath>
#include <limits>
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

namespace {

std::string TextOf(float value)
{
    return ZtProperty("x", value).AsText();
}

} // namespace

TEST(ZtProperty, HoldsCopiesOfNameAndText)
{
    char name[] = "color";
    char text[] = "red";
    ZtProperty property(name, text);

    name[0] = text[0] = 'x';

    EXPECT_STREQ(property.name, "color");
    EXPECT_STREQ(static_cast<char*>(property.Key()), "color");
    EXPECT_STREQ(property.AsText(), "red");
    EXPECT_EQ(property.AsText(), property.AsText());
}

TEST(ZtProperty, NullTextIsTheEmptyText)
{
    ZtProperty made("n", nullptr);
    ZtProperty set("n", "text");

    set.Set(nullptr);

    EXPECT_STREQ(made.AsText(), "");
    EXPECT_STREQ(set.AsText(), "");
    EXPECT_EQ(set.AsInt(), 0);
    EXPECT_STREQ(ZtProperty(nullptr, "x").name, "");
}

TEST(ZtProperty, IntIsWrittenInDecimal)
{
    ZtProperty made("n", 12);
    ZtProperty set("n", "");

    set.Set(INT_MIN);

    EXPECT_STREQ(made.AsText(), "12");
    EXPECT_STREQ(set.AsText(), "-2147483648");
    EXPECT_EQ(set.AsInt(), INT_MIN);
    EXPECT_STREQ(ZtProperty("n", 0).AsText(), "0");
}

TEST(ZtProperty, FloatIsWrittenAsAStreamWritesIt)
{
    const float infinity = std::numeric_limits<float>::infinity();

    for (float value :
         {2.5f, 0.1f, 1e6f, 123456.7f, -1.5e-7f, 0.0f, -0.0f, 100.0f, infinity,
          std::nanf(""), std::numeric_limits<float>::denorm_min()}) {
        std::ostringstream expected;
        expected << value;
        EXPECT_EQ(TextOf(value), expected.str());
    }
    EXPECT_EQ(TextOf(123456.7f), "123457");
    EXPECT_EQ(TextOf(1e6f), "1e+06");
}

TEST(ZtProperty, DoubleIsNarrowedToSinglePrecision)
{
    ZtProperty made("x", 16777217.0), set("x", "");

    set.Set(2.5);

    EXPECT_STREQ(made.AsText(), "1.67772e+07");
    EXPECT_STREQ(set.AsText(), "2.5");
    EXPECT_STREQ(ZtProperty("x", 1e300).AsText(), "inf");
}

TEST(ZtProperty, SetReplacesTheText)
{
    ZtProperty property("n", "old and long");

    property.Set("new");
    const std::string as_text = property.AsText();
    property.Set(3);
    const std::string as_int = property.AsText();
    property.Set(0.1f);

    EXPECT_EQ(as_text, "new");
    EXPECT_EQ(as_int, "3");
    EXPECT_STREQ(property.AsText(), "0.1");
    EXPECT_STREQ(property.name, "n");
    EXPECT_EQ(property.IsModified(), 0);
}

TEST(ZtProperty, SetTakesItsOwnText)
{
    ZtProperty property("n", "one two");

    property.Set(property.AsText() + 4);

    EXPECT_STREQ(property.AsText(), "two");
}

TEST(ZtProperty, ReadsTheTextAsAnyType)
{
    ZtProperty number("n", "12.5"), word("n", "abc"), mixed("n", " -3e2x");

    EXPECT_EQ(number.AsInt(), 12);
    EXPECT_EQ(number.AsFloat(), 12.5f);
    EXPECT_EQ(word.AsInt(), 0);
    EXPECT_EQ(word.AsFloat(), 0.0f);
    EXPECT_EQ(mixed.AsInt(), -3);
    EXPECT_EQ(mixed.AsFloat(), -300.0f);
    EXPECT_EQ(ZtProperty("n", "1e300").AsFloat(),
              std::numeric_limits<float>::infinity());
    EXPECT_EQ(ZtProperty("n", "0.1").AsFloat(), 0.1f);
}

TEST(ZtProperty, CopiesNameAndText)
{
    ZtProperty property("n", "text");
    property.SetModified();

    ZtProperty copy(property);
    property.Set("other");

    EXPECT_STREQ(copy.name, "n");
    EXPECT_STREQ(copy.AsText(), "text");
    EXPECT_EQ(copy.IsModified(), 0);
}

TEST(ZtProperty, AssignmentTakesNameAndText)
{
    ZtProperty property("n", "text"), other("o", "other");

    ZtProperty& result = other = property;
    property.Set("changed");
    const ZtProperty& same = other;
    other = same;

    EXPECT_EQ(&result, &other);
    EXPECT_STREQ(other.name, "n");
    EXPECT_STREQ(other.AsText(), "text");
}

TEST(ZtProperty, IsAPlainNamedObjectToOthers)
{
    ZtProperty property("n", "text");
    std::ostringstream out;

    property.Write(out);
    std::unique_ptr<KvoObject> clone(property.Clone());

    EXPECT_EQ(out.str(), "n");
    EXPECT_STREQ(property.ClassName(), "KvoNamedObject");
    EXPECT_STREQ(static_cast<char*>(clone->Key()), "n");
    EXPECT_EQ(dynamic_cast<ZtProperty*>(clone.get()), nullptr);
}

TEST(ZtPropList, ReadsAValueAsAnyType)
{
    ZtPropList list;

    list.Set("n", 3);
    list.Set("x", 2.5f);
    list.Set("d", -0.5);
    list.Set("t", "12.5");
    list.Set("w", "abc");

    EXPECT_STREQ(list.GetText("n"), "3");
    EXPECT_EQ(list.GetFloat("n"), 3.0f);
    EXPECT_EQ(list.GetInt("x"), 2);
    EXPECT_STREQ(list.GetText("x"), "2.5");
    EXPECT_EQ(list.GetFloat("d"), -0.5f);
    EXPECT_EQ(list.GetInt("t"), 12);
    EXPECT_EQ(list.GetFloat("t"), 12.5f);
    EXPECT_EQ(list.GetInt("w"), 0);
    EXPECT_EQ(list.GetFloat("w"), 0.0f);
}

TEST(ZtPropList, NameThatWasNeverSetReadsAsNothing)
{
    ZtPropList list;
    list.Set("b", 1);

    for (const char* name : {"a", "c", "B", "", "bb"}) {
        EXPECT_EQ(list.GetText(name), nullptr) << name;
        EXPECT_EQ(list.GetInt(name), 0) << name;
        EXPECT_EQ(list.GetFloat(name), 0.0f) << name;
    }
    EXPECT_EQ(list.GetText(nullptr), nullptr);
}

TEST(ZtPropList, SettingANameAgainReplacesItsValue)
{
    ZtPropList list;
    list.Set("m", "first");
    list.Set("a", "other");

    list.Set("m", "second");
    const std::string as_text = list.GetText("m");
    list.Set("m", 7);
    const std::string as_int = list.GetText("m");
    list.Set("m", 0.5f);

    EXPECT_EQ(as_text, "second");
    EXPECT_EQ(as_int, "7");
    EXPECT_STREQ(list.GetText("m"), "0.5");
    EXPECT_STREQ(list.GetText("a"), "other");
}

// An entry takes memory for itself and its name too.
TEST(ZtPropList, SettingANameAgainMakesNoSecondEntry)
{
    ZtPropList list;
    list.Set("m", "first");
    {
        FailingMemory after_one(1);
        list.Set("m", "second");
    }

    EXPECT_FALSE(FailingMemory::Failed());
    EXPECT_STREQ(list.GetText("m"), "second");
}

TEST(ZtPropList, KeepsCopiesOfNameAndText)
{
    char name[] = "name";
    char text[] = "text";
    ZtPropList list;
    list.Set(name, text);

    name[0] = text[0] = 'x';

    EXPECT_STREQ(list.GetText("name"), "text");
}

TEST(ZtPropList, TakesTheTextItGave)
{
    ZtPropList list;
    list.Set("a", "value");

    list.Set("a", list.GetText("a") + 1);
    list.Set("b", list.GetText("a"));
    list.Set("a", list.GetText("none"));

    EXPECT_STREQ(list.GetText("a"), "");
    EXPECT_STREQ(list.GetText("b"), "alue");
}

TEST(ZtPropList, NullNameIsTheEmptyOne)
{
    ZtPropList list;

    list.Set(nullptr, 5);

    EXPECT_EQ(list.GetInt(""), 5);
    EXPECT_STREQ(list.GetText(nullptr), "5");
}

TEST(ZtPropList, FindsEachOfManyNames)
{
    ZtPropList list;
    for (int i = 0; i < 500; ++i)
        list.Set(("name" + std::to_string(i * 7 % 500)).c_str(), i * 7 % 500);

    const ZtPropList& reading = list;

    for (int i = 0; i < 500; ++i)
        EXPECT_EQ(reading.GetInt(("name" + std::to_string(i)).c_str()), i);
    EXPECT_STREQ(list.ClassName(), "KvoObject");
}

TEST(ZtPropList, DoesNotDependOnTheLocale)
{
    OtherLocale german("de_DE");
    ZtPropList list;

    list.Set("x", 2.5f);
    list.Set("n", 1234567);
    list.Set("t", "1.75");

    EXPECT_STREQ(list.GetText("x"), "2.5");
    EXPECT_EQ(list.GetFloat("x"), 2.5f);
    EXPECT_STREQ(list.GetText("n"), "1234567");
    EXPECT_EQ(list.GetFloat("t"), 1.75f);
}

TEST(ZtPropertyWithoutMemory, KeepsItsText)
{
    ZtProperty property("n", "former");
    {
        FailingMemory none;
        property.Set("other");
        property.Set(5);
    }

    EXPECT_TRUE(FailingMemory::Failed());
    EXPECT_STREQ(property.name, "n");
    EXPECT_STREQ(property.AsText(), "former");
}

TEST(ZtPropertyWithoutMemory, NewOneHasTheEmptyText)
{
    FailingMemory none;

    ZtProperty property("n", 5);
    ZtProperty copy(property);

    EXPECT_STREQ(property.AsText(), "");
    EXPECT_EQ(property.AsInt(), 0);
    EXPECT_STREQ(copy.AsText(), "");
}

// Each request for memory fails once, alone and with all after it. A name is
// then either not there or has its value, and no entry has a wrong name.
TEST(ZtPropListWithoutMemory, StaysAsItWas)
{
    bool failed = true;
    int failures = 0;
    for (long spared = 0; failed; ++spared) {
        for (long how_many : {1L, -1L}) {
            ZtPropList list;
            list.Set("old", "one");
            {
                FailingMemory memory(spared, how_many);
                list.Set("old", "two");
                list.Set("new", "value");
            }
            failed = FailingMemory::Failed();
            failures += failed;

            const bool renewed = spared > 0;
            const bool added = !failed || (spared == 0 && how_many == 1);
            EXPECT_STREQ(list.GetText("old"), renewed ? "two" : "one");
            if (added)
                EXPECT_STREQ(list.GetText("new"), "value") << spared;
            else
                EXPECT_EQ(list.GetText("new"), nullptr) << spared;
            EXPECT_EQ(list.GetText(""), nullptr);
        }
    }

    EXPECT_GE(failures, 8);
}
