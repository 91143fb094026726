// The pictures that come with the library are what their README says, and
// load.

#include <ZT/image_sgi.h>

#include <filesystem>
#include <fstream>
#include <iterator>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_header.h"
#include "platform/files.h"

namespace {

struct Example
{
    const char* name;
    int width;
    int height;
    int channels;
    bool run_length;
};

constexpr Example examples[] = {
    {"hills.rgb", 160, 120, 3, true},  {"discs.sgi", 120, 120, 4, true},
    {"plasma.rgb", 96, 72, 3, false},  {"weave.rgb", 160, 120, 3, true},
    {"words.sgi", 182, 48, 1, true},   {"ramp.sgi", 160, 120, 1, false},
    {"checker.sgi", 96, 72, 3, false},
};

std::string PathOf(const Example& example)
{
    return std::string(ZT_EXAMPLE_PICTURES "/") + example.name;
}

TEST(example_pictures, TheirHeadersAreWhatTheReadmeSays)
{
    for (const Example& example : examples) {
        zt_platform::InputFile file(PathOf(example).c_str());
        zt_image::SgiHeader header = zt_image::read_sgi_header(file);

        EXPECT_EQ(header.imagic, zt_image::sgi_magic) << example.name;
        EXPECT_EQ(header.xsize, example.width) << example.name;
        EXPECT_EQ(header.ysize, example.height) << example.name;
        EXPECT_EQ(header.zsize, example.channels) << example.name;
        EXPECT_EQ(header.is_run_length(), example.run_length) << example.name;
        EXPECT_LE(file.size(), 30000u) << example.name;
    }
}

TEST(example_pictures, TheyLoadAsAPlainReaderReadsThem)
{
    for (const Example& example : examples) {
        std::ifstream in(PathOf(example), std::ios::binary);
        const std::string bytes{std::istreambuf_iterator<char>(in), {}};

        ZtImageSGI image(PathOf(example).c_str(), 3);

        EXPECT_EQ(PixelsOf(image),
                  literal::Reversed(literal::ReadSgi(bytes).pixels))
            << example.name;
    }
}

TEST(example_pictures, ThereAreNoOthers)
{
    std::size_t others = 0;
    for ([[maybe_unused]] const auto& entry :
         std::filesystem::directory_iterator(ZT_EXAMPLE_PICTURES))
        ++others;

    EXPECT_EQ(others, std::size(examples) + 1) << "and the README";
}

TEST(example_pictures, SomeOfTheirPixelsAreKnown)
{
    ZtImageSGI words((ZT_EXAMPLE_PICTURES "/words.sgi"), 3);
    ZtImageSGI discs((ZT_EXAMPLE_PICTURES "/discs.sgi"), 3);
    ZtImageSGI checker((ZT_EXAMPLE_PICTURES "/checker.sgi"), 3);

    // White paper; nothing beside the discs; the corner of the board.
    EXPECT_EQ(words.pixels[0], 0xFFFFFFFFu);
    EXPECT_EQ(discs.pixels[0] & 0xFF, 0u);
    EXPECT_EQ(checker.pixels[0], 0x4D331AFFu);
}

} // namespace
