#include "shell.h"

#include "pages.h"
#include "pictures/picture_files.h"
#include "prompt/history_file.h"
#include "prompt/line_editor.h"
#include "prompt/prompt_source.h"
#include "system/signals.h"
#include "system/terminal.h"

#include <iostream>

namespace ztsh {

namespace {
constexpr int input_descriptor = 0;
}

Shell::Shell(const Settings& settings)
    : runner(settings), common(runner), language(runner),
      picture_words(runner, pictures), frame_store(runner, pictures),
      preferences(runner), sequences(runner, pictures, geometry), times(runner),
      beat(runner), clock_words(runner, clocks), wait(runner, clocks),
      shuttles(runner), geometry_words(runner, geometry),
      wire_words(runner, geometry, pictures)
{
    runner.RunWhenDue(&clocks);
    SurviveOverlongRows();
}

int Shell::Run(const Options& options)
{
    if (!options.page.empty()) {
        WritePage(std::cout, options.page, runner.dispatcher);
        return std::cout.flush() ? 0 : ExitCannotWrite;
    }
    CatchStopSignals();
    for (const std::string& text : options.texts)
        if (!runner.Stopping())
            runner.RunText(text);
    for (const std::string& script : options.scripts) {
        if (runner.Stopping())
            break;
        if (script == "-")
            runner.RunStandardInput();
        else
            runner.RunFile(script);
    }
    if (options.texts.empty() && options.scripts.empty()) {
        if (IsTerminal(input_descriptor))
            run_prompt();
        else
            runner.RunStandardInput();
    }

    if (!std::cout.flush()) {
        std::cerr << "ztsh: cannot write to standard output\n";
        runner.outcome.Note(ExitCannotWrite);
    }
    return StopSignal() != 0 ? ExitSignalBase + StopSignal()
                             : runner.outcome.Code();
}

void Shell::run_prompt()
{
    auto words = [this] { return CommandWords(runner.dispatcher); };
    std::unique_ptr<LineEditor> editor =
        MakeTerminalEditor(HistoryPath(), words, runner);
    PromptSource source(*editor);
    runner.RunPrompt(source);
}

} // namespace ztsh
