#include "ZT/plug.h"

#include <cstddef>
#include <cstring>
#include <limits>
#include <map>
#include <random>

#include <gtest/gtest.h>

#include "ZT/util.h"
#include "env/plugin_tests.h"
#include "support/SlotOf.h"

namespace {

struct Id
{
    std::string name;
    int first;
    int second;
    bool operator==(const Id& other) const
    {
        return name == other.name && first == other.first &&
               second == other.second;
    }
};

Id Parsed(const char* id)
{
    Id parsed = {"", -1, -1};
    parsed.name = TestCatalog::parse_id(id, parsed.first, parsed.second);
    return parsed;
}

bool Matches(const char* catalog_id, const char* plug_id)
{
    return TestCatalog(catalog_id).plug_id_matches(plug_id) != 0;
}

bool MatchesOlder(const char* catalog_id, const char* plug_id)
{
    TestCatalog catalog(catalog_id);
    catalog.exact_version = 0;
    return catalog.plug_id_matches(plug_id) != 0;
}

constexpr int most = std::numeric_limits<int>::max();

} // namespace

TEST(ZtPlugCatalog, ItsOwnOperationsFollowThoseOfAnObject)
{
    const std::ptrdiff_t last = SlotOf(&KvoObject::ClassInfo);

    EXPECT_EQ(SlotOf(&ZtPlugCatalog::InitializePlug), last + 1);
    EXPECT_EQ(SlotOf(&ZtPlugCatalog::Extension), last + 2);
}

// --- ids -------------------------------------------------------------------

TEST(ZtPlugCatalog, TakesAnIdApart)
{
    EXPECT_EQ(Parsed("Recognizer:2.1"), (Id{"Recognizer", 2, 1}));
    EXPECT_EQ(Parsed("Recognizer:12"), (Id{"Recognizer", 12, 0}));
    EXPECT_EQ(Parsed("Recognizer"), (Id{"Recognizer", 0, 0}));
    EXPECT_EQ(Parsed("A.B:3.4"), (Id{"A.B", 3, 4}));
    EXPECT_EQ(Parsed("A.5"), (Id{"A.5", 0, 0}));
    EXPECT_EQ(Parsed("A:1.2.3"), (Id{"A", 1, 2}));
    EXPECT_EQ(Parsed("A:1:2.3"), (Id{"A", 1, 3}));
    EXPECT_EQ(Parsed("A:.5"), (Id{"A", 0, 5}));
    EXPECT_EQ(Parsed(":1.2"), (Id{"", 1, 2}));
    EXPECT_EQ(Parsed(""), (Id{"", 0, 0}));
    EXPECT_EQ(Parsed(nullptr), (Id{"", 0, 0}));
}

TEST(ZtPlugCatalog, NumbersOfAnIdAreReadAsFarAsTheyGo)
{
    EXPECT_EQ(Parsed("A: 7x.-2"), (Id{"A", 7, -2}));
    EXPECT_EQ(Parsed("A:x.y"), (Id{"A", 0, 0}));
    EXPECT_EQ(Parsed("A:99999999999.2147483648"), (Id{"A", most, most}));
}

TEST(ZtPlugCatalog, TheNameOfAnIdIsATemporaryString)
{
    int first = 0;
    int second = 0;

    const char* name = TestCatalog::parse_id("Kept:1.2", first, second);
    for (int made = 0; made < 99; ++made)
        ZtNewTempString("");

    EXPECT_STREQ(name, "Kept");
}

TEST(ZtPlugCatalog, IdsMatchWhenNameAndBothNumbersAreEqual)
{
    EXPECT_TRUE(Matches("Recognizer:2.1", "Recognizer:2.1"));
    EXPECT_TRUE(Matches("Recognizer:2.1", "Recognizer:02.01"));
    EXPECT_TRUE(Matches("Recognizer:2.0", "Recognizer:2"));
    EXPECT_FALSE(Matches("Recognizer:2.1", "Recognizer:2.0"));
    EXPECT_FALSE(Matches("Recognizer:2.1", "Recognizer:3.1"));
    EXPECT_FALSE(Matches("Recognizer:2.1", "Recognizer:1.1"));
    EXPECT_FALSE(Matches("Recognizer:2.1", "recognizer:2.1"));
    EXPECT_FALSE(Matches("Recognizer:2.1", "Recognize:2.1"));
    EXPECT_FALSE(Matches("Recognizer:2.1", ""));
    EXPECT_FALSE(Matches("Recognizer:2.1", nullptr));
    EXPECT_TRUE(Matches("", ""));
    EXPECT_FALSE(Matches("", nullptr));
}

