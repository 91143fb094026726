#include "prompt/completion.h"
#include "prompt/history_file.h"
#include "prompt/line_editor.h"
#include "system/signals.h"
#include "system/terminal.h"

#include <cerrno>
#include <clocale>
#include <csignal>
#include <cstdio>
#include <cwchar>
#include <unistd.h>
#include <utility>

#include <histedit.h>

namespace ztsh {

namespace {

volatile std::sig_atomic_t window_changed = 0;

void note_window(int)
{
    window_changed = 1;
}

/// Notes changes of the window for as long as a line is edited.
class WindowWatch
{
public:
    WindowWatch()
    {
        struct sigaction action = {};
        action.sa_handler = note_window;
        sigemptyset(&action.sa_mask);
        sigaction(SIGWINCH, &action, &former);
    }
    ~WindowWatch() { sigaction(SIGWINCH, &former, nullptr); }
    WindowWatch(const WindowWatch&) = delete;
    WindowWatch& operator=(const WindowWatch&) = delete;

private:
    struct sigaction former;
};

class TerminalEditor : public LineEditor, private Idle
{
public:
    TerminalEditor(const std::string& history_path, WordLister lister,
                   Idle& waiting_idle);
    ~TerminalEditor() override;

    Typed Ask(const std::string& prompt, std::string& line) override;

private:
    bool Due() const override { return window_changed || idle.Due(); }
    void RunDue() override;
    bool Over() const override { return idle.Over(); }

    void hide_line();
    static TerminalEditor& of(EditLine* editor);
    static char* show_prompt(EditLine* editor);
    static int read_character(EditLine* editor, wchar_t* character);
    static unsigned char complete(EditLine* editor, int key);

    void remember(const std::string& line);

