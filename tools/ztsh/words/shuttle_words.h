#ifndef ZTSH_WORDS_SHUTTLE_WORDS_H
#define ZTSH_WORDS_SHUTTLE_WORDS_H

/// \file
/// The word for the library's play-back transport.

#include "script/runner.h"
#include "words/word_director.h"

#include <ZT/shuttle.h>

#include <map>
#include <memory>
#include <string>

namespace ztsh {

/// Shuttle: makes, plays and shows shuttles.
class ShuttleWords : public WordDirector
{
public:
    /// Requires: `script_runner` outlives the director.
    explicit ShuttleWords(Runner& script_runner);

protected:
    void Do(KvoStatement& statement, int selector) override;

private:
    struct Step;

    bool look(const std::string& name, const KvoStatement& statement);
    bool read_step(const KvoStatement& statement, int& next, Step& step,
                   bool& told);
    void take(const std::string& name, const std::vector<Step>& steps);
    ZtShuttle* find(const std::string& name);
    void watch(const std::string& name);
    void list();

    Runner& runner;
    std::map<std::string, std::unique_ptr<ZtShuttle>> shuttles;
};

} // namespace ztsh

#endif
