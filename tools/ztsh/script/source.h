#ifndef ZTSH_SCRIPT_SOURCE_H
#define ZTSH_SCRIPT_SOURCE_H

/// \file
/// Where the running statements come from: a stream, or a block of statements
/// that was read before.
///
/// A directive that opens a block reads it from the source that its own
/// statement came from, whatever kind that is.

#include "script/script_buffer.h"

#include <KVO/KvoStatement.h>

#include <istream>
#include <string>
#include <vector>

namespace ztsh {

/// Where a statement stands.
struct Place
{
    std::string name; ///< The script as the user named it; empty for none.
    long line = 0;    ///< Counted from 1.
};

/// What came of asking for a statement.
enum class Next {
    Got,       ///< There is one.
    End,       ///< There are no more.
    Cancelled, ///< The user took back what was typed; there may be more.
};

/// Gives statements one by one.
class StatementSource
{
public:
    StatementSource() = default;
    StatementSource(const StatementSource&) = delete;
    StatementSource& operator=(const StatementSource&) = delete;
    virtual ~StatementSource() = default;

    /// Reads the next statement; it has at least one word when there is one.
    virtual Next Read(KvoStatement& statement) = 0;

    /// Tells where the statement stands that was read last.
    virtual Place Where() = 0;

    /// Is told that the statements to come belong to a block inside `depth`
    /// others, 0 when the block is over.
    virtual void EnterBlock(int depth);
};

/// The statements of a stream, up to its end.
///
/// As in the library's own `Include`, a last statement that ends at the end of
/// input rather than at a newline or ";" is read but not given.
class StreamSource : public StatementSource
{
public:
    /// Requires: `script_buffer` outlives the source.
    StreamSource(const std::string& script_name, ScriptBuffer& script_buffer);

    Next Read(KvoStatement& statement) override;
    Place Where() override;

    /// Gives the words of a last statement that was not given, comments left
    /// out; empty when all were given.
    const std::string& Unfinished() const { return unfinished; }

private:
    void skip_to_statement();
    void note_unfinished(KvoStatement& statement);

    std::string name;
    ScriptBuffer& buffer;
    std::istream in;
    std::string unfinished;
};

/// A statement that was read before.
struct StoredStatement
{
    KvoStatement statement;
    Place place;
};

/// Statements that were read before.
class BlockSource : public StatementSource
{
public:
    /// Requires: `stored` outlives the source.
    explicit BlockSource(const std::vector<StoredStatement>& stored);

    Next Read(KvoStatement& statement) override;
    Place Where() override;

private:
    const std::vector<StoredStatement>& statements;
    std::size_t taken;
};

} // namespace ztsh

#endif
