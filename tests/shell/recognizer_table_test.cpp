#include "recognizers/recognizer_table.h"

#include <gtest/gtest.h>

using ztsh::FetchPictureRecognizer;
using ztsh::HeldRecognizer;

namespace {

/// A recognizer that finds all its targets everywhere.
class Optimist : public PictureRecognizer
{
public:
    ~Optimist() override
    {
        // Its targets are still there when it goes.
        for (KvoList::Link* link = targets.head; link; link = link->next)
            seen_at_the_end +=
                static_cast<KvoRecognizerTarget*>(link->item)->name;
    }
    int Configure() override { return Configured(); }
    int Recognize(const ZtImageSGI&) override
    {
        Reset();
        for (KvoList::Link* link = targets.head; link; link = link->next)
            add_result(std::make_unique<RecognizerResult>(
                *static_cast<KvoRecognizerTarget*>(link->item)));
        return results.count;
    }

    static inline std::string seen_at_the_end;
};

template <class Recognizer>
class Factory : public KvoRecognizerFactory
{
public:
    KvoRecognizer* MakeRecognizer() override { return new Recognizer; }
};

std::unique_ptr<KvoRecognizerTarget> Target(const char* name)
{
    return std::make_unique<KvoRecognizerTarget>(name);
}

TEST(recognizer_table, FetchesARecognizerThatSearchesPictures)
{
    KvoRecognizerCatalog catalog;
    catalog.AddPlug("optimist", new Factory<Optimist>);
    std::string why;

    auto fetched = FetchPictureRecognizer(catalog, "optimist", why);

    ASSERT_NE(fetched, nullptr);
    EXPECT_NE(PictureRecognizer::From(fetched.get()), nullptr);
    EXPECT_EQ(why, "");
}

TEST(recognizer_table, SaysWhyItFetchesNothing)
{
    KvoRecognizerCatalog none;
    KvoRecognizerCatalog catalog;
    catalog.AddPlug("optimist", new Factory<Optimist>);
    catalog.AddPlug("listener", new Factory<KvoRecognizer>);
    catalog.AddPlug("object", new KvoObject);
    std::string why;

    EXPECT_EQ(FetchPictureRecognizer(none, "eye", why), nullptr);
    EXPECT_EQ(why, "no plug-in has brought it; there are none");
    EXPECT_EQ(FetchPictureRecognizer(catalog, "eye", why), nullptr);
    EXPECT_EQ(why, "no plug-in has brought it; there are: listener, object, "
                   "optimist");
    EXPECT_EQ(FetchPictureRecognizer(catalog, "listener", why), nullptr);
    EXPECT_EQ(why, "it does not search pictures");
    EXPECT_EQ(FetchPictureRecognizer(catalog, "object", why), nullptr);
    EXPECT_EQ(why, "its plug-in makes none");
}

TEST(recognizer_table, ATargetReplacesAnotherOfItsName)
{
    HeldRecognizer held(std::make_unique<Optimist>(), "optimist");
    held.Add(Target("door"));
    held.Add(Target("gate"));
    auto second = Target("door");
    KvoRecognizerTarget* second_door = second.get();

    held.Add(std::move(second));

    EXPECT_EQ(held.Get().targets.count, 2);
    EXPECT_EQ(held.Get().FindTarget("door"), second_door);
    EXPECT_NE(held.Get().FindTarget("gate"), nullptr);
}

TEST(recognizer_table, ANewTargetDropsTheResults)
{
    HeldRecognizer held(std::make_unique<Optimist>(), "optimist");
    held.Add(Target("door"));
    held.Get().Recognize(ZtImageSGI(1, 1, nullptr));
    EXPECT_EQ(held.Get().results.count, 1);

    held.Add(Target("door"));

    EXPECT_EQ(held.Get().results.count, 0);
}

TEST(recognizer_table, TheTargetsOutliveTheRecognizer)
{
    Optimist::seen_at_the_end.clear();
    {
        HeldRecognizer held(std::make_unique<Optimist>(), "optimist");
        held.Add(Target("door"));
        EXPECT_EQ(held.Plug(), "optimist");
    }
    EXPECT_EQ(Optimist::seen_at_the_end, "door");
}

TEST(recognizer_table, ARecognizerPutInThePlaceOfAnotherKeepsThatOrder)
{
    Optimist::seen_at_the_end.clear();
    ztsh::RecognizerTable table;
    table["eye"] = std::make_unique<HeldRecognizer>(
        std::make_unique<Optimist>(), "optimist");
    table["eye"]->Add(Target("door"));

    table["eye"] = std::make_unique<HeldRecognizer>(
        std::make_unique<Optimist>(), "optimist");

    EXPECT_EQ(Optimist::seen_at_the_end, "door");
    EXPECT_EQ(table.at("eye")->Get().targets.count, 0);
}

} // namespace
