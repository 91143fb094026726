#ifndef ZTSH_WORDS_RECOGNIZER_WORDS_H
#define ZTSH_WORDS_RECOGNIZER_WORDS_H

/// \file
/// The words for recognizers, which scripts hold by name.

#include "pictures/picture_table.h"
#include "recognizers/recognizer_table.h"
#include "script/runner.h"
#include "words/word_director.h"

namespace ztsh {

/// Recognizer, Target, Targets, Recognize, DrawResults, Recognizers and
/// FreeRecognizer.
class RecognizerWords : public WordDirector
{
public:
    /// Requires: all that is given outlives the director.
    RecognizerWords(Runner& script_runner, PictureTable& picture_table,
                    KvoRecognizerCatalog& recognizer_catalog);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    HeldRecognizer* find(int selector, const char* name);
    bool has_picture(int selector, const char* name) const;
    void fetch(const std::string& name, const std::string& plug);
    void add_target(const KvoStatement& statement);
    void list_targets(const char* name);
    void recognize(const KvoStatement& statement);
    void draw_results(const KvoStatement& statement);
    void list();

    Runner& runner;
    PictureTable& pictures;
    KvoRecognizerCatalog& catalog;
    RecognizerTable recognizers;
};

} // namespace ztsh

#endif
