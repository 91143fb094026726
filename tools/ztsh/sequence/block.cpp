#include "sequence/block.h"

#include <cstring>
#include <strings.h>

namespace ztsh {

namespace {

constexpr const char* begin_word = "begin";
constexpr const char* end_word = "end";
constexpr const char* do_word = "do";
constexpr const char* sequence_word = "Frames";
constexpr const char* clock_word = "Clock";

/// Tells the source how deep the statements stand, for as long as it lives.
class DepthTeller
{
public:
    explicit DepthTeller(StatementSource& told) : source(told) {}
    ~DepthTeller() { source.EnterBlock(0); }
    DepthTeller(const DepthTeller&) = delete;
    DepthTeller& operator=(const DepthTeller&) = delete;

    void Tell(int depth) { source.EnterBlock(depth); }

private:
    StatementSource& source;
};

} // namespace

bool OpensBlock(KvoStatement& statement, int first)
{
    if (statement.Matches(begin_word, first))
        return true;
    const char* word = statement.ArgText(first);
    if (!word)
        return false;
    if (strcasecmp(word, sequence_word) == 0)
        return statement.Matches(begin_word, statement.Count() - 1);
    if (strcasecmp(word, clock_word) != 0)
        return false;
    int next = first + 1;
    while (next < statement.Count() && !statement.Matches(do_word, next))
        ++next;
    return OpensBlock(statement, next + 1);
}

BlockRead ReadBlock(StatementSource& source, bool opened,
                    std::vector<StoredStatement>& block)
{
    DepthTeller teller(source);
    int depth = opened ? 1 : 0;
    for (;;) {
        teller.Tell(depth == 0 ? 1 : depth);
        StoredStatement read;
        Next next = source.Read(read.statement);
        if (next == Next::Cancelled)
            return BlockRead::Cancelled;
        if (next == Next::End)
            return depth == 0 ? BlockRead::NoBegin : BlockRead::NoEnd;
        bool own_begin = depth == 0;
        if (own_begin && !read.statement.Matches(begin_word, 0)) {
            block.push_back(std::move(read));
            return BlockRead::NoBegin;
        }
        if (OpensBlock(read.statement))
            ++depth;
        else if (read.statement.Matches(end_word, 0))
            --depth;
        if (depth == 0)
            return BlockRead::Whole;
        if (!own_begin) {
            read.place = source.Where();
            block.push_back(std::move(read));
        }
    }
}

} // namespace ztsh
