#include "ZT/plug.h"

#include <dlfcn.h>

#include <gtest/gtest.h>

#include "env/plugin_tests.h"
#include "env/plugins/casts.h"
#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"

KVO_DEFINE_CLASS_INFO(Shape, &KvoNamedObject::classInfo);

namespace {

/// What a scan of one directory leaves behind.
struct Scan
{
    explicit Scan(const PluginDir& dir)
    {
        TakeTold();
        CapturedStderr err;
        catalog.ScanOneDir(dir.Dir().c_str());
        errors = err.Text();
        told = TakeTold();
    }

    TestCatalog catalog;
    std::string errors;
    Names told;
};

} // namespace

// --- which files -----------------------------------------------------------

TEST(ZtPlugCatalog, LoadsAPlugInAndKeepsItUntilTheEnd)
{
    PluginDir dir("good");
    const std::string file = dir.Path("good.t.so");
    {
        Scan scan(dir);

        EXPECT_EQ(scan.catalog.Names(), (Names{"good"}));
        EXPECT_EQ(scan.catalog.initialized, (Names{"good"}));
        EXPECT_EQ(scan.catalog.FindPlugPath("good"), dir.Dir());
        EXPECT_EQ(scan.errors, "");
        EXPECT_EQ(scan.told, Names{});
        EXPECT_TRUE(IsLoaded(file));
    }
    EXPECT_FALSE(IsLoaded(file));
    EXPECT_EQ(TakeTold(), (Names{"good deleted", "good.so closed"}));
}

TEST(ZtPlugCatalog, LoadsOnlyWhatEndsInItsSuffix)
{
    PluginDir dir;
    dir.Add("good", "edge.t.so");
    for (const char* name : {".t.so", "edge.t.so.bak", "edge.so", "edge.T.so",
                             "edget.so", "t.so", "edge.t.sO"})
        dir.Write(name, "not a shared object: the loader would say so");

    Scan scan(dir);

    EXPECT_EQ(scan.errors, "");
    EXPECT_EQ(scan.catalog.Names(), (Names{"good"}));
}

TEST(ZtPlugCatalog, TheBaseClassLooksForADoubledSuffix)
{
    PluginDir dir;
    dir.Add("good", "edge..so.so");
    dir.Write("edge.so", "not looked at");
    dir.Write("edge.so.so", "not looked at");
    ZtPlugCatalog catalog("Test:2.1");

    CapturedStderr err;
    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_EQ(err.Text(), "");
    EXPECT_NE(catalog.FindPlug("good"), nullptr);
}

TEST(ZtPlugCatalog, LoadsInTheDirectorysOwnOrder)
{
    PluginDir dir;
    for (char letter = 'a'; letter <= 'p'; ++letter)
        dir.Write(std::string(1, letter) + ".t.so", "no shared object");
    std::string expected;
    for (const auto& entry : std::filesystem::directory_iterator(dir.Dir()))
        expected += entry.path().string() + ": file too short\n";

    Scan scan(dir);

    EXPECT_EQ(scan.errors, expected);
}

TEST(ZtPlugCatalog, FollowsALinkToAPlugIn)
{
    PluginDir dir;
    std::filesystem::create_symlink(ZT_TEST_PLUGINS "/good.so",
                                    dir.Path("linked.t.so"));

    Scan scan(dir);

    EXPECT_EQ(scan.catalog.Names(), (Names{"good"}));
}

// --- where -----------------------------------------------------------------

TEST(ZtPlugCatalog, ScansTheCurrentDirectoryForNullAndNothing)
{
    PluginDir dir("good");
    CurrentDirectory here(dir.Dir());
    for (const char* path : {static_cast<const char*>(nullptr), ""}) {
        TestCatalog one;
        TestCatalog several;

        one.ScanOneDir(path);
        several.ScanDirectory(path);

        EXPECT_STREQ(one.FindPlugPath("good"), ".");
        EXPECT_STREQ(several.FindPlugPath("good"), ".");
    }
}

TEST(ZtPlugCatalog, ScansTheDirectoriesOfAListFromLeftToRight)
{
    PluginDir a("good");
    PluginDir b;
    b.Add("name_taken");
    b.Add("two_plugs");
    TestCatalog catalog;
    TakeTold();

    catalog.ScanDirectory((a.Dir() + ":" + b.Dir()).c_str());

    EXPECT_EQ(catalog.Names(), (Names{"first", "good", "second"}));
    EXPECT_EQ(catalog.FindPlugPath("good"), a.Dir());
    EXPECT_EQ(catalog.FindPlugPath("first"), b.Dir());
    EXPECT_FALSE(IsLoaded(b.Path("name_taken.t.so")));
    EXPECT_EQ(TakeTold(),
              (Names{"refused object deleted", "name_taken.so closed"}));
}

