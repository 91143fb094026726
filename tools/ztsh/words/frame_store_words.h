#ifndef ZTSH_WORDS_FRAME_STORE_WORDS_H
#define ZTSH_WORDS_FRAME_STORE_WORDS_H

/// \file
/// The words for the frame store.

#include "pictures/picture_table.h"
#include "script/runner.h"
#include "sequence/progress_bar.h"
#include "words/word_director.h"

namespace ztsh {

/// SendFrame and SendFrames.
class FrameStoreWords : public WordDirector
{
public:
    /// Requires: `script_runner` and `picture_table` outlive the director.
    FrameStoreWords(Runner& script_runner, PictureTable& picture_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    void send(const char* name, const char* number);
    void send_sequence(KvoStatement& statement);
    bool send_file(const std::string& file, int number, ProgressBar& bar);

    Runner& runner;
    PictureTable& pictures;
};

} // namespace ztsh

#endif