TEST(ZtPlugCatalog, WithoutTheExactVersionAnOlderFirstNumberMatchesToo)
{
    EXPECT_EQ(TestCatalog().exact_version, 1);
    EXPECT_TRUE(MatchesOlder("Recognizer:2.1", "Recognizer:2.1"));
    EXPECT_TRUE(MatchesOlder("Recognizer:2.1", "Recognizer:1.1"));
    EXPECT_FALSE(MatchesOlder("Recognizer:2.1", "Recognizer:3.1"));
    EXPECT_FALSE(MatchesOlder("Recognizer:2.1", "Recognizer:1.0"));
    EXPECT_FALSE(MatchesOlder("Recognizer:2.1", "recognizer:1.1"));
}

TEST(ZtPlugCatalog, KeepsACopyOfItsId)
{
    char id[] = "Test:2.1";
    TestCatalog catalog(id);
    id[0] = 'X';

    EXPECT_TRUE(catalog.plug_id_matches("Test:2.1"));
    EXPECT_TRUE(Matches(nullptr, ""));
}

// --- plugs -----------------------------------------------------------------

TEST(ZtPlugCatalog, AddsAPlugThatOwnsItsObject)
{
    TakeTold();
    {
        TestCatalog catalog;
        auto* object = new ToldObject("object deleted");

        ZtPlugCatalog::Plug* plug = catalog.AddPlug("edge", object);

        ASSERT_NE(plug, nullptr);
        EXPECT_STREQ(plug->name, "edge");
        EXPECT_EQ(plug->object, object);
        EXPECT_EQ(plug->path, nullptr);
        EXPECT_EQ(catalog.FindPlug("edge"), plug);
        EXPECT_EQ(catalog.FindPlugPath("edge"), nullptr);
        EXPECT_EQ(catalog.initialized, (Names{"edge"}));
        EXPECT_EQ(TakeTold(), Names{});
    }
    EXPECT_EQ(TakeTold(), (Names{"object deleted"}));
}

TEST(ZtPlugCatalog, ATakenNameGivesThePlugAndLeavesTheObjectAlone)
{
    TakeTold();
    TestCatalog catalog;
    ZtPlugCatalog::Plug* first = catalog.AddPlug("edge", nullptr);
    ToldObject object("never deleted by the catalog");

    ZtPlugCatalog::Plug* second = catalog.AddPlug("edge", &object);

    EXPECT_EQ(second, first);
    EXPECT_EQ(first->object, nullptr);
    EXPECT_EQ(catalog.initialized, (Names{"edge"}));
    EXPECT_EQ(TakeTold(), Names{});
}

TEST(ZtPlugCatalog, AnOfferThatIsRefusedIsDeleted)
{
    TakeTold();
    TestCatalog catalog;
    ZtPlugCatalog::Plug* first =
        catalog.OfferPlug("edge", new ToldObject("first deleted"));

    ZtPlugCatalog::Plug* second =
        catalog.OfferPlug("edge", new ToldObject("second deleted"));
    catalog.OfferPlug("edge", nullptr);

    EXPECT_EQ(second, first);
    EXPECT_EQ(TakeTold(), (Names{"second deleted"}));
    EXPECT_EQ(catalog.OfferPlug("edge", first->object), first);
    EXPECT_EQ(TakeTold(), Names{});
}

TEST(ZtPlugCatalog, APlugIsFromTheDirectoryThatWasScannedLast)
{
    PluginDir empty;
    TestCatalog catalog;
    catalog.AddPlug("before", nullptr);
    catalog.ScanOneDir(empty.Dir().c_str());
    catalog.AddPlug("after", nullptr);
    catalog.ScanOneDir("/nowhere");
    catalog.AddPlug("failed", nullptr);

    EXPECT_EQ(catalog.FindPlugPath("before"), nullptr);
    EXPECT_EQ(catalog.FindPlugPath("after"), empty.Dir());
    EXPECT_STREQ(catalog.FindPlugPath("failed"), "/nowhere");
    EXPECT_EQ(catalog.FindPlugPath("unknown"), nullptr);
}

TEST(ZtPlugCatalog, APlugKeepsItsPathWhenAnotherDirectoryIsScanned)
{
    TestCatalog catalog;
    catalog.ScanOneDir("/nowhere");
    const char* path = catalog.AddPlug("plug", nullptr)->path;

    catalog.ScanOneDir("/elsewhere");

    EXPECT_STREQ(path, "/nowhere");
}

