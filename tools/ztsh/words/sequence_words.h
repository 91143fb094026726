#ifndef ZTSH_WORDS_SEQUENCE_WORDS_H
#define ZTSH_WORDS_SEQUENCE_WORDS_H

/// \file
/// The word for numbered sequences.

#include "geometry/geometry.h"
#include "pictures/picture_table.h"
#include "script/runner.h"
#include "sequence/frame_range.h"
#include "sequence/progress_bar.h"
#include "sequence/worker_pool.h"
#include "words/word_director.h"

namespace ztsh {

/// Frames: runs a block of statements for each frame of a range, in worker
/// processes if the shell has several. begin: skips a block that belongs to no
/// such word.
///
/// Every frame starts with the variables, pictures, values, shapes, directory
/// and frame rate that the sequence started with, whether it runs in a worker
/// or not; what it changes of these is gone at its end.
class SequenceWords : public WordDirector
{
public:
    /// Requires: all that is given outlives the director.
    SequenceWords(Runner& script_runner, PictureTable& picture_table,
                  Geometry& named_geometry);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    using Block = std::vector<StoredStatement>;
    struct Tally;

    void frames(KvoStatement& statement);
    void skip_block();
    void run(const FrameRange& range, const Block& block);
    void run_here(const FrameRange& range, const Block& block, Tally& tally);
    void run_in_workers(const FrameRange& range, const Block& block,
                        Tally& tally);
    int run_frame(const std::string& frame, const Block& block);
    void take(const std::string& frame, const JobResult& result, Tally& tally);
    void note_frame(const std::string& frame, int code, const std::string& why,
                    Tally& tally);

    Runner& runner;
    PictureTable& pictures;
    Geometry& geometry;
};

} // namespace ztsh

#endif
