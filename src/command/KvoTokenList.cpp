#include "KVO/KvoToken.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <memory>
#include <new>

#include "command/token_reader.h"
#include "core/number_text.h"
#include "core/write_text.h"

namespace {
// What an emptied list keeps for its next statement: this many tokens, and of
// each no more text than this.
constexpr int most_spare_tokens = 64;

// The two strings one behind the other; null when there is no memory.
std::unique_ptr<char[]> joined(const char* first, const char* second)
{
    const std::size_t first_bytes = first ? std::strlen(first) : 0;
    const std::size_t second_bytes = second ? std::strlen(second) : 0;
    std::unique_ptr<char[]> text(
        new (std::nothrow) char[first_bytes + second_bytes + 1]);
    if (text) {
        std::memcpy(text.get(), first ? first : "", first_bytes);
        std::memcpy(text.get() + first_bytes, second ? second : "",
                    second_bytes);
        text[first_bytes + second_bytes] = '\0';
    }
    return text;
}
} // namespace

KvoTokenList::KvoTokenList(const char* special_characters,
                           const char* end_characters)
    : model(joined(special_characters, end_characters).get()), tokens(),
      count(0), long_texts(false), end(KvoNewString(end_characters))
{}

KvoTokenList::KvoTokenList(const KvoTokenList& other)
    : KvoObject(other), model(other.model), tokens(), count(0),
      long_texts(false), end(KvoNewString(other.end))
{
    copy_tokens(other);
}

KvoTokenList& KvoTokenList::operator=(const KvoTokenList& other)
{
    if (this == &other)
        return *this;
    KvoObject::operator=(other);
    char* new_end = KvoNewString(other.end);
    delete[] end;
    end = new_end;
    model = other.model;
    Clear();
    copy_tokens(other);
    return *this;
}

KvoTokenList::~KvoTokenList()
{
    tokens.DeleteContents();
    delete[] end;
}

void KvoTokenList::Clear()
{
    remove_tokens(0, count);
}

void KvoTokenList::Append(std::istream& in)
{
    append_run(in, '\0');
}

void KvoTokenList::Read(std::istream& in)
{
    Clear();
    KvoTokenList::Append(in);
}

void KvoTokenList::Write(std::ostream& out)
{
    for (int i = 0; i < count; ++i) {
        if (i > 0)
            zt_core::write_character(out, ' ');
        token_at(i)->Write(out);
    }
}

void KvoTokenList::WriteQuoted(std::ostream& out)
{
    for (int i = 0; i < count; ++i) {
        if (i > 0)
            zt_core::write_character(out, ' ');
        token_at(i)->WriteQuoted(out);
    }
}

KvoToken* KvoTokenList::Find(const char* text) const
{
    return Find(FindPos(text));
}

KvoToken* KvoTokenList::Find(int index) const
{
    long_texts = true; // the caller may set one
    return index >= 0 && index < count ? token_at(index) : nullptr;
}

int KvoTokenList::FindPos(const char* text) const
{
    for (int i = 0; text && i < count; ++i)
        if (std::strcmp(token_at(i)->text, text) == 0)
            return i;
    return -1;
}

int KvoTokenList::Replace(const char* old_text, const char* text)
{
    return Replace(FindPos(old_text), text);
}

int KvoTokenList::Replace(int index, const char* text)
{
    KvoToken* token = Find(index);
    if (token)
        token->Set(text);
    return token != nullptr;
}

const char* KvoTokenList::ArgText(int index) const
{
    return index >= 0 && index < count ? token_at(index)->text : nullptr;
}

int KvoTokenList::ArgInt(int index) const
{
    return zt_core::text_to_int(ArgText(index));
}

float KvoTokenList::ArgFloat(int index) const
{
    return static_cast<float>(zt_core::text_to_float(ArgText(index)));
}

KvoToken* KvoTokenList::append_token(const char* text)
{
    KvoToken* token = spare_token();
    if (token) {
        token->Set(text);
        long_texts = true;
        ++count;
    }
    return token;
}

KvoTokenList::Run KvoTokenList::append_run(std::istream& in, char mark)
{
    return in.good() ? KvoTokenReader::read_run(in, *this, mark) : Run::Plain;
}

void KvoTokenList::remove_tokens(int index, int removed)
{
    KvoObject** all = static_cast<KvoObject**>(tokens.data);
    if (index + removed < count)
        std::rotate(all + index, all + index + removed, all + count);
    count -= removed;
    if (long_texts || tokens.size - count > most_spare_tokens)
        trim_spares(removed);
}

// Adds a token behind all others for the list to use; null when there is no
// memory for one.
KvoToken* KvoTokenList::make_spare_token()
{
    if (count == INT_MAX)
        return nullptr;
    auto* made = new (std::nothrow) KvoToken(model);
    if (!made)
        return nullptr;
    tokens.Insert(made, count);
    if (tokens.size > count)
        return made;
    delete made;
    return nullptr;
}

void KvoTokenList::copy_tokens(const KvoTokenList& other)
{
    for (int i = 0; i < other.count; ++i) {
        KvoToken* token = spare_token();
        if (!token)
            return;
        *token = *other.token_at(i);
        long_texts = true;
        ++count;
    }
}

// Gives back what is too much to be kept of the spare tokens, of which the
// first `fresh` have just become so.
void KvoTokenList::trim_spares(int fresh)
{
    while (tokens.size - count > most_spare_tokens)
        delete tokens.Pop();
    const int last = std::min(count + fresh, tokens.size);
    for (int i = count; i < last; ++i)
        if (token_at(i)->capacity > most_spare_text_bytes)
            token_at(i)->release_text();
    long_texts = count > 0;
}
