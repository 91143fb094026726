#include "script/source.h"

#include <sstream>

namespace ztsh {

void StatementSource::EnterBlock(int) {}

StreamSource::StreamSource(const std::string& script_name,
                           ScriptBuffer& script_buffer)
    : name(script_name), buffer(script_buffer), in(&script_buffer)
{}

Next StreamSource::Read(KvoStatement& statement)
{
    skip_to_statement();
    buffer.Mark();
    statement.Read(in);
    if (in.good() && statement.Count() > 0)
        return Next::Got;
    note_unfinished(statement);
    return Next::End;
}

Place StreamSource::Where()
{
    return {name, buffer.MarkedLine()};
}

/// Goes over blanks, empty statements and comments, which the statement reader
/// would do as well, only to know the line that the next statement begins on.
void StreamSource::skip_to_statement()
{
    constexpr int space = ' ';
    KvoTokenList comment("!", ";\n");
    while (in.good()) {
        int next = buffer.sgetc();
        if (next == '#' || next == '!')
            comment.Read(in);
        else if (next == ';' || (next >= 0 && next <= space))
            buffer.sbumpc();
        else
            return;
    }
}

void StreamSource::note_unfinished(KvoStatement& statement)
{
    std::ostringstream words;
    for (int i = 0; const char* word = statement.ArgText(i); ++i) {
        if (*word == '#' || *word == '!')
            break;
        if (*word != '\n')
            words << (words.str().empty() ? "" : " ") << word;
    }
    unfinished = words.str();
}

BlockSource::BlockSource(const std::vector<StoredStatement>& stored)
    : statements(stored), taken(0)
{}

Next BlockSource::Read(KvoStatement& statement)
{
    if (taken == statements.size())
        return Next::End;
    statement = statements[taken].statement;
    ++taken;
    return Next::Got;
}

Place BlockSource::Where()
{
    return taken == 0 ? Place{} : statements[taken - 1].place;
}

} // namespace ztsh
