#ifndef ZTSH_WORDS_PICTURE_WORDS_H
#define ZTSH_WORDS_PICTURE_WORDS_H

/// \file
/// The words for pictures, which scripts hold by name.

#include "pictures/picture_table.h"
#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Load, Info, Resize, ResizeBest, ScaleBest, Store, Png, Show, Copy, Paste,
/// Free and Pictures.
class PictureWords : public WordDirector
{
public:
    /// Requires: `script_runner` and `picture_table` outlive the director.
    PictureWords(Runner& script_runner, PictureTable& picture_table);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    const Picture* find(const char* word, const char* name);
    void load(KvoStatement& statement);
    void info(const char* name);
    void resize(KvoStatement& statement, int selector);
    void write(KvoStatement& statement, int selector);
    void show(const char* name);
    void copy(const char* from, const char* to);
    void paste(const KvoStatement& statement);
    void list();

    Runner& runner;
    PictureTable& pictures;
};

} // namespace ztsh

#endif
