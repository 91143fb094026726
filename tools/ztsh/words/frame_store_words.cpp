#include "words/frame_store_words.h"

#include "pictures/picture_files.h"
#include "sending/frame_sender.h"
#include "sequence/frame_range.h"
#include "system/signals.h"
#include "system/terminal.h"

#include <ZT/error.h>

#include <cstdlib>
#include <iostream>
#include <limits>

namespace ztsh {

namespace {

constexpr int errors_descriptor = 2;
constexpr char number_mark = '#';

enum Selector : int { SendOne, SendSequence };

const std::vector<Word> words = {
    {"SendFrame", "NAME NUMBER",
     "Sends a picture of 648 x 486 pixels to the frame store as frame\n"
     "NUMBER. Preference QUARN_DDR_HOST names the host that it is on,\n"
     "--ddr-timeout says how long it may take.",
     2, 2},
    {"SendFrames", "FIRST LAST [STEP] [pad DIGITS] FILE",
     "Loads the pictures of a sequence one after the other and sends each to\n"
     "the frame store. In FILE a # stands for the number of the frame, with\n"
     "zeros in front, 4 digits if pad does not say otherwise. The first one\n"
     "that cannot be sent is the last.",
     3, 6},
};

void say(const std::string& line)
{
    std::cerr << line + "\n";
}

void say_what_is_unusual(const std::string& line)
{
    if (!IsAboutTheStart(line))
        say(line);
}

} // namespace

FrameStoreWords::FrameStoreWords(Runner& script_runner,
                                 PictureTable& picture_table)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      pictures(picture_table)
{}

void FrameStoreWords::Do(KvoStatement& statement, int selector)
{
    // What a script from a stranger sends, and where to, is the stranger's.
    if (runner.settings.safe)
        ZtError("%s: not allowed in a safe shell (--safe)\n",
                words[static_cast<std::size_t>(selector)].name);
    else if (selector == SendOne)
        send(statement.ArgText(1), statement.ArgText(2));
    else
        send_sequence(statement);
}

void FrameStoreWords::send(const char* name, const char* number_text)
{
    using Limits = std::numeric_limits<int>;
    long number = 0;
    if (!ReadNumber(number_text, Limits::min(), Limits::max(), number)) {
        ZtError("SendFrame: expected the number of a frame, not %s\n",
                number_text);
        return;
    }
    const Picture* picture = pictures.Find(name);
    if (!picture) {
        ZtError("SendFrame: no picture is named %s\n", name);
        return;
    }
    const std::string why =
        SendToFrameStore(picture->image, static_cast<int>(number),
                         {runner.settings.ddr_timeout, say});
    if (!why.empty())
        ZtError("SendFrame: frame %ld was not sent: %s\n", number, why.c_str());
}

void FrameStoreWords::send_sequence(KvoStatement& statement)
{
    const int file_position = statement.Count() - 1;
    const std::string pattern = statement.ArgText(file_position);
    const std::size_t mark = pattern.find(number_mark);
    FrameRange range;
    if (mark == std::string::npos ||
        pattern.find(number_mark, mark + 1) != std::string::npos ||
        !range.Read(statement, file_position)) {
        Expected(SendSequence);
        return;
    }
    const bool show =
        runner.sequence_depth == 0 && CanRedraw(errors_descriptor);
    ProgressBar bar(range.Count(), show);
    long sent = 0;
    bool well = true;
    while (well && sent < range.Count() && !runner.Stopping()) {
        bar.Show(sent, 0);
        const std::string number = range.Name(sent);
        std::string file = pattern;
        file.replace(mark, 1, number);
        well = send_file(file, std::atoi(number.c_str()), bar);
        sent += well && StopSignal() == 0;
    }
    bar.Hide();
    if (sent < range.Count())
        std::cerr << "SendFrames: stopped after " << sent << " of "
                  << range.Count() << " frames\n";
}

/// Sends a picture of a sequence.
///
/// Returns: false, and reports, if it was not sent; true also if the shell is
///          asked to stop.
bool FrameStoreWords::send_file(const std::string& file, int number,
                                ProgressBar& bar)
{
    std::string why;
    const std::shared_ptr<Picture> picture = LoadPicture(file, Auto, why);
    if (!picture) {
        ZtError("SendFrames: cannot load %s: %s\n", file.c_str(), why.c_str());
        return false;
    }
    why = SendToFrameStore(picture->image, number,
                           {runner.settings.ddr_timeout, say_what_is_unusual,
                            [&] { bar.Forget(); }});
    if (!why.empty())
        ZtError("SendFrames: frame %d was not sent: %s\n", number, why.c_str());
    return why.empty();
}

} // namespace ztsh
