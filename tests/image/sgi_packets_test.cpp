#include "image/sgi_packets.h"

#include <random>

#include <gtest/gtest.h>

#include "image/literal_codec.h"
#include "image/pictures.h"
#include "image/sgi_bytes.h"
#include "image/sgi_header.h"
#include "platform/pixel_lanes.h"

namespace {

std::string Compressed(const std::string& values)
{
    std::vector<unsigned char> out(zt_image::most_packet_bytes(values.size()) +
                                   zt_image::packet_slack);
    std::string padded = values + Fill(zt_image::packet_slack, 0x55);
    unsigned char* end = zt_image::compress_row(
        reinterpret_cast<const unsigned char*>(padded.data()), values.size(),
        out.data());
    return std::string(out.data(), end);
}

/// Expands packets that are to fill a row exactly.
bool ExpandsExactly(const std::string& packets, std::string& values)
{
    using zt_platform::PixelLanes;
    std::string padded = packets + Fill(PixelLanes::packet_slack, 0x55);
    std::string out = Fill(values.size() + PixelLanes::packet_slack, 0xAA);
    auto* begin = reinterpret_cast<const unsigned char*>(padded.data());
    auto* to = reinterpret_cast<unsigned char*>(out.data());
    const zt_platform::PackedRow rows[4] = {
        {begin, begin + packets.size(), to, to + values.size()}, {}, {}, {}};
    bool exact = true;
    for (PixelLanes::Packets guess :
         {PixelLanes::Packets::Short, PixelLanes::Packets::Long}) {
        exact = PixelLanes::current().unpack(rows, guess, {});
        if (!exact)
            break;
        values = out.substr(0, values.size());
    }
    return exact;
}

std::string Expanded(const std::string& packets, std::size_t width)
{
    std::string values(width, '\0');
    EXPECT_TRUE(ExpandsExactly(packets, values));
    return values;
}

TEST(sgi_packets, OnePixelIsARepeatOfOne)
{
    EXPECT_EQ(Compressed("v"), Bytes({0x01, 'v', 0x00}));
}

TEST(sgi_packets, NoPixelIsAClosingZero)
{
    EXPECT_EQ(Compressed(""), Bytes({0x00}));
}

TEST(sgi_packets, ARunOf127IsWrittenAs126And1)
{
    EXPECT_EQ(Compressed(Fill(126, 'v')), Bytes({0x7E, 'v', 0x00}));
    EXPECT_EQ(Compressed(Fill(127, 'v')), Bytes({0x7E, 'v', 0x01, 'v', 0x00}));
}

TEST(sgi_packets, ARowWithoutARunEndsWithARepeatOfItsLastPixels)
{
    EXPECT_EQ(Compressed("ab"), Bytes({0x01, 'a', 0x01, 'b', 0x00}));
    EXPECT_EQ(Compressed("abcc"), Bytes({0x82, 'a', 'b', 0x02, 'c', 0x00}));
    EXPECT_EQ(Compressed("abcd"),
              Bytes({0x82, 'a', 'b', 0x01, 'c', 0x01, 'd', 0x00}));
}

TEST(sgi_packets, ALiteralStopsBeforeTheFirstThreeEqualPixels)
{
    EXPECT_EQ(Compressed("abbb"), Bytes({0x81, 'a', 0x03, 'b', 0x00}));
    EXPECT_EQ(Compressed("abbaaa"),
              Bytes({0x83, 'a', 'b', 'b', 0x03, 'a', 0x00}));
}

TEST(sgi_packets, ARunIsFollowedByWhateverComes)
{
    EXPECT_EQ(Compressed("aaab"), Bytes({0x03, 'a', 0x01, 'b', 0x00}));
    EXPECT_EQ(Compressed("abb"), Bytes({0x81, 'a', 0x02, 'b', 0x00}));
}

TEST(sgi_packets, ALiteralHasAtMost126Pixels)
{
    std::string values;
    for (int i = 0; i < 129; ++i)
        values += static_cast<char>(i);

    std::string packets = Compressed(values);

    EXPECT_EQ(packets, Bytes({0xFE}) + values.substr(0, 126) + Bytes({0x81}) +
                           values.substr(126, 1) +
                           Bytes({0x01, 127, 0x01, 128, 0x00}));
}

TEST(sgi_packets, EveryShortRowOfThreeValuesRoundTrips)
{
    for (std::size_t width = 1; width <= 9; ++width)
        for (int number = 0; number < 19683; ++number) {
            std::string values;
            for (int rest = number; values.size() < width; rest /= 3)
                values += static_cast<char>('a' + rest % 3);

            std::string packets = Compressed(values);

            ASSERT_EQ(packets, literal::CompressRow(values)) << values;
            ASSERT_EQ(Expanded(packets, width), values);
            ASSERT_LE(packets.size(), zt_image::row_bound(width));
        }
}

TEST(sgi_packets, RandomRowsAgreeWithAPlainCompressor)
{
    std::mt19937 random(1);
    for (int i = 0; i < 4000; ++i) {
        std::size_t width = random() % 700 + 1;
        std::size_t stay = random() % 140 + 1;
        std::string values;
        char value = 0;
        while (values.size() < width) {
            if (random() % stay == 0)
                value = static_cast<char>(random() % 3);
            values += value;
        }

        std::string packets = Compressed(values);

        ASSERT_EQ(packets, literal::CompressRow(values)) << i;
        ASSERT_EQ(Expanded(packets, width), values) << i;
        ASSERT_LE(packets.size(), zt_image::row_bound(width));
    }
}

// The writer ends the process for a row over the bound; that no row is, the
// widest and the least compressible ones show.
TEST(sgi_packets, WideRowsStayWithinTheirBound)
{
    std::string count;
    std::string nearly;
    for (int i = 0; i < 65535; ++i) {
        count += static_cast<char>(i % 256);
        nearly += static_cast<char>(i % 129 < 126 ? i : 7);
    }

    EXPECT_LE(Compressed(count).size(), zt_image::row_bound(65535));
    EXPECT_LE(Compressed(nearly).size(), zt_image::row_bound(65535));
    EXPECT_EQ(Expanded(Compressed(nearly), nearly.size()), nearly);
}

TEST(sgi_packets, AnExactRowNeedsNoClosingZero)
{
    EXPECT_EQ(Expanded(Bytes({0x02, 'a', 0x81, 'b'}), 3), "aab");
}

TEST(sgi_packets, ARowOfAnotherLengthIsNotExact)
{
    std::string values = "....";
    EXPECT_FALSE(ExpandsExactly(Bytes({0x03, 'a', 0x00}), values));
    EXPECT_FALSE(ExpandsExactly(Bytes({0x05, 'a', 0x00}), values));
    EXPECT_FALSE(ExpandsExactly(Bytes({0x84, 'a', 'b', 'c'}), values));
    EXPECT_FALSE(ExpandsExactly(Bytes({0x04}), values));
    EXPECT_FALSE(ExpandsExactly("", values));
    EXPECT_FALSE(ExpandsExactly(Bytes({0x04, 'a', 0x01, 'b'}), values));
}

TEST(sgi_packets, PacketsOf127PixelsAreRead)
{
    std::string literals = Fill(126, 'x') + "y";

    EXPECT_EQ(
        Expanded(Bytes({0xFF}) + literals + Bytes({0x7F, 'z', 0x00}), 254),
        literals + Fill(127, 'z'));
}

/// Expands packets into the green channel of pixels that are full of ones.
PixelList ExpandedGreen(const std::string& packets, std::size_t pixels)
{
    PixelList list(pixels, 0x11111111);
    auto* begin = reinterpret_cast<const unsigned char*>(packets.data());
    zt_image::expand_row(begin, begin + packets.size(), list.data(),
                         list.data() + list.size(), 8);
    return list;
}

TEST(sgi_packets, ARowOfAnyKindTouchesOneChannelOnly)
{
    EXPECT_EQ(ExpandedGreen(Bytes({0x01, 0x22, 0x81, 0x33, 0x00}), 3),
              (PixelList{0x11112211, 0x11113311, 0x11111111}));
}

TEST(sgi_packets, ARowOfAnyKindStopsAtTheLastPixel)
{
    EXPECT_EQ(ExpandedGreen(Bytes({0x7F, 0x22, 0x01, 0x33}), 2),
              (PixelList{0x11112211, 0x11112211}));
    EXPECT_EQ(ExpandedGreen(Bytes({0x83, 0x22, 0x33, 0x44}), 2),
              (PixelList{0x11112211, 0x11113311}));
}

TEST(sgi_packets, ARowOfAnyKindStopsAtItsLastByte)
{
    EXPECT_EQ(ExpandedGreen(Bytes({0x84, 0x22}), 2),
              (PixelList{0x11112211, 0x11111111}));
    EXPECT_EQ(ExpandedGreen(Bytes({0x04}), 2),
              (PixelList{0x11111111, 0x11111111}));
}

} // namespace
