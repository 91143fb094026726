#include "words/sequence_words.h"

#include "sequence/block.h"
#include "system/files.h"
#include "system/signals.h"
#include "system/terminal.h"

#include <KVO/KvoTime.h>
#include <ZT/error.h>

#include <cstring>
#include <iostream>

namespace ztsh {

namespace {

constexpr const char* frame_variable = "frame";
constexpr int errors_descriptor = 2;
constexpr int most_words = 7;
constexpr int most_depth = 100;

enum Selector : int { Frames, Begin };

const std::vector<Word> words = {
    {"Frames", "FIRST LAST [STEP] [pad DIGITS] begin ... end",
     "Runs the statements up to end for each frame from FIRST to LAST.\n"
     "$frame is its number with zeros in front, 4 digits if pad does not\n"
     "say otherwise. Frames run side by side in worker processes (--jobs);\n"
     "what a frame does to variables and pictures is gone at its end.\n"
     "begin may be a statement of its own.",
     0, most_words},
    {"begin", "... end",
     "Encloses the statements of a sequence. A block that belongs to none is\n"
     "skipped.",
     0, 0},
};

/// Writes what a worker wrote; its last line may lack its end.
void write_lines(std::ostream& out, const std::string& text)
{
    out << text;
    if (!text.empty() && text.back() != '\n')
        out << '\n';
    out.flush();
}

} // namespace

/// How a sequence goes.
struct SequenceWords::Tally
{
    Tally(long frame_count, bool show)
        : count(frame_count), bar(frame_count, show)
    {}

    long count;
    long done = 0;
    long failed = 0;
    std::string failed_frames; ///< The first of them.
    ProgressBar bar;
};

SequenceWords::SequenceWords(Runner& script_runner, PictureTable& picture_table,
                             Geometry& named_geometry)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner),
      pictures(picture_table), geometry(named_geometry)
{}

void SequenceWords::Do(KvoStatement& statement, int selector)
{
    if (selector == Frames)
        frames(statement);
    else
        skip_block();
}

void SequenceWords::frames(KvoStatement& statement)
{
    bool opened = OpensBlock(statement);
    FrameRange range;
    bool right = range.Read(statement, statement.Count() - (opened ? 1 : 0));
    if (!right)
        Expected(Frames);
    if (!right && !opened)
        return;

    // A block belongs to its word also when the word is wrong.
    runner.KeepPlace();
    Block block;
    BlockRead read = ReadBlock(*runner.Source(), opened, block);
    if (read == BlockRead::NoEnd)
        ZtError("Frames: expected end, nothing was run\n");
    if (read == BlockRead::Whole && right &&
        runner.sequence_depth >= most_depth)
        ZtError("Frames: more than %d sequences within each other, this one "
                "is not run\n",
                most_depth);
    else if (read == BlockRead::Whole && right)
        run(range, block);
    if (read == BlockRead::NoBegin) {
        ZtError("Frames: expected begin, nothing was run\n");
        BlockSource rest(block);
        runner.Run(rest);
    }
}

void SequenceWords::skip_block()
{
    ZtError("begin: this block belongs to no Frames and is skipped\n");
    Block block;
    ReadBlock(*runner.Source(), true, block);
}

void SequenceWords::run(const FrameRange& range, const Block& block)
{
    bool show = runner.sequence_depth == 0 && CanRedraw(errors_descriptor);
    Tally tally(range.Count(), show);
    if (runner.settings.jobs > 1 && tally.count > 1 &&
        runner.sequence_depth == 0)
        run_in_workers(range, block, tally);
    else
        run_here(range, block, tally);
    tally.bar.Hide();
    if (StopSignal() != 0 && runner.sequence_depth == 0)
        std::cerr << "Frames: stopped after " << tally.done << " of "
                  << tally.count << " frames\n";
    if (tally.failed > 0)
        ZtError("Frames: %ld of %ld frames failed: %s\n", tally.failed,
                tally.count, tally.failed_frames.c_str());
}

void SequenceWords::run_here(const FrameRange& range, const Block& block,
                             Tally& tally)
{
    for (long i = 0; i < tally.count && !runner.Stopping(); ++i) {
        std::string frame = range.Name(i);
        tally.bar.Show(tally.done, tally.failed);
        int code = run_frame(frame, block);
        if (StopSignal() == 0)
            note_frame(frame, code, "", tally);
    }
}

void SequenceWords::run_in_workers(const FrameRange& range, const Block& block,
                                   Tally& tally)
{
    auto job = [&](long index) {
        tally.bar.Forget();
        int code = run_frame(range.Name(index), block);
        return StopSignal() != 0 ? ExitSignalBase + StopSignal() : code;
    };
    auto take_result = [&](const JobResult& result) {
        take(range.Name(result.index), result, tally);
    };
    auto watch = [&](long finished) { tally.bar.Show(finished, tally.failed); };
    WorkerPool pool(runner.settings.jobs, job);
    pool.Run(tally.count, take_result, watch);
}

/// Runs the block for one frame and takes back what it did to the shell.
///
/// Returns: the exit code of the frame as if it were a shell of its own.
int SequenceWords::run_frame(const std::string& frame, const Block& block)
{
    DirectoryKeeper directory;
    Variables variables = runner.variables;
    PictureTable former_pictures = pictures;
    Geometry former_geometry = geometry;
    Outcome outcome = runner.outcome;
    std::int32_t rate = KvoTime::default_fps;

    ++runner.sequence_depth;
    runner.outcome = Outcome();
    runner.variables.Set(frame_variable, frame);
    BlockSource source(block);
    runner.Run(source);
    int code = runner.outcome.Code();

    --runner.sequence_depth;
    KvoTime::default_fps = rate;
    runner.outcome = outcome;
    pictures = former_pictures;
    geometry = former_geometry;
    runner.variables = variables;
    return code;
}

/// Takes over what a worker leaves behind.
void SequenceWords::take(const std::string& frame, const JobResult& result,
                         Tally& tally)
{
    write_lines(std::cout, result.output);
    write_lines(std::cerr, result.errors);
    std::string why = result.why;
    int code = result.code;
    if (!why.empty()) {
        why = "no worker could be started: " + why;
        code = ExitReported;
    } else if (result.signal != 0) {
        why = "its worker was ended by signal " +
              std::to_string(result.signal) + " (" + strsignal(result.signal) +
              ")";
        code = ExitReported;
    }
    note_frame(frame, code, why, tally);
}

/// Counts a frame and reports it if it has failed.
void SequenceWords::note_frame(const std::string& frame, int code,
                               const std::string& why, Tally& tally)
{
    ++tally.done;
    if (code == ExitWell)
        return;
    ++tally.failed;
    constexpr long most_listed = 10;
    if (tally.failed <= most_listed)
        tally.failed_frames += (tally.failed > 1 ? ", " : "") + frame;
    else if (tally.failed == most_listed + 1)
        tally.failed_frames += ", ...";
    ZtError("Frame %s failed%s%s\n", frame.c_str(), why.empty() ? "" : ": ",
            why.c_str());
    if (code == ExitCannotRead || code == ExitCannotWrite)
        runner.outcome.Note(code);
}

} // namespace ztsh
