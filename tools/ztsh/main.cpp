#include "options.h"
#include "plugins/plugin_command.h"
#include "shell.h"

#include <exception>
#include <iostream>

int main(int argc, char** argv)
{
    try {
        // Nothing here mixes these streams with stdio's input, and they are
        // faster on their own.
        std::ios::sync_with_stdio(false);
        if (ztsh::IsPluginCommand(argc, argv))
            return ztsh::RunPluginCommand(argc, argv);
        ztsh::Options options = ztsh::ReadOptions(argc, argv);
        if (options.finished)
            return options.code;
        ztsh::Shell shell(options.settings);
        return shell.Run(options);
    } catch (const std::exception& fault) {
        std::cerr << "ztsh: " << fault.what() << "\n";
        return ztsh::ExitReported;
    }
}
