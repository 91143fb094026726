#include "ZT/plug.h"

#include <sstream>

#include <gtest/gtest.h>

#include "ZT/directive.h"
#include "core/text_stream.h"
#include "env/plugin_tests.h"
#include "support/ErrorTrap.h"

namespace {

void Carry(ZtDispatcher& dispatcher, const char* text)
{
    zt_core::TextStream in(text);
    KvoStatement statement;
    statement.Read(in);
    dispatcher.Delegate(&statement);
}

class Telling : public ZtDirective
{
public:
    Telling(const char* word, const char* text) : ZtDirective(word), told(text)
    {}
    void Act(KvoStatement*) override { TellTheTest(told); }

private:
    const char* told;
};

} // namespace

TEST(ZtDirectiveCatalog, LoadsWordsAndWithdrawsThemBeforeTheirCodeGoes)
{
    PluginDir dir;
    dir.Add("word", "word.d.so");
    ZtDispatcher dispatcher;
    ErrorTrap reports;
    TakeTold();
    {
        ZtDirectiveCatalog catalog(dispatcher);
        catalog.ScanOneDir(dir.Dir().c_str());

        Carry(dispatcher, "hail Caesar\n");

        EXPECT_EQ(TakeTold(), (Names{"Caesar"}));
        EXPECT_EQ(reports.Text(), "");
    }
    EXPECT_EQ(TakeTold(), (Names{"Hail deleted", "word.so closed"}));
    Carry(dispatcher, "Hail Caesar\n");
    EXPECT_EQ(reports.reports.size(), 1U); // an unknown command
    EXPECT_FALSE(IsLoaded(dir.Path("word.d.so")));
}

TEST(ZtDirectiveCatalog, AWordThatIsThereGoesOnActing)
{
    PluginDir dir;
    dir.Add("word", "word.d.so");
    ZtDispatcher dispatcher;
    dispatcher.Add(new Telling("HAIL", "the program's own"));
    TakeTold();
    {
        ZtDirectiveCatalog catalog(dispatcher);
        catalog.ScanOneDir(dir.Dir().c_str());
        Carry(dispatcher, "Hail Caesar\n");
    }
    Carry(dispatcher, "Hail Caesar\n");

    EXPECT_EQ(TakeTold(), (Names{"the program's own", "Hail deleted",
                                 "word.so closed", "the program's own"}));
}

TEST(ZtDirectiveCatalog, AnObjectThatIsNoDirectiveIsAWarning)
{
    PluginDir dir;
    dir.Add("no_word", "no_word.d.so");
    ZtDispatcher dispatcher;
    ErrorTrap reports;
    TakeTold();
    {
        ZtDirectiveCatalog catalog(dispatcher);

        catalog.ScanOneDir(dir.Dir().c_str());
        catalog.AddPlug("null", nullptr);

        EXPECT_NE(catalog.FindPlug("no_word"), nullptr);
        EXPECT_EQ(reports.Text(),
                  "Warning: Plug-in " + dir.Dir() +
                      ": no_word is no directive\nWarning: Plug-in " +
                      dir.Dir() + ": null is no directive\n");
    }
    EXPECT_EQ(TakeTold(), (Names{"no_word deleted"}));
}

TEST(ZtDirectiveCatalog, TheProgramMayAddWordsToo)
{
    ZtDispatcher dispatcher;
    ErrorTrap reports;
    TakeTold();
    {
        ZtDirectiveCatalog catalog(dispatcher);
        catalog.AddPlug("Hello", new Telling("Hello", "acted"));
        catalog.AddPlug("Bye", new Telling("Bye", "left"));
        catalog.AddPlug("null", nullptr);

        Carry(dispatcher, "hello\n");
        Carry(dispatcher, "bye\n");
    }
    EXPECT_EQ(TakeTold(), (Names{"acted", "left"}));
    EXPECT_EQ(reports.Text(),
              "Warning: Plug-in of the program: null is no directive\n");
    std::ostringstream words;
    dispatcher.Info(words, 0);
    EXPECT_EQ(words.str(), "");
}

TEST(ZtDirectiveCatalog, LooksForItsOwnKindOnly)
{
    PluginDir dir;
    dir.Add("good", "good.d.so"); // its id is of another kind
    dir.Add("word", "word.t.so");
    ZtDispatcher dispatcher;
    ZtDirectiveCatalog catalog(dispatcher);

    catalog.ScanOneDir(dir.Dir().c_str());

    EXPECT_EQ(catalog.HeadKey(), nullptr);
    EXPECT_STREQ(catalog.Extension(), "d");
    EXPECT_STREQ(ZtDirectiveCatalog::plug_name, "Directive:1.0");
}
