#include "words/time_arguments.h"

#include "time/time_text.h"

#include <ZT/error.h>

#include <cstring>

namespace ztsh {

bool TakeWord(const KvoStatement& statement, const char* text, int& next)
{
    const char* word = statement.ArgText(next);
    if (!word || std::strcmp(word, text) != 0)
        return false;
    ++next;
    return true;
}

bool TakeTime(const char* word, const KvoStatement& statement, int& next,
              KvoTime& time)
{
    TimeReader reader(statement, next);
    bool right = reader.Read(time);
    if (!right)
        ZtError("%s: %s\n", word, reader.Why().c_str());
    next = reader.Next();
    return right;
}

bool TakeInto(Runner& runner, const KvoStatement& statement, int& next,
              KvoTime time)
{
    const char* name = statement.ArgText(next++);
    if (!name || next != statement.Count() || !Variables::IsName(name))
        return false;
    runner.variables.Set(name, TimeText(time));
    return true;
}

bool InSequence(const Runner& runner, const char* word)
{
    if (runner.sequence_depth == 0)
        return false;
    ZtError("%s: not inside a sequence\n", word);
    return true;
}

void TellNotUnderstood(const char* word)
{
    ZtError("%s: no such action, or the wrong words behind it; see Help %s\n",
            word, word);
}

} // namespace ztsh
