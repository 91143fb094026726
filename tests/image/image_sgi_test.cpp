#include <ZT/image_sgi.h>

#include <climits>
#include <cstddef>
#include <type_traits>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "support/CapturedStderr.h"
#include "support/FaultyFiles.h"
#include "support/TempDir.h"

namespace {

static_assert(!std::is_polymorphic_v<ZtImageSGI>);
static_assert(offsetof(ZtImageSGI, width) < offsetof(ZtImageSGI, height));
static_assert(offsetof(ZtImageSGI, height) < offsetof(ZtImageSGI, pixels));

void ExpectEmpty(const ZtImageSGI& image)
{
    EXPECT_EQ(image.width, 0);
    EXPECT_EQ(image.height, 0);
    EXPECT_EQ(image.pixels, nullptr);
}

/// A picture of these pixels.
ZtImageSGI ImageOf(int width, int height, const PixelList& pixels)
{
    return ZtImageSGI(width, height, NewPixels(pixels));
}

/// One pixel of each channel, red 11, green 22, blue 33.
std::string SmallSgi()
{
    return SgiFile({.width = 1, .height = 1},
                   {.rows = {Bytes({1, 0x11, 0}), Bytes({1, 0x22, 0}),
                             Bytes({1, 0x33, 0})}});
}

std::string SmallPix()
{
    return Big16(1) + Big16(1) + Big16(0) + Big16(0) + Big16(24) +
           Bytes({1, 1, 2, 3});
}

TEST(image_sgi, AGivenBufferIsTaken)
{
    ZtPixel* pixels = NewPixels({1, 2, 3, 4, 5, 6});

    ZtImageSGI image(3, 2, pixels);

    EXPECT_EQ(image.width, 3);
    EXPECT_EQ(image.height, 2);
    EXPECT_EQ(image.pixels, pixels);
}

TEST(image_sgi, NoBufferIsAZeroedOne)
{
    ZtImageSGI image(3, 2, nullptr);

    EXPECT_EQ(image.width, 3);
    EXPECT_EQ(image.height, 2);
    EXPECT_EQ(PixelsOf(image), PixelList(6, 0));
}

TEST(image_sgi, SizesThatCannotBeAreEmpty)
{
    ExpectEmpty(ZtImageSGI(-1, 2, nullptr));
    ExpectEmpty(ZtImageSGI(2, -1, nullptr));
    ExpectEmpty(ZtImageSGI(INT_MAX, INT_MAX, nullptr));
}

TEST(image_sgi, AnSgiImageIsLoadedInObjectOrder)
{
    TempDir directory;
    std::string path = directory.Write("a", SmallSgi());

    ZtImageSGI image(path.c_str(), 0);

    EXPECT_EQ(image.width, 1);
    EXPECT_EQ(image.height, 1);
    EXPECT_EQ(PixelsOf(image), PixelList(1, 0x112233FF));
}

TEST(image_sgi, AVideoFrameIsLoadedInObjectOrder)
{
    TempDir directory;
    std::string path = directory.Write("a", "");

    ZtImageSGI image(path.c_str(), 1);

    EXPECT_EQ(image.width, 720);
    EXPECT_EQ(image.height, 486);
    EXPECT_EQ(PixelsOf(image), PixelList(720 * 486, 0x009A0000));
}

TEST(image_sgi, APixFileIsLoadedInObjectOrder)
{
    TempDir directory;
    std::string path = directory.Write("a", SmallPix());

    ZtImageSGI image(path.c_str(), 2);

    EXPECT_EQ(image.width, 1);
    EXPECT_EQ(image.height, 1);
    EXPECT_EQ(PixelsOf(image), PixelList(1, 0x030201FF));
}

/// Gives the type that is chosen for a name, told by what each reader makes of
/// a file that is both: it begins as an SGI image of 4 x 4.
int ChosenType(const std::string& name)
{
    TempDir directory;
    std::string path =
        directory.Write(name, SgiFile({}, {.rows = PlainRows({})}));
    ZtImageSGI image(path.c_str(), 3);
    return image.width == 4 ? 0 : image.width == 720 ? 1 : 2;
}

TEST(image_sgi, TheExtensionChoosesTheType)
{
    EXPECT_EQ(ChosenType("a.sgi"), 0);
    EXPECT_EQ(ChosenType("a.rgb"), 0);
    EXPECT_EQ(ChosenType("a.0012.rgb"), 0);
    EXPECT_EQ(ChosenType("a.yuv"), 1);
    EXPECT_EQ(ChosenType("a.qtl"), 1);
    EXPECT_EQ(ChosenType("a.pix"), 2);
    EXPECT_EQ(ChosenType("a"), 2);
    EXPECT_EQ(ChosenType("a.RGB"), 2);
    EXPECT_EQ(ChosenType("a.YUV"), 2);
    EXPECT_EQ(ChosenType("a.rgba"), 2);
    EXPECT_EQ(ChosenType("sgi"), 2);
}

TEST(image_sgi, AnyOtherExtensionIsAPixFile)
{
    TempDir directory;
    for (const char* name : {"a", "a.pix", "a.SGI", "a."}) {
        std::string path = directory.Write(name, SmallPix());

        ZtImageSGI image(path.c_str(), 3);

        EXPECT_EQ(PixelsOf(image), PixelList(1, 0x030201FF)) << name;
    }
}

TEST(image_sgi, AnyOtherTypeIsEmpty)
{
    TempDir directory;
    std::string path = directory.Write("a.rgb", SmallSgi());

    for (int type : {-1, 4, INT_MAX, INT_MIN})
        ExpectEmpty(ZtImageSGI(path.c_str(), type));
}

TEST(image_sgi, WhatCannotBeReadIsEmpty)
{
    TempDir directory;
    std::string none = directory.Path("none");
    std::string text = directory.Write("a", "no picture");
    std::string wide =
        directory.Write("b", SgiFile({.bytes_a_channel = 2}, {.rows = {}}));
    std::string bits = directory.Write("c", Big16(1) + Big16(1) + Big16(0) +
                                                Big16(0) + Big16(8));

    for (const std::string& path : {none, text, wide})
        ExpectEmpty(ZtImageSGI(path.c_str(), 0));
    for (const std::string& path : {none, text, bits})
        ExpectEmpty(ZtImageSGI(path.c_str(), 2));
    ExpectEmpty(ZtImageSGI(static_cast<const char*>(nullptr), 0));
    ExpectEmpty(ZtImageSGI(static_cast<const char*>(nullptr), 3));
}

TEST(image_sgi, APixFileThatIsTooWideIsEmpty)
{
    TempDir directory;
    std::string path = directory.Write("a", Big16(8193) + Big16(1) + Big16(0) +
                                                Big16(0) + Big16(24));

    ExpectEmpty(ZtImageSGI(path.c_str(), 2));
}

TEST(image_sgi, AVideoFrameThatCannotBeOpenedIsSaidAndAllZeros)
{
    TempDir directory;
    std::string path = directory.Path("none.yuv");
    CapturedStderr printed;

    ZtImageSGI image(path.c_str(), 3);

    EXPECT_EQ(printed.Text(), "Couldn't open yuv file [" + path + "]\n");
    EXPECT_EQ(image.width, 720);
    EXPECT_EQ(image.height, 486);
    EXPECT_EQ(PixelsOf(image), PixelList(720 * 486, 0));
}

TEST(image_sgi, ACopyDoesNotShareItsBuffer)
{
    ZtImageSGI image = ImageOf(2, 1, {1, 2});

    ZtImageSGI copy(image);
    image.pixels[0] = 9;

    EXPECT_EQ(copy.width, 2);
    EXPECT_EQ(copy.height, 1);
    EXPECT_NE(copy.pixels, image.pixels);
    EXPECT_EQ(PixelsOf(copy), (PixelList{1, 2}));
}

TEST(image_sgi, AnAssignedPictureDoesNotShareItsBuffer)
{
    ZtImageSGI image = ImageOf(2, 1, {1, 2});
    ZtImageSGI other = ImageOf(1, 3, {7, 8, 9});

    other = image;
    image.pixels[0] = 9;

    EXPECT_EQ(other.width, 2);
    EXPECT_EQ(other.height, 1);
    EXPECT_EQ(PixelsOf(other), (PixelList{1, 2}));
}

TEST(image_sgi, APictureMayBeAssignedToItself)
{
    ZtImageSGI image = ImageOf(2, 1, {1, 2});
    ZtImageSGI& same = image;

    image = same;

    EXPECT_EQ(PixelsOf(image), (PixelList{1, 2}));
}

TEST(image_sgi, AnEmptyPictureIsCopiedAndAssigned)
{
    ZtImageSGI empty("/nowhere/a", 0);
    ZtImageSGI image = ImageOf(2, 1, {1, 2});

    ExpectEmpty(ZtImageSGI(empty));
    image = empty;

    ExpectEmpty(image);
}

TEST(image_sgi, StoreWritesThreeChannelsAndLeavesThePicture)
{
    TempDir directory;
    PixelList pixels = {0x11223344, 0x55667788};
    ZtImageSGI image = ImageOf(2, 1, pixels);

    image.Store(directory.Path("a").c_str());

    EXPECT_EQ(directory.Read("a"),
              literal::WriteSgi(literal::Reversed(pixels), 2, 1, 3));
    EXPECT_EQ(PixelsOf(image), pixels);
}

TEST(image_sgi, WhatIsStoredIsLoadedButForAlpha)
{
    TempDir directory;
    std::string path = directory.Path("a.sgi");
    std::mt19937 random(21);
    PixelList pixels = RandomPicture(random, 37, 11, Texture::Runs);

    ImageOf(37, 11, pixels).Store(path.c_str());
    ZtImageSGI image(path.c_str(), 3);

    for (ZtPixel& pixel : pixels)
        pixel |= 0xFF;
    EXPECT_EQ(PixelsOf(image), pixels);
}

TEST(image_sgi, AStoreThatFailsSaysNothingAndChangesNothing)
{
    ZtImageSGI image = ImageOf(1, 1, {0x11223344});
    ZtImageSGI empty("/nowhere/a", 0);
    CapturedStderr printed;

    image.Store("/nowhere/a");
    image.Store(nullptr);
    image.Store("/dev/full");
    empty.Store("/nowhere/a");

    EXPECT_EQ(printed.Text(), "");
    EXPECT_EQ(PixelsOf(image), PixelList(1, 0x11223344));
}

TEST(image_sgi, ResizeTakesTheNearestPixelsAndKeepsAllChannels)
{
    ZtImageSGI image = ImageOf(2, 1, {0x11223344, 0x55667788});

    image.Resize(4, 2);

    EXPECT_EQ(image.width, 4);
    EXPECT_EQ(image.height, 2);
    EXPECT_EQ(PixelsOf(image),
              (PixelList{0x11223344, 0x11223344, 0x55667788, 0x55667788,
                         0x11223344, 0x11223344, 0x55667788, 0x55667788}));
}

TEST(image_sgi, ResizeToLessThanOneIsOne)
{
    ZtImageSGI image = ImageOf(2, 2, {1, 2, 3, 4});

    image.Resize(0, 0);
    EXPECT_EQ(image.width, 1);
    EXPECT_EQ(image.height, 1);
    EXPECT_EQ(PixelsOf(image), PixelList(1, 4));

    image.Resize(-5, 2);
    EXPECT_EQ(image.width, 1);
    EXPECT_EQ(image.height, 2);
}

TEST(image_sgi, ResizeOfAnEmptyPictureDoesNothing)
{
    ZtImageSGI image("/nowhere/a", 0);

    image.Resize(3, 3);

    ExpectEmpty(image);
}

TEST(image_sgi, ResizeAgreesWithAPlainZoom)
{
    std::mt19937 random(22);
    PixelList pixels = RandomPicture(random, 50, 40, Texture::Noise);
    ZtImageSGI image = ImageOf(50, 40, pixels);

    image.Resize(33, 77);

    EXPECT_EQ(PixelsOf(image), literal::Zoom(pixels, 50, 40, 33, 77));
}

TEST(image_sgi, ResizeBestClearsRed)
{
    ZtImageSGI image = ImageOf(2, 1, {0xFF102030, 0xFF102030});

    image.ResizeBest(1, 1);

    EXPECT_EQ(PixelsOf(image), PixelList(1, 0x00102030));
}

TEST(image_sgi, ResizeBestToTheSameSizeKeepsAllButRed)
{
    std::mt19937 random(23);
    PixelList pixels = RandomPicture(random, 31, 17, Texture::Noise);
    ZtImageSGI image = ImageOf(31, 17, pixels);

    image.ResizeBest(31, 17);

    for (ZtPixel& pixel : pixels)
        pixel &= 0x00FFFFFF;
    EXPECT_EQ(PixelsOf(image), pixels);
}

TEST(image_sgi, ResizeBestAgreesWithAPlainScaler)
{
    std::mt19937 random(24);
    PixelList pixels = RandomPicture(random, 50, 40, Texture::Ramp);
    ZtImageSGI image = ImageOf(50, 40, pixels);

    image.ResizeBest(160, 121);

    EXPECT_EQ(image.width, 160);
    EXPECT_EQ(image.height, 121);
    EXPECT_EQ(PixelsOf(image), literal::Fant(pixels, 50, 40, 160, 121));
}

TEST(image_sgi, ResizeBestToLessThanOneIsOne)
{
    ZtImageSGI image = ImageOf(2, 2, {4, 4, 4, 4});

    image.ResizeBest(0, -3);

    EXPECT_EQ(image.width, 1);
    EXPECT_EQ(image.height, 1);
    EXPECT_EQ(PixelsOf(image), PixelList(1, 4));
}

TEST(image_sgi, ResizeBestOfAnEmptyPictureMakesABlackOne)
{
    ZtImageSGI image("/nowhere/a", 0);

    image.ResizeBest(3, 2);

    EXPECT_EQ(image.width, 3);
    EXPECT_EQ(image.height, 2);
    EXPECT_EQ(PixelsOf(image), PixelList(6, 0));
}

TEST(image_sgi, APictureWithoutAreaMayBeScaledAndStored)
{
    TempDir directory;
    std::string path =
        directory.Write("a", SgiHeaderBytes({.width = 0, .height = 4}));
    ZtImageSGI image(path.c_str(), 0);
    EXPECT_NE(image.pixels, nullptr);
    EXPECT_EQ(image.width, 0);
    EXPECT_EQ(image.height, 4);

    ZtImageSGI copy(image);
    image.Store(directory.Path("b").c_str());
    copy.ResizeBest(1, 2);
    image.Resize(2, 1);

    EXPECT_EQ(PixelsOf(copy), PixelList(2, 0));
    EXPECT_EQ(PixelsOf(image), PixelList(2, 0));
}

TEST(image_sgi, ReadingStopsWithAFaultAndGivesWhatWasRead)
{
    TempDir directory;
    std::string path = directory.Write("a.rgb", SmallSgi());
    FaultyFiles files;
    files.read_ends = 512;

    ZtImageSGI image(path.c_str(), 3);

    EXPECT_EQ(PixelsOf(image), PixelList(1, 0x000000FF));
}

} // namespace
