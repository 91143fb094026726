// The plug-in as a host uses it: found, loaded, fetched, cast and run.

#include "picture_recognizer.h"

#include <dlfcn.h>
#include <filesystem>
#include <memory>

#include <gtest/gtest.h>

#include "plugins/grey_pictures.h"

namespace {

class EdgePlugin : public testing::Test
{
protected:
    EdgePlugin() { catalog.ScanDirectory(EDGE_DIRECTORY); }

    KvoRecognizerCatalog catalog;
};

TEST_F(EdgePlugin, IsFoundUnderItsName)
{
    EXPECT_STREQ(catalog.HeadKey(), "edge");
    EXPECT_EQ(catalog.NextKey(), nullptr);
    EXPECT_STREQ(catalog.FindPlugPath("edge"), EDGE_DIRECTORY);
    EXPECT_TRUE(std::filesystem::exists(EDGE_DIRECTORY "/edge.r.so"));
}

TEST_F(EdgePlugin, StaysWhatItIsWhenItIsScannedAgain)
{
    catalog.ScanDirectory(EDGE_DIRECTORY);

    EXPECT_STREQ(catalog.HeadKey(), "edge");
    EXPECT_EQ(catalog.NextKey(), nullptr);
}

TEST(edge_plugin, IsUnloadedWithItsCatalog)
{
    const char* const file = EDGE_DIRECTORY "/edge.r.so";
    {
        KvoRecognizerCatalog catalog;
        catalog.ScanDirectory(EDGE_DIRECTORY);
        std::unique_ptr<KvoRecognizer> edge(catalog.FetchRecognizer("edge"));
        ASSERT_NE(edge, nullptr);
        edge.reset();
        void* const loaded = dlopen(file, RTLD_LAZY | RTLD_NOLOAD);
        ASSERT_NE(loaded, nullptr);
        dlclose(loaded);
    }
    EXPECT_EQ(dlopen(file, RTLD_LAZY | RTLD_NOLOAD), nullptr);
}

TEST_F(EdgePlugin, HasItsHelpBesideIt)
{
    EXPECT_STREQ(catalog.FindPlugHelpFilename("edge", "txt"),
                 EDGE_DIRECTORY "/Help/edge.r.txt");
}

TEST_F(EdgePlugin, FindsThePictureOfATargetInAFrame)
{
    std::unique_ptr<KvoRecognizer> fetched(catalog.FetchRecognizer("edge"));
    PictureRecognizer* recognizer = PictureRecognizer::From(fetched.get());
    ASSERT_NE(recognizer, nullptr);
    KvoRecognizerTarget hills("hills");
    KvoRecognizerTarget words("words");
    hills.LoadPicture(ZT_TREE "/examples/pictures", "hills.rgb");
    words.LoadPicture(ZT_TREE "/examples/pictures", "words.sgi");
    ASSERT_NE(hills.picture, nullptr);
    recognizer->targets.PushTail(&hills);
    recognizer->targets.PushTail(&words);
    edge::Grey scene = Blobs(400, 300, 3);
    Paste(scene, edge::GreyOf(*hills.picture), 123, 45);

    EXPECT_EQ(recognizer->Configured(), 0);
    EXPECT_EQ(recognizer->Configure(), 1);
    EXPECT_EQ(recognizer->Recognize(ImageOf(scene)), 1);

    RecognizerResult* result = RecognizerResult::From(recognizer->results[0]);
    ASSERT_NE(result, nullptr);
    EXPECT_STREQ(result->name, "hills");
    EXPECT_EQ(result->target, &hills);
    EXPECT_EQ(result->x, 123);
    EXPECT_EQ(result->y, 45);
    EXPECT_EQ(result->width, 160);
    EXPECT_EQ(result->height, 121);
    EXPECT_GT(result->score, 0.999);
    recognizer->Reset();
    EXPECT_EQ(recognizer->results.count, 0);
}

} // namespace
