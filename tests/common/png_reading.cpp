#include "common/png_reading.h"

#include <gtest/gtest.h>
#include <png.h>

std::uint32_t ReadPicture::At(int column, int row_from_top) const
{
    return pixels.at(static_cast<std::size_t>(row_from_top) *
                         static_cast<std::size_t>(width) +
                     static_cast<std::size_t>(column));
}

ReadPicture ReadPng(const std::string& name)
{
    png_image header = {};
    header.version = PNG_IMAGE_VERSION;
    EXPECT_TRUE(png_image_begin_read_from_file(&header, name.c_str()))
        << name << ": " << header.message;
    ReadPicture picture;
    picture.has_alpha = (header.format & PNG_FORMAT_FLAG_ALPHA) != 0;
    header.format = PNG_FORMAT_RGBA;
    std::vector<png_byte> bytes(PNG_IMAGE_SIZE(header));
    EXPECT_TRUE(
        png_image_finish_read(&header, nullptr, bytes.data(), 0, nullptr))
        << name << ": " << header.message;
    picture.width = static_cast<int>(header.width);
    picture.height = static_cast<int>(header.height);
    for (std::size_t i = 0; i + 3 < bytes.size(); i += 4)
        picture.pixels.push_back(
            static_cast<std::uint32_t>(bytes[i]) << 24 |
            static_cast<std::uint32_t>(bytes[i + 1]) << 16 |
            static_cast<std::uint32_t>(bytes[i + 2]) << 8 | bytes[i + 3]);
    return picture;
}