TEST(ZtPlugCatalog, TheFirstDirectoryWithANameKeepsItTheOtherWayRound)
{
    PluginDir a("good");
    PluginDir b("good");
    TestCatalog catalog;

    catalog.ScanDirectory((b.Dir() + ":" + a.Dir()).c_str());

    EXPECT_EQ(catalog.FindPlugPath("good"), b.Dir());
}

TEST(ZtPlugCatalog, AnEmptyElementIsTheCurrentDirectory)
{
    PluginDir dir("good");
    PluginDir other("two_plugs");
    CurrentDirectory here(dir.Dir());
    const std::string far = other.Dir();
    for (const std::string& path :
         {":" + far, far + ":", far + "::" + far, std::string(":")}) {
        TestCatalog catalog;

        catalog.ScanDirectory(path.c_str());

        EXPECT_STREQ(catalog.FindPlugPath("good"), ".") << path;
    }
}

TEST(ZtPlugCatalog, LeavesTheListAsItWas)
{
    char path[] = "/nowhere:/elsewhere:";
    TestCatalog catalog;

    catalog.ScanDirectory(path);

    EXPECT_STREQ(path, "/nowhere:/elsewhere:");
    EXPECT_STREQ(catalog.AddPlug("plug", nullptr)->path, ".");
}

TEST(ZtPlugCatalog, ScansItsOwnStoredDirectoryAgain)
{
    PluginDir dir("good");
    TestCatalog catalog;
    catalog.ScanOneDir(dir.Dir().c_str());

    catalog.ScanOneDir(catalog.FindPlugPath("good"));
    catalog.ScanDirectory(catalog.FindPlug("good")->path);

    EXPECT_EQ(catalog.Names(), (Names{"good"}));
}

TEST(ZtPlugCatalog, ADirectoryThatIsNoneIsSilent)
{
    PluginDir dir;
    TestCatalog catalog;
    CapturedStderr err;

    catalog.ScanOneDir("/nowhere/at/all");
    catalog.ScanOneDir(dir.Write("file", "").c_str());
    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_EQ(err.Text(), "");
    EXPECT_EQ(catalog.HeadKey(), nullptr);
}

// --- what is kept ----------------------------------------------------------

TEST(ZtPlugCatalog, ClosesWithoutAWordWhatIsNotForIt)
{
    for (const char* plugin :
         {"no_id", "wrong_id", "newer_id", "older_id", "lower_case_id",
          "no_entry", "id_null", "id_is_array", "id_is_function",
          "entry_is_data"}) {
        PluginDir dir(plugin);
        Scan scan(dir);

        EXPECT_EQ(scan.catalog.HeadKey(), nullptr) << plugin;
        EXPECT_EQ(scan.errors, "") << plugin;
        EXPECT_FALSE(IsLoaded(dir.Path(std::string(plugin) + ".t.so")))
            << plugin;
    }
}

TEST(ZtPlugCatalog, ClosesWhatRegistersNothing)
{
    PluginDir dir("registers_nothing");
    Scan scan(dir);

    EXPECT_EQ(scan.errors, "");
    EXPECT_EQ(scan.told, (Names{"entered", "registers_nothing.so closed"}));
    EXPECT_FALSE(IsLoaded(dir.Path("registers_nothing.t.so")));
}

TEST(ZtPlugCatalog, WithoutTheExactVersionLoadsAnOlderPlugIn)
{
    PluginDir dir;
    dir.Add("older_id");
    dir.Add("newer_id");
    TestCatalog catalog;
    catalog.exact_version = 0;

    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_EQ(catalog.Names(), (Names{"older_id"}));
}

TEST(ZtPlugCatalog, ScanningAgainKeepsWhatIsThere)
{
    PluginDir dir("good");
    TestCatalog catalog;
    catalog.ScanOneDir(dir.Dir().c_str());
    ZtPlugCatalog::Plug* before = catalog.FindPlug("good");
    dir.Add("two_plugs");

    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_EQ(catalog.FindPlug("good"), before);
    EXPECT_EQ(catalog.Names(), (Names{"first", "good", "second"}));
    EXPECT_TRUE(IsLoaded(dir.Path("good.t.so")));
}

