// Pictures written by us and read by other programs, and the other way round,
// channel for channel: ImageMagick, netpbm and OpenImageIO.
//
// What is exchanged with them besides SGI images are grey PNM files, one for
// each channel, top row first.

#include <ZT/image_sgi.h>

#include <cctype>
#include <cstdlib>
#include <fstream>
#include <sstream>

#include <gtest/gtest.h>

#include "image/pictures.h"
#include "image/sgi_header.h"
#include "image/sgi_rows.h"
#include "platform/files.h"
#include "support/TempDir.h"

namespace {

constexpr int width = 61;
constexpr int height = 33;
constexpr std::size_t pixel_count = width * height;

/// One channel of a picture, top row first.
using Plane = std::string;

void Shell(const std::string& command)
{
    // What they say is of no interest, as long as they are content.
    std::string quiet = "exec 2>/dev/null; " + command;
    ASSERT_EQ(std::system(quiet.c_str()), 0) << command;
}

Plane PlaneOf(const PixelList& pixels, int channel)
{
    Plane plane;
    for (int y = height - 1; y >= 0; --y)
        for (int x = 0; x < width; ++x)
            plane += static_cast<char>(
                pixels[static_cast<std::size_t>(y * width + x)] >> 8 * channel);
    return plane;
}

/// Makes the picture in codec order that these planes are loaded as.
PixelList Loaded(const std::vector<Plane>& planes)
{
    PixelList pixels;
    for (int y = height - 1; y >= 0; --y)
        for (int x = 0; x < width; ++x) {
            auto value = [&](std::size_t channel) -> ZtPixel {
                return static_cast<unsigned char>(
                    planes[channel][static_cast<std::size_t>(y * width + x)]);
            };
            ZtPixel alpha = planes.size() == 4 ? value(3) : 0xFF;
            if (planes.size() < 3)
                pixels.push_back(0xFF000000 + value(0) * 0x010101);
            else
                pixels.push_back(alpha << 24 | value(2) << 16 | value(1) << 8 |
                                 value(0));
        }
    return pixels;
}

std::string Pgm(const Plane& plane)
{
    return "P5\n" + std::to_string(width) + " " + std::to_string(height) +
           "\n255\n" + plane;
}

/// Reads a grey or colour PNM file of our size; colours become three planes.
std::vector<Plane> ReadPnm(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::string kind;
    int columns = 0;
    int rows = 0;
    int largest = 0;
    in >> kind >> columns >> rows >> largest;
    in.get();
    EXPECT_TRUE(kind == "P5" || kind == "P6") << kind;
    EXPECT_EQ(columns, width);
    EXPECT_EQ(rows, height);
    EXPECT_EQ(largest, 255);
    std::vector<Plane> planes(kind == "P6" ? 3 : 1);
    for (std::size_t i = 0; i < pixel_count; ++i)
        for (Plane& plane : planes)
            plane += static_cast<char>(in.get());
    EXPECT_TRUE(in.good()) << path;
    return planes;
}

/// Runs, gradients and noise, the same each time.
PixelList TestPicture(Texture texture)
{
    std::mt19937 random(26);
    return RandomPicture(random, width, height, texture);
}

constexpr Texture all_textures[] = {Texture::Noise, Texture::Runs,
                                    Texture::FewColors, Texture::Ramp};

class PicturePartners : public testing::Test
{
protected:
    /// Writes a picture as an SGI image of ours.
    void WriteOurs(const PixelList& pixels, int channels)
    {
        ASSERT_EQ(
            longstoimage(pixels.data(), width, height, channels, ours.c_str()),
            1);
    }

    /// Writes the channels of a picture for a partner to read.
    void WritePlanes(const std::vector<Plane>& planes)
    {
        for (std::size_t i = 0; i < planes.size(); ++i)
            directory.Write(std::to_string(i) + ".pgm", Pgm(planes[i]));
    }

    std::string PlanePath(std::size_t channel)
    {
        return directory.Path(std::to_string(channel) + ".pgm");
    }

