#ifndef ZTSH_WORDS_PLUGIN_WORDS_H
#define ZTSH_WORDS_PLUGIN_WORDS_H

/// \file
/// The words that load plug-ins and tell about them.

#include "plugins/plugin_table.h"
#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// LoadPlugins: loads plug-ins, whose words can be used from then on.
/// Plugins: lists them. PluginHelp: shows the help file about one.
class PluginWords : public WordDirector
{
public:
    /// Requires: both outlive the director.
    PluginWords(Runner& script_runner, PluginTable& plugin_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    void load(const char* directories);
    void list();
    void help(const KvoStatement& statement);

    Runner& runner;
    PluginTable& plugins;
};

} // namespace ztsh

#endif
