#include "edge/edge_recognizer.h"

#include <memory>

#include <gtest/gtest.h>

#include "plugins/grey_pictures.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"

namespace {

using edge::EdgeRecognizer;
using edge::Grey;

/// A target with this picture, null for none.
std::unique_ptr<KvoRecognizerTarget> Target(const char* name,
                                            const Grey* picture)
{
    auto target = std::make_unique<KvoRecognizerTarget>(name);
    if (picture)
        target->picture = new ZtImageSGI(ImageOf(*picture));
    return target;
}

RecognizerResult* ResultAt(const KvoRecognizer& recognizer, int index)
{
    return RecognizerResult::From(recognizer.results[index]);
}

class EdgeRecognizerTest : public testing::Test
{
protected:
    EdgeRecognizerTest()
    {
        for (KvoRecognizerTarget* target : {door.get(), gate.get()})
            recognizer.targets.PushTail(target);
        Paste(scene, gate_picture, 20, 30);
        Paste(scene, door_picture, 200, 150);
        Paste(scene, Scaled(door_picture, 80, 61), 300, 50);
    }

    Grey door_picture = Blobs(160, 121, 1);
    Grey gate_picture = Blobs(160, 121, 2);
    Grey scene = Blobs(400, 300, 77);
    std::unique_ptr<KvoRecognizerTarget> door = Target("door", &door_picture);
    std::unique_ptr<KvoRecognizerTarget> gate = Target("gate", &gate_picture);
    EdgeRecognizer recognizer;
};

TEST_F(EdgeRecognizerTest, ConfiguresTargetsThatHaveAPicture)
{
    EXPECT_EQ(recognizer.Configured(), 0);

    EXPECT_EQ(recognizer.Configure(), 1);

    EXPECT_EQ(door->configured, 1);
    EXPECT_EQ(gate->configured, 1);
    EXPECT_EQ(recognizer.Configured(), 1);
}

TEST_F(EdgeRecognizerTest, DoesNotConfigureWhatItCannotFind)
{
    Grey plain = Plain(160, 121, 90);
    auto bare = Target("bare", nullptr);
    auto grey = Target("grey", &plain);
    recognizer.targets.PushTail(bare.get());
    recognizer.targets.PushTail(grey.get());

    EXPECT_EQ(recognizer.Configure(), 0);

    EXPECT_EQ(bare->configured, -1);
    EXPECT_EQ(grey->configured, -1);
    EXPECT_EQ(door->configured, 1);
}

TEST_F(EdgeRecognizerTest, ConfiguringLeavesWhatTheHostHasSet)
{
    door->configured = 5;

    recognizer.Configure();

    EXPECT_EQ(door->configured, 5);
}

TEST_F(EdgeRecognizerTest, GivesNamePlaceAndScoreInTheOrderOfTheTargets)
{
    recognizer.Configure();

    EXPECT_EQ(recognizer.Recognize(ImageOf(scene)), 3);

    ASSERT_EQ(recognizer.results.count, 3);
    RecognizerResult* first = ResultAt(recognizer, 0);
    RecognizerResult* second = ResultAt(recognizer, 1);
    RecognizerResult* third = ResultAt(recognizer, 2);
    EXPECT_STREQ(first->name, "door");
    EXPECT_EQ(first->target, door.get());
    EXPECT_EQ(first->x, 200);
    EXPECT_EQ(first->y, 150);
    EXPECT_EQ(first->width, 160);
    EXPECT_EQ(first->height, 121);
    EXPECT_NEAR(first->score, 1.0, 1e-9);
    EXPECT_STREQ(second->name, "door");
    EXPECT_NEAR(second->x, 300, 2);
    EXPECT_NEAR(second->y, 50, 2);
    EXPECT_NEAR(second->width, 80, 2);
    EXPECT_GE(first->score, second->score);
    EXPECT_STREQ(third->name, "gate");
    EXPECT_EQ(third->target, gate.get());
    EXPECT_EQ(third->x, 20);
    EXPECT_EQ(third->y, 30);
}

TEST_F(EdgeRecognizerTest, LooksForConfiguredTargetsOnly)
{
    recognizer.Configure();
    door->configured = -1;

    EXPECT_EQ(recognizer.Recognize(ImageOf(scene)), 1);

    EXPECT_STREQ(ResultAt(recognizer, 0)->name, "gate");
}

TEST_F(EdgeRecognizerTest, PassesOverATargetThatLostItsPicture)
{
    recognizer.Configure();
    delete door->picture;
    door->picture = nullptr;

    EXPECT_EQ(recognizer.Recognize(ImageOf(scene)), 1);

    EXPECT_EQ(recognizer.Configured(), 1);
}

TEST_F(EdgeRecognizerTest, ASecondRunReplacesTheResults)
{
    recognizer.Configure();
    recognizer.Recognize(ImageOf(scene));

    EXPECT_EQ(recognizer.Recognize(ImageOf(Plain(400, 300, 9))), 0);

    EXPECT_EQ(recognizer.results.count, 0);
}

TEST_F(EdgeRecognizerTest, TheThresholdIsTheLeastScore)
{
    recognizer.Configure();
    EXPECT_EQ(recognizer.threshold, 0.75);
    recognizer.threshold = 0.99999;

    EXPECT_EQ(recognizer.Recognize(ImageOf(scene)), 2);
    recognizer.threshold = 1.5;
    EXPECT_EQ(recognizer.Recognize(ImageOf(scene)), 0);
}

TEST_F(EdgeRecognizerTest, FramesWithoutRoomShowNothing)
{
    recognizer.Configure();

    for (auto [width, height] :
         {std::pair{0, 0}, {0, 300}, {400, 0}, {1, 1}, {79, 300}, {400, 60}})
        EXPECT_EQ(recognizer.Recognize(ZtImageSGI(width, height, nullptr)), 0)
            << width << " x " << height;
}

TEST_F(EdgeRecognizerTest, WithoutTargetsThereAreNoResults)
{
    EdgeRecognizer empty;

    EXPECT_EQ(empty.Configure(), 1);
    EXPECT_EQ(empty.Recognize(ImageOf(scene)), 0);
}

TEST_F(EdgeRecognizerTest, AnswersAsAPictureRecognizer)
{
    EXPECT_EQ(PictureRecognizer::From(&recognizer), &recognizer);
    EXPECT_EQ(recognizer.IdMatches(), 0);
}

TEST_F(EdgeRecognizerTest, WithoutMemoryForAFrameItSaysSo)
{
    recognizer.Configure();
    ZtImageSGI frame = ImageOf(scene);
    // What a report itself takes is made ready by the first one.
    recognizer.Recognize(frame);
    ErrorTrap reports;
    ZtError("first\n");
    reports.Clear();

    int count = 0;
    {
        FailingMemory memory(0, 1);
        count = recognizer.Recognize(frame);
    }

    EXPECT_EQ(count, 0);
    EXPECT_EQ(recognizer.results.count, 0);
    EXPECT_EQ(reports.Text(),
              "Error: edge: no memory for a frame of 400 x 300 pixels\n");
    EXPECT_EQ(recognizer.Recognize(frame), 3);
}

TEST_F(EdgeRecognizerTest, ARunThatFailsHalfWayHasNoResults)
{
    recognizer.Configure();
    ZtImageSGI frame = ImageOf(scene);
    ErrorTrap reports;
    int failures = 0;
    for (long spared = 1;; spared += spared / 4 + 1) {
        reports.Clear();
        bool failed = false;
        int count = 0;
        {
            FailingMemory memory(spared, 1);
            count = recognizer.Recognize(frame);
            failed = FailingMemory::Failed();
        }
        EXPECT_EQ(count, failed ? 0 : 3) << spared;
        EXPECT_EQ(recognizer.results.count, count);
        EXPECT_EQ(reports.reports.size(), failed ? 1U : 0U) << spared;
        if (!failed)
            break;
        ++failures;
    }
    EXPECT_GT(failures, 20);
}

TEST_F(EdgeRecognizerTest, WithoutMemoryForATargetItSaysSo)
{
    ErrorTrap reports;
    ZtError("first\n");
    reports.Clear();

    int configured = 1;
    {
        FailingMemory memory(0, 1);
        configured = recognizer.Configure();
    }

    EXPECT_EQ(configured, 0);
    EXPECT_EQ(reports.Text(),
              "Error: edge: no memory to look at the targets\n");
    EXPECT_EQ(recognizer.Configure(), 1);
}

} // namespace
