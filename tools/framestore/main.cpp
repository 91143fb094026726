#include "options.h"
#include "server.h"
#include "system/signals.h"

#include "common/files.h"

#include <exception>
#include <filesystem>
#include <iostream>

namespace {

/// Says on standard error why frames cannot be written to the directory.
///
/// Returns: whether they can.
bool is_writable(const std::string& directory)
{
    const std::string why = zt_tools::WhyNotWritable(directory + "/frame");
    if (!why.empty())
        std::cerr << "zt-framestore: cannot write to " << directory << ": "
                  << why << "\n";
    return why.empty();
}

/// Says on standard error why the lock file can never be made. One that is
/// there is somebody else's, and no fault.
///
/// Returns: whether it can.
bool is_possible(const std::string& lock)
{
    std::error_code fault;
    if (lock.empty() || std::filesystem::is_regular_file(lock, fault))
        return true;
    const std::string why = zt_tools::WhyNotWritable(lock);
    if (!why.empty())
        std::cerr << "zt-framestore: cannot make the lock file " << lock << ": "
                  << why << "\n";
    return why.empty();
}

} // namespace

int main(int argc, char** argv)
{
    try {
        const framestore::Options options = framestore::ReadOptions(argc, argv);
        if (options.finished)
            return options.code;
        if (!is_writable(options.settings.storage.directory) ||
            !is_possible(options.settings.lock))
            return framestore::ExitNoService;
        framestore::CatchSignals();
        framestore::Server server(options.settings, std::cout);
        if (!server.Ready())
            return framestore::ExitNoService;
        server.Run();
        return framestore::ExitWell;
    } catch (const std::exception& fault) {
        std::cerr << "zt-framestore: " << fault.what() << "\n";
        return framestore::ExitNoService;
    }
}
