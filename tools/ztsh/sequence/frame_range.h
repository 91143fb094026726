#ifndef ZTSH_SEQUENCE_FRAME_RANGE_H
#define ZTSH_SEQUENCE_FRAME_RANGE_H

/// \file
/// The frames that one statement names.

#include <KVO/KvoStatement.h>

#include <string>

namespace ztsh {

/// Frame numbers from a first to a last one.
class FrameRange
{
public:
    static constexpr long most_frame = 999999998; ///< 999999999 has 9 digits.
    static constexpr long most_pad = 9;

    /// Reads FIRST LAST [STEP] [pad N] from the words behind the command word
    /// up to position `end`.
    ///
    /// Without STEP it is 1, or -1 if the last frame is the smaller one.
    ///
    /// Returns: false if the words are anything else or the step leads away
    ///          from the last frame.
    bool Read(const KvoStatement& statement, int end);

    /// Gives the number of frames.
    long Count() const { return (last - first) / step + 1; }

    /// Gives the frame at `index`, counted from 0, as names of files carry it:
    /// with zeros in front up to the width of `pad`.
    std::string Name(long index) const;

private:
    long first = 0;
    long last = 0;
    long step = 1;
    long pad = 4;
};

} // namespace ztsh

#endif