TEST(ZtPlugCatalog, FindsPlugsByTheExactName)
{
    TestCatalog catalog;
    ZtPlugCatalog::Plug* edge = catalog.AddPlug("edge", nullptr);
    ZtPlugCatalog::Plug* nameless = catalog.AddPlug(nullptr, nullptr);

    EXPECT_EQ(catalog.FindPlug("edge"), edge);
    EXPECT_EQ(catalog.FindPlug("Edge"), nullptr);
    EXPECT_EQ(catalog.FindPlug("edg"), nullptr);
    EXPECT_EQ(catalog.FindPlug(""), nameless);
    EXPECT_EQ(catalog.FindPlug(nullptr), nameless);
}

TEST(ZtPlugCatalog, WalksTheNamesInTheirOrder)
{
    TestCatalog catalog;
    EXPECT_EQ(catalog.HeadKey(), nullptr);
    EXPECT_EQ(catalog.NextKey(), nullptr);
    for (const char* name : {"b", "a", "C", "", "ab"})
        catalog.AddPlug(name, nullptr);

    EXPECT_EQ(catalog.Names(), (Names{"", "C", "a", "ab", "b"}));
    EXPECT_EQ(catalog.NextKey(), nullptr);
}

TEST(ZtPlugCatalog, AWalkGoesOnFromThePlugThatWasFound)
{
    TestCatalog catalog;
    for (const char* name : {"a", "b", "c"})
        catalog.AddPlug(name, nullptr);

    catalog.FindPlug("b");

    EXPECT_STREQ(catalog.NextKey(), "c");
}

TEST(ZtPlugCatalog, AgreesWithAMapOverThousandsOfPlugs)
{
    TestCatalog catalog;
    std::map<std::string, ZtPlugCatalog::Plug*> model;
    std::mt19937 random(7);
    for (int step = 0; step < 5000; ++step) {
        const std::string name = std::to_string(random() % 1500);
        ZtPlugCatalog::Plug* found = catalog.FindPlug(name.c_str());
        ASSERT_EQ(found, model.count(name) ? model[name] : nullptr);
        ZtPlugCatalog::Plug* plug = catalog.AddPlug(name.c_str(), nullptr);
        ASSERT_EQ(model.emplace(name, plug).first->second, plug);
    }

    Names names;
    for (const auto& [name, plug] : model)
        names.push_back(name);
    EXPECT_EQ(catalog.Names(), names);
}

TEST(ZtPlugCatalog, AnObjectMayAskTheCatalogWhileItIsDeleted)
{
    struct Asking : KvoObject
    {
        explicit Asking(ZtPlugCatalog& home) : catalog(home) {}
        ~Asking() override
        {
            TellTheTest(catalog.FindPlug("b") ? "b is there" : "b has gone");
            TellTheTest(catalog.FindPlug("c") ? "c is there" : "c has gone");
        }
        ZtPlugCatalog& catalog;
    };
    TakeTold();
    {
        TestCatalog catalog;
        catalog.AddPlug("a", nullptr);
        catalog.AddPlug("b", new Asking(catalog));
        catalog.AddPlug("c", nullptr);
    }
    EXPECT_EQ(TakeTold(), (Names{"b has gone", "c is there"}));
}

TEST(ZtPlugCatalog, TheBaseClassDoesNothingAboutAPlug)
{
    ZtPlugCatalog catalog("Test:2.1");
    ZtPlugCatalog::Plug plug("edge", nullptr);

    catalog.InitializePlug(&plug);
    catalog.InitializePlug(nullptr);

    EXPECT_STREQ(plug.name, "edge");
    EXPECT_STREQ(catalog.Extension(), ".so");
}

// --- help files ------------------------------------------------------------

class PlugHelp : public testing::Test
{
protected:
    PlugHelp() : help("QUARN_PLUGIN_HELP", nullptr)
    {
        std::filesystem::create_directory(dir.Path("Help"));
        catalog.ScanOneDir(dir.Dir().c_str());
        catalog.AddPlug("edge", nullptr);
    }

    std::string Found(const char* extension, const char* name = "edge")
    {
        const char* path = catalog.FindPlugHelpFilename(name, extension);
        if (!path)
            return "none";
        return std::filesystem::path(path).lexically_relative(dir.Dir());
    }

    PluginDir dir;
    TestCatalog catalog;
    SetVariable help;
};

TEST_F(PlugHelp, IsLookedForInTheHelpDirectoryThenBesideThePlug)
{
    EXPECT_EQ(Found("html"), "none");
    dir.Write("edge.t.html", "");
    EXPECT_EQ(Found("html"), "edge.t.html");
    dir.Write("Help/edge.t.html", "");
    EXPECT_EQ(Found("html"), "Help/edge.t.html");
}

