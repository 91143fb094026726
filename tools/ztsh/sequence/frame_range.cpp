#include "sequence/frame_range.h"

#include "words/word_director.h"

namespace ztsh {

bool FrameRange::Read(const KvoStatement& statement, int end)
{
    int next = 1;
    auto take_number = [&](long least, long most, long& number) {
        if (next >= end ||
            !ReadNumber(statement.ArgText(next), least, most, number))
            return false;
        ++next;
        return true;
    };

    if (!take_number(0, most_frame, first) || !take_number(0, most_frame, last))
        return false;
    step = last < first ? -1 : 1;
    bool toward = true;
    long given = 0;
    if (take_number(-most_frame, most_frame, given)) {
        toward = given != 0 && (first == last || (given > 0) == (step > 0));
        step = given;
    }
    if (next < end && statement.Find(next) &&
        std::string(statement.ArgText(next)) == "pad") {
        ++next;
        if (!take_number(1, most_pad, pad))
            return false;
    }
    return toward && next == end;
}

std::string FrameRange::Name(long index) const
{
    std::string digits = std::to_string(first + index * step);
    std::size_t width = static_cast<std::size_t>(pad);
    if (digits.size() < width)
        digits.insert(0, width - digits.size(), '0');
    return digits;
}

} // namespace ztsh
