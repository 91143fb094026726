#include "KVO/KvoToken.h"

#include <cstdlib>
#include <cstring>

#include "command/token_reader.h"
#include "core/write_text.h"

KvoToken::KvoToken(const char* special_characters)
    : quote(0), table(action_table(special_characters)), text(room), length(0),
      capacity(room_bytes), room()
{}

KvoToken::KvoToken(const KvoToken& other)
    : KvoObject(other), quote(other.quote), table(other.table), text(room),
      length(0), capacity(room_bytes), room()
{
    assign_text(other.text, other.length);
}

KvoToken& KvoToken::operator=(const KvoToken& other)
{
    if (this == &other)
        return *this;
    KvoObject::operator=(other);
    quote = other.quote;
    table = other.table;
    assign_text(other.text, other.length);
    return *this;
}

KvoToken::~KvoToken()
{
    release_text();
}

void KvoToken::SetSpecial(const char* special_characters)
{
    table = action_table(special_characters);
}

void KvoToken::Set(const char* new_text)
{
    quote = 0;
    const char* from = new_text ? new_text : "";
    assign_text(from, std::strlen(from));
}

void KvoToken::Read(std::istream& in)
{
    KvoTokenReader::read_token(in, *this);
}

void KvoToken::Write(std::ostream& out)
{
    zt_core::write_text(out, text);
}

void KvoToken::WriteQuoted(std::ostream& out)
{
    for (const char* c = text; !quote && *c; ++c)
        if (table->ActionOf(*c) & ActionTable::Blank)
            quote = '"';
    if (quote)
        zt_core::write_character(out, quote);
    Write(out);
    if (quote && quote != '\\')
        zt_core::write_character(out, quote);
}

const char* KvoToken::Blanks()
{
    return " \t\f\n\r\v";
}

void KvoToken::clear_text()
{
    length = 0;
    text[0] = '\0';
}

// Takes over `bytes` characters, which may lie in the present text. Without
// memory for them the text becomes empty.
void KvoToken::assign_text(const char* from, std::size_t bytes)
{
    if (bytes < capacity) {
        std::memmove(text, from, bytes);
        length = bytes;
        text[length] = '\0';
        return;
    }
    char* block = static_cast<char*>(std::malloc(bytes + 1));
    if (block)
        std::memcpy(block, from, bytes);
    release_text();
    if (!block)
        return;
    text = block;
    capacity = bytes + 1;
    length = bytes;
    text[length] = '\0';
}

// Adds `bytes` characters from elsewhere. Without memory for them they are
// dropped.
void KvoToken::append_text(const char* from, std::size_t bytes)
{
    if (bytes >= capacity - length && !grow_text(bytes))
        return;
    std::memcpy(text + length, from, bytes);
    length += bytes;
    text[length] = '\0';
}

// Makes room for `more` characters behind the text, and for half as many again
// as there will be, so that a text of any length grows in linear time.
bool KvoToken::grow_text(std::size_t more)
{
    const std::size_t needed = length + more + 1;
    const std::size_t wanted = needed + needed / 2;
    char* block = static_cast<char*>(text == room ? std::malloc(wanted)
                                                  : std::realloc(text, wanted));
    if (!block)
        return false;
    if (text == room)
        std::memcpy(block, room, length + 1);
    text = block;
    capacity = wanted;
    return true;
}

void KvoToken::release_text()
{
    if (text != room)
        std::free(text);
    text = room;
    capacity = room_bytes;
    clear_text();
}
