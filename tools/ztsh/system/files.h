#ifndef ZTSH_SYSTEM_FILES_H
#define ZTSH_SYSTEM_FILES_H

/// \file
/// Files and directories of the shell; what every tool does with files is in
/// `common/files.h`.

#include "common/files.h"

#include <string>

namespace ztsh {

using zt_tools::FileInMaking;
using zt_tools::WhyNotReadable;
using zt_tools::WhyNotWritable;

/// Opens a script for reading; waits if it is a pipe without a writer.
///
/// Returns: the file descriptor, closed on exec; -1 with `why` set.
int OpenScript(const std::string& name, std::string& why);

/// Brings the process back to the directory that it was in.
class DirectoryKeeper
{
public:
    DirectoryKeeper();
    ~DirectoryKeeper();
    DirectoryKeeper(const DirectoryKeeper&) = delete;
    DirectoryKeeper& operator=(const DirectoryKeeper&) = delete;

private:
    int descriptor;
};

} // namespace ztsh

#endif