TEST_F(PlugHelp, OfAnUnknownPlugIsNone)
{
    dir.Write("wedge.t.html", "");

    EXPECT_EQ(Found("html", "wedge"), "none");
}

TEST_F(PlugHelp, HasTheKindsExtensionAloneWithoutAnother)
{
    dir.Write("Help/edge.t", "");

    EXPECT_EQ(Found(nullptr), "Help/edge.t");
    EXPECT_EQ(Found("html"), "none");
}

TEST_F(PlugHelp, IsNotGivenAnExtensionTwice)
{
    catalog.AddPlug("line.t", nullptr);
    dir.Write("Help/line.t", "");

    EXPECT_EQ(Found(nullptr, "line.t"), "Help/line.t");
    EXPECT_EQ(Found("t", "line.t"), "Help/line.t");
}

TEST_F(PlugHelp, WithoutAnExtensionOfTheKindHasOnlyTheOther)
{
    struct Plain : ZtPlugCatalog
    {
        Plain() : ZtPlugCatalog("Test:2.1") {}
        const char* Extension() override { return nullptr; }
    } plain;
    plain.ScanOneDir(dir.Dir().c_str());
    plain.AddPlug("edge", nullptr);
    dir.Write("Help/edge.html", "");
    dir.Write("edge", "");

    EXPECT_EQ(plain.FindPlugHelpFilename("edge", "html"),
              dir.Path("Help/edge.html"));
    EXPECT_EQ(plain.FindPlugHelpFilename("edge", nullptr), dir.Path("edge"));
}

TEST_F(PlugHelp, IsLookedForWhereTheVariableSays)
{
    SetVariable words("QUARN_PLUGIN_HELP", "Words");
    std::filesystem::create_directory(dir.Path("Words"));
    dir.Write("Help/edge.t.html", "");
    EXPECT_EQ(Found("html"), "none");

    dir.Write("Words/edge.t.html", "");

    EXPECT_EQ(Found("html"), "Words/edge.t.html");
}

TEST_F(PlugHelp, IsLookedForOnlyInAnAbsoluteDirectory)
{
    PluginDir doc;
    SetVariable absolute("QUARN_PLUGIN_HELP", doc.Dir().c_str());
    dir.Write("Help/edge.t.html", "");
    dir.Write("edge.t.html", "");
    EXPECT_EQ(Found("html"), "none");

    doc.Write("edge.t.html", "");

    EXPECT_EQ(catalog.FindPlugHelpFilename("edge", "html"),
              doc.Path("edge.t.html"));
}

TEST_F(PlugHelp, OfAPlugFromNowhereIsLookedForOnlyInAnAbsoluteDirectory)
{
    TestCatalog unscanned;
    unscanned.AddPlug("edge", nullptr);
    // One without a slash is none of the current directory.
    CurrentDirectory here(dir.Dir());
    dir.Write("Help/edge.t.html", "");
    EXPECT_EQ(unscanned.FindPlugHelpFilename("edge", "html"), nullptr);
    SetVariable absolute("QUARN_PLUGIN_HELP", dir.Dir().c_str());
    dir.Write("edge.t.html", "");

    EXPECT_EQ(unscanned.FindPlugHelpFilename("edge", "html"),
              dir.Path("edge.t.html"));
}

TEST_F(PlugHelp, AnEmptyVariableIsADirectoryOfNoName)
{
    SetVariable empty("QUARN_PLUGIN_HELP", "");
    dir.Write("Help/edge.t.html", "");
    EXPECT_EQ(Found("html"), "none");

    dir.Write("edge.t.html", "");

    EXPECT_EQ(Found("html"), "edge.t.html");
}

TEST_F(PlugHelp, IsNotFoundInADirectoryWithABlank)
{
    const std::string blank = dir.Path("a blank");
    std::filesystem::create_directory(blank);
    dir.Write("a blank/edge.t.html", "");
    TestCatalog other;
    other.ScanOneDir(blank.c_str());
    other.AddPlug("edge", nullptr);

    EXPECT_EQ(other.FindPlugHelpFilename("edge", "html"), nullptr);
}

TEST_F(PlugHelp, IsATemporaryString)
{
    dir.Write("Help/edge.t.html", "");
    const char* path = catalog.FindPlugHelpFilename("edge", "html");

    for (int made = 0; made < 99; ++made)
        ZtNewTempString("");

    EXPECT_EQ(path, dir.Path("Help/edge.t.html"));
}
