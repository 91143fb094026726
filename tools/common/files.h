#ifndef ZT_TOOLS_COMMON_FILES_H
#define ZT_TOOLS_COMMON_FILES_H

/// \file
/// Files that are looked at before they are opened, since an operation that
/// opens a pipe or a device may wait for ever, and files that are there whole
/// or not at all.

#include <string>

namespace zt_tools {

/// Says why `name` is no ordinary file that can be read; never waits, whatever
/// the name stands for.
///
/// Returns: the empty text when it is one.
std::string WhyNotReadable(const std::string& name);

/// Says why no ordinary file `name` can be written: what stands there is
/// something else or protected, or its directory is missing or protected.
///
/// Returns: the empty text when it can.
std::string WhyNotWritable(const std::string& name);

/// A file that is written beside the place it is for and put there only when
/// it is complete, so that nobody ever finds half of it.
///
/// Requires: `WhyNotWritable` found nothing.
class FileInMaking
{
public:
    /// Chooses the name to write to. If `name` is a link, the place is the
    /// file that it points to.
    explicit FileInMaking(const std::string& name);

    /// Removes what was written unless it was put in place.
    ~FileInMaking();
    FileInMaking(const FileInMaking&) = delete;
    FileInMaking& operator=(const FileInMaking&) = delete;

    /// Gives the name to write to.
    const std::string& Name() const { return beside; }

    /// Puts the complete file in its place, with the permissions of the one
    /// that stood there.
    ///
    /// Returns: the empty text, or why it could not be done.
    std::string PutInPlace();

private:
    std::string place;
    std::string beside;
    bool in_place;
};

} // namespace zt_tools

#endif
