#include "prompt/prompt_source.h"

namespace ztsh {

PromptSource::PromptSource(LineEditor& line_editor)
    : editor(line_editor), buffer(*this), in(&buffer)
{}

Next PromptSource::Read(KvoStatement& statement)
{
    cancelled = false;
    statement.Read(in);
    if (cancelled) {
        buffer.Drop();
        quotes = QuoteState();
        in.clear();
        return Next::Cancelled;
    }
    return in.good() && statement.Count() > 0 ? Next::Got : Next::End;
}

PromptSource::Buffer::Buffer(PromptSource& own_source) : source(own_source) {}

void PromptSource::Buffer::Drop()
{
    setg(nullptr, nullptr, nullptr);
}

PromptSource::Buffer::int_type PromptSource::Buffer::underflow()
{
    if (gptr() < egptr())
        return traits_type::to_int_type(*gptr());
    bool goes_on = source.block_depth > 0 || source.quotes.Open();
    std::string typed;
    Typed outcome =
        source.editor.Ask(goes_on ? further_prompt : first_prompt, typed);
    source.cancelled = outcome == Typed::Cancelled;
    if (outcome != Typed::Line)
        return traits_type::eof();

    typed += '\n';
    source.quotes.Add(typed);
    char last = egptr() > eback() ? egptr()[-1] : '\0';
    line = last + typed;
    setg(line.data(), line.data() + 1, line.data() + line.size());
    return traits_type::to_int_type(*gptr());
}

} // namespace ztsh