TEST(ZtPlugCatalog, DeletesAllPlugsThenClosesTheNewestFirst)
{
    PluginDir a("good");
    PluginDir b("two_plugs");
    TakeTold();
    {
        TestCatalog catalog;
        catalog.ScanDirectory((a.Dir() + ":" + b.Dir()).c_str());
    }
    EXPECT_EQ(TakeTold(),
              (Names{"first deleted", "good deleted", "second deleted",
                     "two_plugs.so closed", "good.so closed"}));
}

TEST(ZtPlugCatalog, ASharedObjectThatTwoCatalogsUseStaysForTheSecond)
{
    PluginDir dir("good");
    TestCatalog second;
    {
        TestCatalog first;
        first.ScanOneDir(dir.Dir().c_str());
        second.ScanOneDir(dir.Dir().c_str());
    }
    EXPECT_TRUE(IsLoaded(dir.Path("good.t.so")));
    EXPECT_STREQ(
        static_cast<KvoNamedObject*>(second.FindPlug("good")->object)->name,
        "good deleted");
}

// --- one file --------------------------------------------------------------

TEST(ZtPlugCatalog, LoadsOneFileOfAnyName)
{
    PluginDir dir;
    const std::string file = dir.Add("good", "whatever");
    dir.Add("two_plugs");
    TestCatalog catalog;

    EXPECT_EQ(catalog.ScanFile(file.c_str()), 1);

    EXPECT_EQ(catalog.Names(), (Names{"good"}));
    EXPECT_EQ(catalog.FindPlugPath("good"), dir.Dir());
    EXPECT_EQ(catalog.ScanFile(file.c_str()), 0); // its name is taken now
}

TEST(ZtPlugCatalog, LoadsABareFileFromTheCurrentDirectory)
{
    PluginDir dir("good");
    CurrentDirectory here(dir.Dir());
    TestCatalog catalog;

    EXPECT_EQ(catalog.ScanFile("good.t.so"), 1);

    EXPECT_STREQ(catalog.FindPlugPath("good"), ".");
}

TEST(ZtPlugCatalog, AFileThatIsNoneIsTheLoadersToTell)
{
    TestCatalog catalog;
    CapturedStderr err;

    EXPECT_EQ(catalog.ScanFile("/nowhere.t.so"), 0);
    EXPECT_STREQ(catalog.Directory(), "/");
    EXPECT_EQ(catalog.ScanFile(nullptr), 0);

    EXPECT_EQ(err.Text().find("/nowhere.t.so: cannot open"), 0U);
    EXPECT_STREQ(catalog.AddPlug("plug", nullptr)->path, ".");
}

// --- what plug-ins do ------------------------------------------------------

TEST(ZtPlugCatalog, ReportsAnEntryThatThrowsAndClosesIt)
{
    PluginDir dir("entry_throws");
    ErrorTrap reports;

    Scan scan(dir);

    EXPECT_EQ(reports.Text(), "Warning: Plug-in " +
                                  dir.Path("entry_throws.t.so") +
                                  " threw an exception: no licence\n");
    EXPECT_EQ(scan.told,
              (Names{"exception destroyed", "entry_throws.so closed"}));
    EXPECT_EQ(scan.errors, "");
    EXPECT_EQ(scan.catalog.HeadKey(), nullptr);
}

TEST(ZtPlugCatalog, KeepsWhatRegisteredSomethingBeforeItThrew)
{
    PluginDir dir("entry_throws_late");
    ErrorTrap reports;
    {
        Scan scan(dir);

        EXPECT_EQ(scan.catalog.Names(), (Names{"late"}));
        EXPECT_EQ(scan.told, Names{});
        EXPECT_EQ(reports.Text(), "Warning: Plug-in " +
                                      dir.Path("entry_throws_late.t.so") +
                                      " threw an exception\n");
    }
    EXPECT_EQ(TakeTold(),
              (Names{"late deleted", "entry_throws_late.so closed"}));
}

TEST(ZtPlugCatalog, AScanFromAnEntryLeavesItsDirectory)
{
    PluginDir outer("scans_again");
    PluginDir inner("good");
    SetVariable where("ZT_TEST_INNER_DIRECTORY", inner.Dir().c_str());

    Scan scan(outer);

    EXPECT_EQ(scan.catalog.Names(), (Names{"after", "before", "good"}));
    EXPECT_EQ(scan.catalog.FindPlugPath("before"), outer.Dir());
    EXPECT_EQ(scan.catalog.FindPlugPath("good"), inner.Dir());
    EXPECT_EQ(scan.catalog.FindPlugPath("after"), inner.Dir());
    EXPECT_EQ(scan.catalog.AddPlug("host", nullptr)->path, inner.Dir());
}

