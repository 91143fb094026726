// Recognizers that come from shared objects.

#include "ZT/recognizer.h"

#include <memory>

#include <gtest/gtest.h>

#include "env/plugin_tests.h"
#include "support/CapturedStderr.h"
#include "support/ErrorTrap.h"

namespace {

Names NamesOf(ZtPlugCatalog& catalog)
{
    Names names;
    for (const char* name = catalog.HeadKey(); name; name = catalog.NextKey())
        names.emplace_back(name);
    return names;
}

TEST(recognizer_plugin, IsFoundByItsName)
{
    PluginDir directory;
    directory.Add("offers_recognizers", "a.r.so");
    directory.Add("no_factory", "b.s.so");
    directory.Add("no_factory", "c.r.so.bak");
    directory.Add("no_factory", ".r.so");
    KvoRecognizerCatalog catalog;

    catalog.ScanDirectory(directory.Dir().c_str());

    EXPECT_EQ(NamesOf(catalog), (Names{"camera", "eye"}));
    EXPECT_EQ(catalog.FindPlugPath("eye"), directory.Dir());
}

TEST(recognizer_plugin, ItsRecognizerIsFetchedAcrossTheBorder)
{
    PluginDir directory;
    directory.Add("offers_recognizers", "a.r.so");
    KvoRecognizerCatalog catalog;
    catalog.ScanOneDir(directory.Dir().c_str());

    std::unique_ptr<KvoRecognizer> eye(catalog.FetchRecognizer("eye"));
    std::unique_ptr<KvoRecognizer> second(catalog.FetchRecognizer("eye"));

    ASSERT_NE(eye, nullptr);
    ASSERT_NE(second, nullptr);
    EXPECT_NE(eye, second);
    EXPECT_EQ(eye->IdMatches(), 21);
    EXPECT_EQ(eye->Configured(), 1);
    EXPECT_EQ(catalog.FetchRecognizer("nose"), nullptr);
}

TEST(recognizer_plugin, ItsEntryIsToldTheDirectory)
{
    PluginDir directory;
    directory.Add("offers_recognizers", "a.r.so");
    KvoRecognizerCatalog catalog;
    catalog.ScanOneDir(directory.Dir().c_str());

    std::unique_ptr<KvoRecognizer> eye(catalog.FetchRecognizer("eye"));

    ASSERT_NE(eye, nullptr);
    EXPECT_EQ(static_cast<char*>(eye->Key()), directory.Dir());
}

TEST(recognizer_plugin, WhatIsNoFactoryIsNotFetched)
{
    PluginDir directory;
    directory.Add("no_factory", "a.r.so");
    KvoRecognizerCatalog catalog;
    catalog.ScanOneDir(directory.Dir().c_str());

    EXPECT_EQ(NamesOf(catalog), (Names{"impostor", "nothing"}));
    EXPECT_EQ(catalog.FetchRecognizer("impostor"), nullptr);
    EXPECT_EQ(catalog.FetchRecognizer("nothing"), nullptr);
}

TEST(recognizer_plugin, WhatItsFactoryThrowsIsReported)
{
    PluginDir directory;
    directory.Add("offers_recognizers", "a.r.so");
    KvoRecognizerCatalog catalog;
    catalog.ScanOneDir(directory.Dir().c_str());
    ErrorTrap reports;

    EXPECT_EQ(catalog.FetchRecognizer("camera"), nullptr);

    EXPECT_EQ(reports.Text(),
              "Error: Recognizer camera cannot be made: out of film\n");
}

TEST(recognizer_plugin, OfAnotherVersionIsNotKept)
{
    class NewerCatalog : public ZtPlugCatalog
    {
    public:
        NewerCatalog() : ZtPlugCatalog("Recognizer:3.1") {}
        const char* Extension() override { return "r"; }
    };
    PluginDir directory;
    std::string path = directory.Add("offers_recognizers", "a.r.so");
    NewerCatalog catalog;
    CapturedStderr printed;

    catalog.ScanOneDir(directory.Dir().c_str());

    EXPECT_EQ(catalog.HeadKey(), nullptr);
    EXPECT_FALSE(IsLoaded(path));
    EXPECT_EQ(printed.Text(), "");
}

TEST(recognizer_plugin, TheFirstOfANameWinsAndTheSecondIsClosed)
{
    PluginDir first;
    PluginDir second;
    first.Add("offers_recognizers", "a.r.so");
    std::string closed = second.Add("offers_recognizers", "a.r.so");
    KvoRecognizerCatalog catalog;

    catalog.ScanDirectory((first.Dir() + ":" + second.Dir()).c_str());

    EXPECT_EQ(catalog.FindPlugPath("eye"), first.Dir());
    EXPECT_FALSE(IsLoaded(closed));
}

TEST(recognizer_plugin, IsClosedWithTheCatalog)
{
    PluginDir directory;
    std::string path = directory.Add("offers_recognizers", "a.r.so");
    {
        KvoRecognizerCatalog catalog;
        catalog.ScanOneDir(directory.Dir().c_str());
        EXPECT_TRUE(IsLoaded(path));
        delete catalog.FetchRecognizer("eye");
    }
    EXPECT_FALSE(IsLoaded(path));
}

} // namespace