    /// Gives the paths of the first planes, blanks between them.
    std::string PlanePaths(std::size_t count)
    {
        std::string paths;
        for (std::size_t i = 0; i < count; ++i)
            paths += PlanePath(i) + " ";
        return paths;
    }

    TempDir directory;
    const std::string ours = directory.Path("ours.sgi");
    const std::string theirs = directory.Path("theirs.sgi");
    const std::string answer = directory.Path("answer.pnm");
};

std::vector<Plane> FirstPlanes(const PixelList& pixels, int channels)
{
    std::vector<Plane> planes;
    for (int channel = 0; channel < channels; ++channel)
        planes.push_back(PlaneOf(pixels, channel));
    return planes;
}

/// A picture whose red, green and blue are equal, so that its luminance is
/// they.
PixelList Grey(PixelList pixels)
{
    for (ZtPixel& pixel : pixels)
        pixel = (pixel & 0xFF) * 0x010101;
    return pixels;
}

TEST_F(PicturePartners, ImageMagickReadsOurs)
{
    for (Texture texture : all_textures) {
        PixelList pixels = TestPicture(texture);
        for (int channels : {3, 4}) {
            WriteOurs(pixels, channels);
            Shell(ZT_CONVERT " " + ours + " -alpha off -depth 8 ppm:" + answer);
            EXPECT_EQ(ReadPnm(answer), FirstPlanes(pixels, 3));
        }
        Shell(ZT_CONVERT " " + ours + " -alpha extract -depth 8 pgm:" + answer);
        EXPECT_EQ(ReadPnm(answer)[0], PlaneOf(pixels, 3));

        WriteOurs(Grey(pixels), 1);
        Shell(ZT_CONVERT " " + ours + " -depth 8 pgm:" + answer);
        EXPECT_EQ(ReadPnm(answer)[0], PlaneOf(pixels, 0));
    }
}

TEST_F(PicturePartners, WeReadImageMagicks)
{
    for (Texture texture : all_textures)
        for (const char* storage : {"RLE", "None"}) {
            PixelList pixels = TestPicture(texture);
            std::string write = " -depth 8 -compress " + std::string(storage) +
                                " sgi:" + theirs;
            WritePlanes(FirstPlanes(pixels, 4));

            Shell(ZT_CONVERT " " + PlanePaths(4) +
                  "-set colorspace sRGB -channel RGBA -combine" + write);
            EXPECT_EQ(LoadSgi(theirs), Loaded(FirstPlanes(pixels, 4)));

            Shell(ZT_CONVERT " " + PlanePaths(3) +
                  "-set colorspace sRGB -channel RGB -combine -type TrueColor" +
                  write);
            EXPECT_EQ(LoadSgi(theirs), Loaded(FirstPlanes(pixels, 3)));

            Shell(ZT_CONVERT " " + PlanePath(0) + write);
            EXPECT_EQ(LoadSgi(theirs), Loaded(FirstPlanes(pixels, 1)));
        }
}

TEST_F(PicturePartners, NetpbmReadsOurs)
{
    for (Texture texture : all_textures) {
        PixelList pixels = TestPicture(texture);
        WriteOurs(pixels, 4);
        for (int channel = 0; channel < 4; ++channel) {
            Shell(ZT_SGITOPNM " -channel " + std::to_string(channel) + " " +
                  ours + " >" + answer);
            EXPECT_EQ(ReadPnm(answer)[0], PlaneOf(pixels, channel));
        }

        WriteOurs(pixels, 3);
        Shell(ZT_SGITOPNM " " + ours + " >" + answer);
        EXPECT_EQ(ReadPnm(answer), FirstPlanes(pixels, 3));

        WriteOurs(Grey(pixels), 1);
        Shell(ZT_SGITOPNM " " + ours + " >" + answer);
        EXPECT_EQ(ReadPnm(answer)[0], PlaneOf(pixels, 0));
    }
}

/// Writes a colour PNM file.
std::string Ppm(const std::vector<Plane>& planes)
{
    std::string bytes = "P6\n" + std::to_string(width) + " " +
                        std::to_string(height) + "\n255\n";
    for (std::size_t i = 0; i < pixel_count; ++i)
        for (const Plane& plane : planes)
            bytes += plane[i];
    return bytes;
}

TEST_F(PicturePartners, WeReadNetpbms)
{
    for (Texture texture : all_textures)
        for (const char* storage : {" -rle ", " -verbatim "}) {
            PixelList pixels = TestPicture(texture);
            std::vector<Plane> planes = FirstPlanes(pixels, 3);
            std::string color = directory.Write("c.ppm", Ppm(planes));
            std::string grey = directory.Write("g.pgm", Pgm(planes[0]));

            Shell(ZT_PNMTOSGI + (storage + color) + " >" + theirs);
            EXPECT_EQ(LoadSgi(theirs), Loaded(planes));

            Shell(ZT_PNMTOSGI + (storage + grey) + " >" + theirs);
            EXPECT_EQ(LoadSgi(theirs), Loaded({planes[0]}));
        }
}

TEST_F(PicturePartners, NetpbmsRunLengthRowsLieChannelByChannel)
{
    std::string color = directory.Write(
        "c.ppm", Ppm(FirstPlanes(TestPicture(Texture::Runs), 3)));
    Shell(ZT_PNMTOSGI " -rle " + color + " >" + theirs);

    zt_platform::InputFile file(theirs.c_str());
    zt_image::SgiHeader header = zt_image::read_sgi_header(file);
    zt_image::SgiRowTable table;
    ASSERT_TRUE(table.read(file, header));

    EXPECT_TRUE(header.is_run_length());
    EXPECT_FALSE(table.in_order());
}

TEST_F(PicturePartners, OpenImageIoReadsOurs)
{
    PixelList pixels = TestPicture(Texture::Runs);
    for (int channels : {2, 3, 4}) {
        WriteOurs(pixels, channels);
        for (int channel = 0; channel < channels; ++channel) {
            Shell(ZT_OIIOTOOL " " + ours + " --ch " + std::to_string(channel) +
                  " --chnames Y -d uint8 -o " + directory.Path("answer.pgm"));
            EXPECT_EQ(ReadPnm(directory.Path("answer.pgm"))[0],
                      PlaneOf(pixels, channel));
        }
    }

    WriteOurs(Grey(pixels), 1);
    Shell(ZT_OIIOTOOL " " + ours + " -d uint8 -o " +
          directory.Path("answer.pgm"));
    EXPECT_EQ(ReadPnm(directory.Path("answer.pgm"))[0], PlaneOf(pixels, 0));
}

TEST_F(PicturePartners, WeReadOpenImageIos)
{
    PixelList pixels = TestPicture(Texture::Noise);
    WritePlanes(FirstPlanes(pixels, 4));
    const char* names[] = {"Y", "Y,A", "R,G,B", "R,G,B,A"};
    for (std::size_t channels = 1; channels <= 4; ++channels) {
        std::string command = ZT_OIIOTOOL " " + PlanePath(0);
        for (std::size_t i = 1; i < channels; ++i)
            command += " " + PlanePath(i) + " --chappend";

        Shell(command + " --chnames " + names[channels - 1] + " -d uint8 -o " +
              theirs);

        EXPECT_EQ(LoadSgi(theirs),
                  Loaded(FirstPlanes(pixels, static_cast<int>(channels))));
    }
}

// ImageMagick's writer makes the same packets as ours: an independent oracle.
TEST_F(PicturePartners, OurRowsAreThoseOfImageMagick)
{
    for (Texture texture : all_textures) {
        PixelList pixels = TestPicture(texture);
        WritePlanes(FirstPlanes(pixels, 3));
        WriteOurs(pixels, 3);

        Shell(ZT_CONVERT " " + PlanePaths(3) +
              "-set colorspace sRGB -channel RGB -combine -type TrueColor"
              " -depth 8 -compress RLE sgi:" +
              theirs);

        EXPECT_EQ(directory.Read("ours.sgi").substr(512),
                  directory.Read("theirs.sgi").substr(512));
    }
}

} // namespace