TEST(ZtPlugCatalog, AScanFromAnEntryGoesOnInTheOuterDirectory)
{
    for (const char* scanning : {"scans_again", "scans_as_another_kind"}) {
        PluginDir outer(scanning);
        outer.Add("good");
        outer.Add("two_plugs");
        outer.Add("good", "good.other");
        PluginDir inner;
        SetVariable where("ZT_TEST_INNER_DIRECTORY", inner.Dir().c_str());

        Scan scan(outer);

        EXPECT_NE(scan.catalog.FindPlug("good"), nullptr) << scanning;
        EXPECT_NE(scan.catalog.FindPlug("first"), nullptr) << scanning;
        EXPECT_TRUE(IsLoaded(outer.Path("good.t.so"))) << scanning;
        EXPECT_EQ(scan.errors, "") << scanning;
    }
}

TEST(ZtPlugCatalog, APlugInThatScansItsOwnDirectoryIsNotEnteredAgain)
{
    PluginDir dir("scans_again");
    dir.Add("good");
    SetVariable where("ZT_TEST_INNER_DIRECTORY", dir.Dir().c_str());

    Scan scan(dir);

    EXPECT_EQ(scan.catalog.Names(), (Names{"after", "before", "good"}));
    EXPECT_EQ(scan.errors, "");
}

TEST(ZtPlugCatalog, PlugInsThatScanOneAnotherAreNotEnteredAgain)
{
    PluginDir dir("scans_again");
    dir.Add("scans_again", "second.t.so");
    dir.Add("scans_again", "third.t.so");
    SetVariable where("ZT_TEST_INNER_DIRECTORY", dir.Dir().c_str());
    SetVariable trace("ZT_PLUGIN_TRACE", "1");

    Scan scan(dir);

    EXPECT_EQ(scan.catalog.Names(), (Names{"after", "before"}));
    // Every scan comes upon every plug-in whose entry it runs in: one scan in
    // one entry, and two in two, for each of three, and so on.
    const std::string running = ": its entry is running\n";
    std::size_t refusals = 0;
    for (std::size_t at = 0;
         (at = scan.errors.find(running, at)) != std::string::npos; ++at)
        ++refusals;
    EXPECT_EQ(refusals, 3U * 1 + 6U * 2 + 6U * 3);
}

TEST(ZtPlugCatalog, KeepsThePlugInsSymbolsFromOneAnother)
{
    const PluginDir dir("good");

    const Scan scan(dir);

    EXPECT_TRUE(IsLoaded(dir.Path("good.t.so")));
    EXPECT_EQ(dlsym(RTLD_DEFAULT, "KvoPluginIDString"), nullptr);
}

TEST(ZtPlugCatalog, TakesNamesOfAnyLength)
{
    PluginDir dir("empty_name");
    dir.Add("long_name");

    Scan scan(dir);

    EXPECT_EQ(scan.catalog.Names(), (Names{"", std::string(70000, 'n')}));
    EXPECT_EQ(scan.catalog.FindPlugPath(""), dir.Dir());
    EXPECT_EQ(scan.catalog.FindPlugHelpFilename(std::string(70000, 'n').c_str(),
                                                "txt"),
              nullptr);
}

// --- tracing and binding ---------------------------------------------------

TEST(ZtPlugCatalog, TellsOfEveryCandidateWhenAskedTo)
{
    SetVariable trace("ZT_PLUGIN_TRACE", "1");
    const std::pair<const char*, const char*> verdicts[] = {
        {"good", "id Test:2.1, wanted Test:2.1: loaded"},
        {"wrong_id", "id Test:2.0, wanted Test:2.1: another id"},
        {"no_id", "id none, wanted Test:2.1: no id"},
        {"id_null", "id none, wanted Test:2.1: the id is null"},
        {"id_is_array", "id none, wanted Test:2.1: the id is no pointer"},
        {"no_entry", "id Test:2.1, wanted Test:2.1: no entry"},
        {"entry_is_data",
         "id Test:2.1, wanted Test:2.1: the entry is no function"},
        {"registers_nothing",
         "id Test:2.1, wanted Test:2.1: registered nothing"},
    };
    for (const auto& [plugin, verdict] : verdicts) {
        PluginDir dir(plugin);
        Scan scan(dir);

        EXPECT_EQ(scan.errors,
                  dir.Path(std::string(plugin) + ".t.so: ") + verdict + "\n");
    }
}

