#ifndef ZT_FRAMESTORE_FRAME_FILE_H
#define ZT_FRAMESTORE_FRAME_FILE_H

/// \file
/// Frames as files.

#include "common/files.h"

#include <cstddef>
#include <cstdio>
#include <string>

namespace framestore {

/// What becomes of frames.
struct Storage
{
    std::string directory = ".";
    bool interleaved = false; ///< Lines in the order of the picture.
    bool png = false;         ///< A picture beside each frame.
};

/// A frame that is being received. It is written as it comes, beside its
/// place, and put there when it is complete.
class FrameFile
{
public:
    /// Makes the file; what is wrong with it is told at the end.
    FrameFile(const Storage& frame_storage, int number);
    ~FrameFile();
    FrameFile(const FrameFile&) = delete;
    FrameFile& operator=(const FrameFile&) = delete;

    /// Writes the next bytes. After a fault they are dropped.
    void Write(const char* bytes, std::size_t count);

    /// Puts the complete frame in its place, and the picture if there is to be
    /// one. An older frame of that number stays if anything goes wrong.
    ///
    /// Returns: the empty text, or what went wrong.
    std::string Finish();

    /// Gives the name of the frame's place.
    const std::string& Name() const { return name; }

private:
    void close();
    void interleave();
    void write_picture();

    const Storage& storage;
    std::string stem;
    std::string name;
    zt_tools::FileInMaking making;
    std::FILE* file;
    std::string why; ///< What has gone wrong so far.
};

} // namespace framestore

#endif
