#include "pages.h"

#include "options.h"
#include "pages/pages.h"
#include "words/language_words.h"
#include "words/word_director.h"

#include <sstream>

#include <CLI/CLI.hpp>

namespace ztsh {

void WritePage(std::ostream& out, const std::string& kind,
               ZtDispatcher& dispatcher)
{
    Options unused;
    CLI::App app;
    AddOptions(app, unused);
    zt_pages::Command command = zt_pages::CommandOf(app);
    command.version = "libzt_util2 " ZTSH_VERSION;
    command.words.files = true;
    command.Find("--command")->choices = CommandWords(dispatcher);
    std::ostringstream words;
    dispatcher.Info(words, InfoHelp);
    command.sections.push_back({"words", words.str()});
    command.sections.push_back(
        {"see also",
         "The command language is described in docs/command-language.md, "
         "with the\nlibrary's other guides."});
    zt_pages::Write(out, kind, command);
}

} // namespace ztsh
