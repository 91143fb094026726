#include "frame_file.h"

#include "common/opaque.h"
#include "common/png_file.h"
#include "frame_layout.h"

#include <cerrno>
#include <cstring>
#include <utility>
#include <vector>

#include <ZT/image_sgi.h>

namespace framestore {

namespace {

constexpr int raw_video = 1; ///< The library's number of that kind.

/// Gives the path of a frame without its extension; its number has at least
/// six digits, so that names sort.
std::string stem_of(const std::string& directory, int number)
{
    char digits[16];
    std::snprintf(digits, sizeof digits, number < 0 ? "%07d" : "%06d", number);
    return directory + "/frame." + digits;
}

/// Puts the lines of a whole frame in the order of the picture.
std::vector<char> interleaved(const std::vector<char>& stored)
{
    std::vector<char> shown(frame_bytes);
    for (int line = 0; line < lines; ++line)
        std::memcpy(shown.data() + static_cast<std::size_t>(line) * line_bytes,
                    stored.data() +
                        static_cast<std::size_t>(StoredLine(line)) * line_bytes,
                    line_bytes);
    return shown;
}

/// Makes the picture of a frame file whose lines are stored field after field,
/// or in order.
ZtImageSGI picture_of(const std::string& frame_name, bool in_order)
{
    const ZtImageSGI stored(frame_name.c_str(), raw_video);
    ZtImageSGI shown(stored);
    if (!stored.pixels || !shown.pixels || stored.height != lines)
        return ZtImageSGI(0, 0, nullptr);
    const std::size_t width = static_cast<std::size_t>(shown.width);
    // Line 0 of the frame is the top row, which is the last one in memory.
    const auto row_of = [&](const ZtImageSGI& image, int line) {
        return image.pixels +
               width * static_cast<std::size_t>(lines - 1 - line);
    };
    for (int line = 0; line < lines; ++line)
        std::memcpy(row_of(shown, line),
                    row_of(stored, in_order ? line : StoredLine(line)),
                    width * sizeof(ZtPixel));
    for (std::size_t i = 0; i < width * lines; ++i)
        shown.pixels[i] |= zt_tools::opaque_alpha;
    return shown;
}

} // namespace

FrameFile::FrameFile(const Storage& frame_storage, int number)
    : storage(frame_storage), stem(stem_of(storage.directory, number)),
      name(stem + ".yuv"), making(name), file(nullptr),
      why(zt_tools::WhyNotWritable(name))
{
    if (!why.empty())
        return;
    file = std::fopen(making.Name().c_str(), "w+be");
    if (!file)
        why = std::strerror(errno);
    else
        std::setvbuf(file, nullptr, _IONBF, 0);
}

FrameFile::~FrameFile()
{
    close();
}

void FrameFile::Write(const char* bytes, std::size_t count)
{
    if (why.empty() && std::fwrite(bytes, 1, count, file) != count)
        why = std::strerror(errno);
}

std::string FrameFile::Finish()
{
    if (why.empty() && storage.interleaved)
        interleave();
    close();
    if (why.empty() && storage.png)
        write_picture();
    if (why.empty())
        why = making.PutInPlace();
    return why;
}

void FrameFile::close()
{
    if (!file)
        return;
    if (std::fclose(std::exchange(file, nullptr)) != 0 && why.empty())
        why = std::strerror(errno);
}

/// Writes the frame once more, its lines in order.
void FrameFile::interleave()
{
    std::vector<char> stored(frame_bytes);
    std::rewind(file);
    if (std::fread(stored.data(), 1, frame_bytes, file) != frame_bytes) {
        why = "it cannot be read back";
        return;
    }
    std::rewind(file);
    const std::vector<char> shown = interleaved(stored);
    Write(shown.data(), shown.size());
}

void FrameFile::write_picture()
{
    why = zt_tools::WritePng(picture_of(making.Name(), storage.interleaved),
                             stem + ".png");
    if (!why.empty())
        why = stem + ".png: " + why;
}

} // namespace framestore
