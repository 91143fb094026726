#ifndef ZT_IMAGE_SGI_ROWS_H
#define ZT_IMAGE_SGI_ROWS_H

/// \file
/// Where the compressed rows of a run-length file lie: the start table and
/// the length table behind the header.

#include "image/sgi_header.h"

#include <cstddef>
#include <cstdint>

namespace zt_image {

/// The two tables of a file that is being read.
class SgiRowTable
{
public:
    SgiRowTable();
    ~SgiRowTable();
    SgiRowTable(const SgiRowTable&) = delete;
    SgiRowTable& operator=(const SgiRowTable&) = delete;

    /// Reads the tables; what a short file does not hold is zero.
    ///
    /// Returns: false for lack of memory.
    bool read(const zt_platform::InputFile& file, const SgiHeader& header);

    /// Gives the offset of a row in the file.
    std::uint32_t start(std::size_t y, std::size_t channel) const
    {
        return starts[y + channel * height];
    }

    /// Gives the bytes that a row takes in the file.
    std::uint32_t length(std::size_t y, std::size_t channel) const
    {
        return starts[count + y + channel * height];
    }

    /// Tells whether the rows follow one another, channel by channel within
    /// each row of the picture, as our own writer stores them.
    bool in_order() const;

    /// Tells whether a row takes more than `bytes` in the file.
    bool any_longer_than(std::size_t bytes) const;

private:
    std::uint32_t* starts; ///< The start table, then the length table.
    std::size_t count;     ///< Entries of either.
    std::size_t height;    ///< Entries of a channel.
};

} // namespace zt_image

#endif
