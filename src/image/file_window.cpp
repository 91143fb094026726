#include "image/file_window.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

namespace zt_image {

namespace {

/// The window doubles what it reads from the smallest to the largest stride
/// while the reader goes on in order. The largest fits the processor's cache.
constexpr std::size_t smallest_stride = std::size_t{4} << 10;
constexpr std::size_t largest_stride = std::size_t{256} << 10;

} // namespace

FileWindow::FileWindow(const zt_platform::InputFile& whole_file)
    : file(&whole_file), buffer(nullptr), capacity(0), filled(0), start(0),
      stride(smallest_stride)
{}

FileWindow::~FileWindow()
{
    std::free(buffer);
}

const unsigned char* FileWindow::at(std::uint64_t offset, std::size_t count)
{
    if (buffer && offset >= start && offset - start <= filled &&
        count <= filled - (offset - start))
        return buffer + (offset - start);
    return refill(offset, count) ? buffer : nullptr;
}

bool FileWindow::refill(std::uint64_t offset, std::size_t count)
{
    bool goes_on = offset >= start && offset - start <= filled;
    stride = goes_on ? std::min(stride * 2, largest_stride) : smallest_stride;
    std::size_t wanted = std::max(count, stride);
    if (!reserve(wanted))
        return false;
    std::size_t got = file->read_at(offset, buffer, wanted);
    std::memset(buffer + got, 0, wanted - got + slack);
    start = offset;
    filled = wanted;
    return true;
}

bool FileWindow::reserve(std::size_t bytes)
{
    if (bytes <= capacity)
        return true;
    // What the buffer holds is about to be read anew: nothing to keep.
    std::free(buffer);
    buffer = static_cast<unsigned char*>(std::malloc(bytes + slack));
    capacity = buffer ? bytes : 0;
    filled = 0;
    return buffer != nullptr;
}

} // namespace zt_image