    EditLine* edit;
    History* past;
    HistoryFile file;
    WordLister words;
    Idle& idle;
    std::string prompt_text;
    std::string last_line;
};

TerminalEditor::TerminalEditor(const std::string& history_path,
                               WordLister lister, Idle& waiting_idle)
    : edit(nullptr), past(history_init()), file(history_path),
      words(std::move(lister)), idle(waiting_idle)
{
    // Only what a character is depends on the user's locale; numbers do not.
    std::setlocale(LC_CTYPE, "");
    edit = el_init("ztsh", stdin, stdout, stderr);
    el_set(edit, EL_CLIENTDATA, this);
    el_set(edit, EL_PROMPT, show_prompt);
    el_set(edit, EL_SIGNAL, 0);
    el_set(edit, EL_EDITOR, "emacs");
    el_set(edit, EL_GETCFN, read_character);
    // The narrow form of this call never frees its copies of the texts.
    el_wset(edit, EL_ADDFN, L"zt-complete", L"Complete the word", complete);
    el_set(edit, EL_BIND, "^I", "zt-complete", nullptr);
    el_set(edit, EL_BIND, "^R", "em-inc-search-prev", nullptr);
    HistEvent event;
    history(past, &event, H_SETSIZE, static_cast<int>(HistoryFile::most_lines));
    for (const std::string& line : file.Load())
        history(past, &event, H_ENTER, line.c_str());
    el_set(edit, EL_HIST, history, past);
    // The user's own key bindings.
    el_source(edit, nullptr);
}

TerminalEditor::~TerminalEditor()
{
    el_end(edit);
    history_end(past);
}

Typed TerminalEditor::Ask(const std::string& prompt, std::string& line)
{
    WindowWatch watch;
    prompt_text = prompt;
    // Before the prompt is to be seen: the editor would do it only after, and
    // who answers at once would answer a terminal in its ordinary mode.
    el_set(edit, EL_PREP_TERM, 1);
    int length = 0;
    const char* typed = el_gets(edit, &length);
    if (StopSignal() != 0) {
        std::fputs("\n", stdout);
        std::fflush(stdout);
        if (StopSignal() != SIGINT)
            return Typed::End;
        ClearStopSignal();
        return Typed::Cancelled;
    }
    if (!typed || length <= 0) {
        std::fputs("\n", stdout);
        std::fflush(stdout);
        return Typed::End;
    }
    line.assign(typed, static_cast<std::size_t>(length));
    if (line.back() == '\n')
        line.pop_back();
    remember(line);
    return Typed::Line;
}

TerminalEditor& TerminalEditor::of(EditLine* editor)
{
    void* self = nullptr;
    el_get(editor, EL_CLIENTDATA, &self);
    return *static_cast<TerminalEditor*>(self);
}

char* TerminalEditor::show_prompt(EditLine* editor)
{
    return of(editor).prompt_text.data();
}

/// Runs what is due below the line, which is drawn again afterwards.
void TerminalEditor::RunDue()
{
    if (std::exchange(window_changed, 0) != 0)
        el_resize(edit);
    if (!idle.Due())
        return;
    hide_line();
    el_set(edit, EL_PREP_TERM, 0);
    idle.RunDue();
    el_set(edit, EL_PREP_TERM, 1);
    el_set(edit, EL_REFRESH);
}

/// Clears what is shown of the line, from its first row on; where that cannot
/// be done, leaves it behind.
void TerminalEditor::hide_line()
{
    if (!CanRedraw(STDOUT_FILENO)) {
        std::fputs("\n", stdout);
        std::fflush(stdout);
        return;
    }
    const LineInfo* info = el_line(edit);
    std::string before = prompt_text + std::string(info->buffer, info->cursor);
    std::mbstate_t state = {};
    const char* from = before.c_str();
    std::size_t cells = std::mbsrtowcs(nullptr, &from, 0, &state);
    constexpr std::size_t wrong = static_cast<std::size_t>(-1);
    int columns = SizeOfWindow(STDOUT_FILENO).columns;
    int rows = cells == wrong ? 0 : static_cast<int>(cells) / columns;
    if (rows > 0)
        std::printf("\033[%dA", rows);
    std::fputs("\r\033[J", stdout);
    std::fflush(stdout);
}

/// Reads one character. A caught signal ends the line, a change of the window
/// only draws it anew.
int TerminalEditor::read_character(EditLine* editor, wchar_t* character)
{
    std::mbstate_t state = {};
    for (;;) {
        WaitEnds ends;
        ends.descriptor = STDIN_FILENO;
        if (WaitFor(ends, of(editor)) == Waited::Over)
            return 0;
        char byte = 0;
        ssize_t got = read(STDIN_FILENO, &byte, 1);
        if (got < 0 && errno == EINTR)
            continue;
        if (got <= 0)
            return static_cast<int>(got);
        // The key that ends the input comes like this if it was struck while
        // a statement ran and the terminal was in its ordinary mode.
        constexpr char end_of_input = '\004';
        if (byte == '\0')
            byte = end_of_input;
        constexpr std::size_t wrong = static_cast<std::size_t>(-1);
        constexpr std::size_t incomplete = static_cast<std::size_t>(-2);
        std::size_t length = std::mbrtowc(character, &byte, 1, &state);
        if (length == incomplete)
            continue;
        if (length == wrong)
            state = {};
        else
            return 1;
    }
}

unsigned char TerminalEditor::complete(EditLine* editor, int)
{
    const LineInfo* info = el_line(editor);
    auto before = static_cast<std::size_t>(info->cursor - info->buffer);
    std::string_view line(info->buffer, before);
    Completion found = Complete(line, of(editor).words());
    if (found.candidates.empty())
        return CC_REFRESH_BEEP;

    std::string typed(line.substr(found.start));
    if (found.text.size() > typed.size() || found.candidates.size() == 1) {
        // Positions are bytes here, the editor deletes characters.
        std::mbstate_t state = {};
        const char* from = typed.c_str();
        std::size_t characters = std::mbsrtowcs(nullptr, &from, 0, &state);
        el_deletestr(editor, static_cast<int>(characters));
        el_insertstr(editor, found.text.c_str());
        return CC_REFRESH;
    }
    int columns = SizeOfWindow(STDOUT_FILENO).columns - 1;
    std::printf("\n%s", InColumns(found.candidates, columns).c_str());
    std::fflush(stdout);
    return CC_REDISPLAY;
}

/// Puts a line into the history, unless it is blank or the one before again.
void TerminalEditor::remember(const std::string& line)
{
    if (line.find_first_not_of(" \t") == std::string::npos || line == last_line)
        return;
    last_line = line;
    HistEvent event;
    history(past, &event, H_ENTER, line.c_str());
    file.Append(line);
}

} // namespace

std::unique_ptr<LineEditor> MakeTerminalEditor(const std::string& history_path,
                                               WordLister words,
                                               Idle& waiting_idle)
{
    return std::make_unique<TerminalEditor>(history_path, std::move(words),
                                            waiting_idle);
}

} // namespace ztsh
