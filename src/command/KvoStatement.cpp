#include "KVO/KvoStatement.h"

#include <cstring>

#include "command/fold_case.h"
#include "core/number_text.h"

KvoStatement::KvoStatement(const char* text) : KvoTokenList("!", ";\n")
{
    if (text)
        AddArg(text);
}

KvoStatement::KvoStatement(int argc, const char* const* argv)
    : KvoTokenList("!", ";\n")
{
    for (int i = 0; argv && i < argc; ++i)
        AddArg(argv[i]);
}

// Cleaning always starts at position 0, and a second pass over the same tokens
// may drop what the first one passed over. But a pass that dropped nothing need
// not be repeated until there are new tokens, and none that is plain is
// dropped.
void KvoStatement::Append(std::istream& in)
{
    const int held = Count();
    bool clean = held == 0;
    do {
        const Run run = append_run(in, '#');
        if (run == Run::Cut || !in.good())
            return;
        if (run == Run::Mixed || !clean)
            clean = drop_comments_and_continuations() == 0;
    } while (Count() == held);
}

void KvoStatement::Read(std::istream& in)
{
    Clear();
    KvoStatement::Append(in);
}

void* KvoStatement::Key()
{
    static char no_word[1] = "";
    KvoToken* word = Find(0);
    return word ? const_cast<char*>(word->Text()) : no_word;
}

int KvoStatement::Compare(void* key)
{
    return zt_command::compare_folded(static_cast<const char*>(Key()),
                                      static_cast<const char*>(key));
}

int KvoStatement::Matches(const char* text, int index)
{
    const char* word = ArgText(index);
    return word && text && std::strcmp(word, text) == 0;
}

void KvoStatement::AddArg(const char* text)
{
    append_token(text);
}

void KvoStatement::AddArg(int value)
{
    append_token(zt_core::int_to_text(value).c_str());
}

void KvoStatement::AddArg(float value)
{
    append_token(zt_core::float_to_text(value).c_str());
}

void KvoStatement::AddArg(double value)
{
    AddArg(static_cast<float>(value));
}

int KvoStatement::Extract(const char* text)
{
    const int index = FindPos(text);
    EatArg(index);
    return index;
}

char* KvoStatement::ExtractText(int index)
{
    const char* word = ArgText(index);
    char* copy = word ? KvoNewString(word) : nullptr;
    EatArg(index);
    return copy;
}

int KvoStatement::ExtractInt(int index)
{
    const int value = ArgInt(index);
    EatArg(index);
    return value;
}

float KvoStatement::ExtractFloat(int index)
{
    const float value = ArgFloat(index);
    EatArg(index);
    return value;
}

void KvoStatement::EatArg(int index)
{
    if (index >= 0 && index < Count())
        remove_tokens(index, 1);
}

// Keeps the order of what stays and gathers what goes behind it, so that a
// statement of any length is cleaned in one pass. Of a continuation only its
// own token goes: the one behind it is passed over, whatever it is.
//
// Returns: how many tokens were dropped.
int KvoStatement::drop_comments_and_continuations()
{
    const int all = Count();
    int kept = 0;
    for (int i = 0; i < all; ++i) {
        const char first = token_at(i)->Text()[0];
        if (first == '!' || first == '#')
            break;
        if (first == '\n' && ++i == all)
            break;
        if (kept != i)
            swap_tokens(kept, i);
        ++kept;
    }
    if (kept != all)
        remove_tokens(kept, all - kept);
    return all - kept;
}

void ZtEatBeginEndBlock(std::istream& in)
{
    KvoStatement statement;
    for (int open = 1; open > 0 && in.good();) {
        statement.Read(in);
        if (statement.Matches("begin", 0))
            ++open;
        else if (statement.Matches("end", 0))
            --open;
    }
}