TEST(ZtPlugCatalog, TellsOfWhatWasThrownOrTaken)
{
    SetVariable trace("ZT_PLUGIN_TRACE", "1");
    PluginDir dir;
    const std::string good = dir.Add("good");
    const std::string taken = dir.Add("name_taken", "taken");
    const std::string throws = dir.Add("entry_throws", "throws");
    const std::string late = dir.Add("entry_throws_late", "late");
    ErrorTrap reports;
    TestCatalog catalog;
    CapturedStderr err;

    for (const std::string& file : {good, taken, throws, late})
        catalog.ScanFile(file.c_str());

    const std::string ids = ": id Test:2.1, wanted Test:2.1: ";
    EXPECT_EQ(err.Text(), good + ids + "loaded\n" + taken + ids +
                              "its names are taken\n" + throws + ids +
                              "threw, registered nothing\n" + late + ids +
                              "threw, loaded\n");
}

TEST(ZtPlugCatalog, TellsNothingUnlessTheVariableIsOne)
{
    PluginDir dir("good");
    for (const char* value : {"0", "", "yes", "11"}) {
        SetVariable trace("ZT_PLUGIN_TRACE", value);

        EXPECT_EQ(Scan(dir).errors, "") << value;
    }
}

TEST(ZtPlugCatalog, BindsFunctionsWhenTheyAreCalled)
{
    PluginDir dir("missing_function");
    Scan scan(dir);

    EXPECT_EQ(scan.errors, "");
    ASSERT_EQ(scan.catalog.Names(), (Names{"missing_function"}));
    KvoObject* caller = scan.catalog.FindPlug("missing_function")->object;
    EXPECT_EXIT(caller->SetModified(), testing::ExitedWithCode(127),
                "symbol lookup error.*FunctionThatIsNowhere");
}

TEST(ZtPlugCatalog, BindsFunctionsAtOnceWhenAskedTo)
{
    SetVariable now("ZT_PLUGIN_BIND_NOW", "1");
    PluginDir dir("missing_function");
    Scan scan(dir);

    EXPECT_EQ(scan.catalog.HeadKey(), nullptr);
    EXPECT_NE(scan.errors.find("undefined symbol"), std::string::npos);
    EXPECT_EQ(Scan(PluginDir("good")).catalog.Names(), (Names{"good"}));
}

// --- casts -----------------------------------------------------------------

TEST(PlugInCasts, TheProgramCastsAnObjectOfAPlugInsClass)
{
    PluginDir dir("casts");
    Scan scan(dir);
    KvoObject* circle = scan.catalog.FindPlug("circle")->object;

    KvoObject* shape = Shape::classInfo.Cast(circle);

    ASSERT_EQ(shape, circle);
    EXPECT_EQ(static_cast<Shape*>(shape)->Area(), 3);
    EXPECT_STREQ(circle->ClassName(), "Circle");
    EXPECT_NE(KvoNamedObject::classInfo.Cast(circle), nullptr);
    EXPECT_NE(circle->ClassInfo()->bases[0], &Shape::classInfo);
}

TEST(PlugInCasts, APlugInCastsAnObjectOfTheProgramsClass)
{
    class Square : public Shape
    {
    public:
        Square() : Shape("square") {}
        double Area() override { return 4; }
    };
    PluginDir dir("casts");
    Scan scan(dir);
    KvoObject* judge = scan.catalog.FindPlug("judge")->object;
    Square square;
    KvoNamedObject other("no shape");

    EXPECT_EQ(judge->Compare(static_cast<KvoObject*>(&square)), 4);
    EXPECT_EQ(judge->Compare(static_cast<KvoObject*>(&other)), -1);
}

TEST(PlugInCasts, APlugInsClassIsNoneOfTheProgramsOthers)
{
    PluginDir dir("casts");
    Scan scan(dir);
    KvoObject* circle = scan.catalog.FindPlug("circle")->object;
    Shape shape("plain");

    EXPECT_EQ(circle->ClassInfo()->Cast(&shape), nullptr);
    EXPECT_EQ(ZtPlugCatalog::Plug("p", nullptr)
                  .ClassInfo()
                  ->CanCast(circle->ClassInfo()),
              1); // both are named objects
}
