#ifndef ZT_IMAGE_FILE_WINDOW_H
#define ZT_IMAGE_FILE_WINDOW_H

/// \file
/// A stretch of a file in memory that moves along as its reader asks for more.
///
/// Readers that go through a file in order get it in large reads; a reader
/// that jumps about gets little more than it asked for, so that a file whose
/// offsets are nonsense costs no more than what its rows may hold.

#include "platform/files.h"

#include <cstddef>
#include <cstdint>

namespace zt_image {

class FileWindow
{
public:
    /// Bytes behind every stretch that may be read and are of no meaning.
    static constexpr std::size_t slack = 128;

    /// Requires: `whole_file` outlives the window.
    explicit FileWindow(const zt_platform::InputFile& whole_file);
    ~FileWindow();
    FileWindow(const FileWindow&) = delete;
    FileWindow& operator=(const FileWindow&) = delete;

    /// Gives `count` bytes of the file from `offset` on; those that the file
    /// does not hold are zero.
    ///
    /// Owner:   this window, until the next call.
    /// Returns: the bytes, with `slack` more behind them; null for lack of
    ///          memory.
    const unsigned char* at(std::uint64_t offset, std::size_t count);

private:
    bool refill(std::uint64_t offset, std::size_t count);
    bool reserve(std::size_t bytes);

    const zt_platform::InputFile* file;
    unsigned char* buffer;
    std::size_t capacity; ///< Of the buffer, slack left out.
    std::size_t filled;   ///< Bytes of the buffer that are valid.
    std::uint64_t start;  ///< Where in the file the buffer begins.
    std::size_t stride;   ///< How much to read when the reader goes on.
};

} // namespace zt_image

#endif
