// What is not asked through a program of its own: memory that runs out, texts
// that are their own arguments, how long results live.

#include "KVO/KvoPrefs.h"

#include <string>
#include <type_traits>

#include <gtest/gtest.h>

#include "ZT/util.h"
#include "support/FailingMemory.h"
#include "support/FakeProcesses.h"

TEST(KvoPrefsTexts, ASettingMayBeSetToItself)
{
    KvoPrefs::SetProject("shot1");
    KvoPrefs::SetWorkEnv("/show");
    KvoPrefs::SetVariable("SELF", "value");

    KvoPrefs::SetProject(KvoPrefs::Project() + 1);
    KvoPrefs::SetWorkEnv(KvoPrefs::WorkEnv());
    KvoPrefs::SetVariable("SELF", KvoPrefs::Variable("SELF", "") + 2);

    EXPECT_STREQ(KvoPrefs::ProjectDir(), "/show/user_data/hot1");
    EXPECT_STREQ(KvoPrefs::Variable("SELF", ""), "lue");
}

TEST(KvoPrefsTexts, SettingsAreCopies)
{
    std::string text = "shot1";
    KvoPrefs::SetProject(text.c_str());
    KvoPrefs::SetVariable("COPY", text.c_str());
    text = "other";

    EXPECT_STREQ(KvoPrefs::Project(), "shot1");
    EXPECT_STREQ(KvoPrefs::project, "shot1");
    EXPECT_STREQ(KvoPrefs::Variable("COPY", ""), "shot1");
}

TEST(KvoPrefsTexts, DirectoriesLiveThroughNinetyNineFurtherTexts)
{
    KvoPrefs::SetProject("/p");
    for (const char* sub : {"sub", "/sub", static_cast<const char*>(nullptr)}) {
        const char* const directory = KvoPrefs::build_subdir(sub);
        const std::string copy = directory;
        for (int i = 0; i < 99; ++i)
            ZtFmt("%d", i);
        EXPECT_EQ(directory, copy);
    }
}

TEST(KvoPrefsTexts, ADirectoryMayBeMadeOfADirectory)
{
    KvoPrefs::SetProject("/p");
    EXPECT_STREQ(KvoPrefs::build_subdir(KvoPrefs::ProjectDir()), "/p");
}

TEST(KvoPrefsTable, AnEntryIsANamedObjectWithAValueOfItsOwn)
{
    static_assert(std::is_base_of_v<KvoNamedObject, KvoPrefs::TableEntry>);
    FakeProcesses processes;
    KvoPrefs::TableEntry entry("OF_THE_HOST", "dim");

    EXPECT_STREQ(entry.name, "OF_THE_HOST");
    EXPECT_STREQ(entry.Default(), "dim");
    EXPECT_EQ(entry.ValueOrigin(), KvoPrefs::Origin::NotAsked);
    EXPECT_STREQ(entry.Value(), "");
    EXPECT_EQ(entry.ValueOrigin(), KvoPrefs::Origin::Nowhere);
    entry.SetValue("dark");
    EXPECT_STREQ(entry.Value(), "dark");
    EXPECT_EQ(entry.ValueOrigin(), KvoPrefs::Origin::SetHere);
    entry.SetValue(nullptr);
    EXPECT_STREQ(entry.Value(), "");
    EXPECT_EQ(KvoPrefs::Table().Search("OF_THE_HOST"), nullptr);
}

TEST(KvoPrefsTable, AnEntryWithoutDefaultHasTheEmptyOne)
{
    KvoPrefs::TableEntry entry(nullptr, nullptr);

    EXPECT_STREQ(entry.name, "");
    EXPECT_STREQ(entry.Default(), "");
}

TEST(KvoPrefsTable, IsOrderedByNameAndHoldsEachOnce)
{
    KvoPrefs::SetVariable("B", "1");
    KvoPrefs::SetVariable("A", "2");
    KvoPrefs::SetVariable("B", "3");
    KvoPrefs::Variable("A", "4");

    std::string names;
    const KvoSkipList& table = KvoPrefs::Table();
    for (KvoObject* object = table.Head(); object; object = table.Next()) {
        const std::string name = static_cast<char*>(object->Key());
        names += name.size() == 1 ? name : "";
    }

    EXPECT_EQ(names, "AB");
}

TEST(KvoPrefsMemory, WithoutMemorySettingsStayAsTheyAre)
{
    KvoPrefs::SetProject("shot1");
    KvoPrefs::SetWorkEnv("/show");
    KvoPrefs::SetVariable("KEPT", "value");
    {
        FailingMemory none;
        KvoPrefs::SetProject("shot2");
        KvoPrefs::SetProject(nullptr);
        KvoPrefs::SetWorkEnv(nullptr);
        KvoPrefs::SetVariable("KEPT", "other");
        KvoPrefs::SetVariable("NEVER_MADE", "value");
    }

    EXPECT_STREQ(KvoPrefs::ProjectDir(), "/show/user_data/shot1");
    for (const auto setting :
         {KvoPrefs::Setting::Project, KvoPrefs::Setting::WorkEnv})
        EXPECT_EQ(KvoPrefs::OriginOf(setting), KvoPrefs::Origin::SetHere);
    EXPECT_STREQ(KvoPrefs::Variable("KEPT", ""), "value");
    EXPECT_EQ(KvoPrefs::Table().Search("NEVER_MADE"), nullptr);
}

TEST(KvoPrefsMemory, AVariableIsMadeWholeOrNotAtAll)
{
    const std::string name(300, 'n');
    const int before = KvoPrefs::Table().count;
    bool failed = true;
    for (long spared = 0; failed; ++spared) {
        ASSERT_LT(spared, 100);
        {
            FailingMemory none(spared);
            KvoPrefs::SetVariable(name.c_str(), "value");
            failed = FailingMemory::Failed();
        }
        auto* made = KvoPrefs::Table().Search(name.c_str());
        EXPECT_TRUE(failed || made);
        EXPECT_EQ(KvoPrefs::Table().count, made ? before + 1 : before);
        EXPECT_TRUE(!made || static_cast<KvoNamedObject*>(made)->name == name);
    }
    EXPECT_STREQ(KvoPrefs::Variable(name.c_str(), ""), "value");
}

TEST(KvoPrefsMemory, AVariableThatCannotBeLookedUpReadsAsEmpty)
{
    FakeProcesses processes;
    FailingMemory none;

    EXPECT_STREQ(KvoPrefs::Variable("UNHEARD_OF", "x"), "");
    KvoPrefs::TableEntry unheard("UNHEARD_OF", "x");
    EXPECT_STREQ(unheard.Value(), "");
    EXPECT_EQ(unheard.ValueOrigin(), KvoPrefs::Origin::NotAsked);
    EXPECT_NE(KvoPrefs::WireDir(), nullptr);
    EXPECT_NE(KvoPrefs::ProjectDir(), nullptr);
    EXPECT_NE(KvoPrefs::HelpDir(), nullptr);
}
