#include "picture_recognizer.h"

#include <gtest/gtest.h>

#include "support/FailingMemory.h"

namespace {

class NotedResult : public RecognizerResult
{
public:
    NotedResult(KvoRecognizerTarget& found, int& count)
        : RecognizerResult(found), deleted(count)
    {}
    ~NotedResult() override { ++deleted; }

    int& deleted;
};

/// Finds every target once.
class Finder : public PictureRecognizer
{
public:
    int Configure() override { return Configured(); }

    int Recognize(const ZtImageSGI&) override
    {
        Reset();
        for (KvoList::Link* link = targets.head; link; link = link->next)
            add_result(std::make_unique<NotedResult>(
                *static_cast<KvoRecognizerTarget*>(link->item), deleted));
        return results.count;
    }

    bool Add(std::unique_ptr<RecognizerResult> result)
    {
        return add_result(std::move(result));
    }

    static inline int deleted = 0;
};

TEST(picture_recognizer, IsToldFromOtherRecognizers)
{
    Finder finder;
    KvoRecognizer plain;

    EXPECT_EQ(PictureRecognizer::From(&finder), &finder);
    EXPECT_EQ(PictureRecognizer::From(&plain), nullptr);
    EXPECT_EQ(PictureRecognizer::From(nullptr), nullptr);
    EXPECT_STREQ(finder.ClassName(), "PictureRecognizer");
}

TEST(picture_recognizer, AResultIsToldFromOtherObjects)
{
    KvoRecognizerTarget target("door");
    RecognizerResult result(target);
    KvoNamedObject other("door");
    KvoObject* as_object = &result;

    EXPECT_EQ(RecognizerResult::From(as_object), &result);
    EXPECT_EQ(RecognizerResult::From(static_cast<KvoObject*>(&other)), nullptr);
    EXPECT_EQ(RecognizerResult::From(nullptr), nullptr);
}

TEST(picture_recognizer, AResultBeginsWithItsTargetOnly)
{
    KvoRecognizerTarget target("door");

    RecognizerResult result(target);

    EXPECT_STREQ(result.name, "door");
    EXPECT_EQ(result.target, &target);
    EXPECT_EQ(result.x, 0);
    EXPECT_EQ(result.y, 0);
    EXPECT_EQ(result.width, 0);
    EXPECT_EQ(result.height, 0);
    EXPECT_EQ(result.score, 0.0);
}

TEST(picture_recognizer, ItsResultsAreDeletedByResetTheNextRunAndTheEnd)
{
    KvoRecognizerTarget target("door");
    ZtImageSGI frame(1, 1, nullptr);
    int before = Finder::deleted;
    {
        Finder finder;
        finder.targets.PushTail(&target);
        EXPECT_EQ(finder.Recognize(frame), 1);
        EXPECT_EQ(Finder::deleted, before);

        finder.Recognize(frame);
        EXPECT_EQ(Finder::deleted, before + 1);
        EXPECT_EQ(finder.results.count, 1);

        finder.Reset();
        EXPECT_EQ(Finder::deleted, before + 2);
        EXPECT_EQ(finder.results.count, 0);

        finder.Recognize(frame);
    }
    EXPECT_EQ(Finder::deleted, before + 3);
}

TEST(picture_recognizer, AResultThatCannotBeKeptIsDeleted)
{
    KvoRecognizerTarget target("door");
    Finder finder;
    int before = Finder::deleted;
    // Links come from a store that holds some; use those up.
    bool kept = true;
    int count = 0;
    for (; kept && count < 100000; ++count) {
        auto result = std::make_unique<NotedResult>(target, Finder::deleted);
        FailingMemory memory;
        kept = finder.Add(std::move(result));
    }

    EXPECT_FALSE(kept);
    EXPECT_EQ(finder.results.count, count - 1);
    EXPECT_EQ(Finder::deleted, before + 1);
}

} // namespace
