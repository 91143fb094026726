#include "ZT/filepath.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <ostream>
#include <string_view>

#include "ZT/util.h"

#include "core/joined_text.h"
#include "core/text_stream.h"
#include "core/write_text.h"
#include "platform/files.h"

namespace {
using zt_core::joined_text;

constexpr int no_number = 999999;

const char* or_empty(const char* text)
{
    return text ? text : "";
}

bool is_digit(char c)
{
    return c >= '0' && c <= '9';
}

// The value of the digits from `begin` to `end`, none at all being 0; too large
// a one is the largest int. -1 if anything but digits stands there.
int all_digits(const char* begin, const char* end)
{
    constexpr int most = std::numeric_limits<int>::max();
    int value = 0;
    for (; begin != end; ++begin) {
        if (!is_digit(*begin))
            return -1;
        const int digit = *begin - '0';
        value = value > (most - digit) / 10 ? most : value * 10 + digit;
    }
    return value;
}

int accessible(const char* path, zt_platform::Access access)
{
    return zt_platform::Files::current().accessible(path, access) ? 1 : 0;
}
} // namespace

ZtFilePath::ZtFilePath(const char* path) : KvoTokenList("/", "")
{
    read_text(path ? path : ".");
}

ZtFilePath::~ZtFilePath() = default;

void ZtFilePath::Write(std::ostream& out)
{
    Write(out, 0);
}

void ZtFilePath::Write(std::ostream& out, int parts)
{
    const int meant = parts_meant(parts);
    for (int part = 0; part < meant; ++part)
        zt_core::write_text(out, ArgText(part));
}

const char* ZtFilePath::FullPath() const
{
    return text_of(Count());
}

const char* ZtFilePath::Head() const
{
    if (Count() > 1)
        return text_of(parts_meant(ends_with_slash() ? -1 : -2));
    return text_of(ends_with_slash() ? 0 : Count());
}

const char* ZtFilePath::Tail() const
{
    return ZtNewTempString(ends_with_slash() ? "" : last_part());
}

const char* ZtFilePath::Root() const
{
    const std::string_view last = last_part();
    const std::size_t point = last.rfind('.');
    if (point == std::string_view::npos)
        return FullPath();
    const auto head = parts_joined(Count() - 1);
    const auto root =
        joined_text({or_empty(head.get()), last.substr(0, point)});
    return ZtNewTempString(root.get());
}

const char* ZtFilePath::Extension() const
{
    return ZtNewTempString(extension_part());
}

int ZtFilePath::Number() const
{
    const char* const begin = last_part();
    const char* stop = begin + std::strlen(begin);
    for (const char* place = stop; place != begin;) {
        --place;
        if (*place != '.')
            continue;
        const int number = all_digits(place + 1, stop);
        if (number >= 0)
            return number;
        stop = place;
    }
    return no_number;
}

const char* ZtFilePath::TrimHead(const char* head) const
{
    const auto full = parts_joined(Count());
    const char* rest = or_empty(full.get());
    const std::size_t bytes = std::strlen(or_empty(head));
    if (bytes != 0 && std::strncmp(rest, head, bytes) == 0) {
        rest += bytes;
        if (*rest == '/')
            ++rest;
    }
    return ZtNewTempString(rest);
}

void ZtFilePath::SetExtension(const char* extension)
{
    const std::string_view last = last_part();
    put_extension(last.substr(0, last.rfind('.')), extension);
}

void ZtFilePath::AddExtension(const char* extension, ForceType force)
{
    AddExtension(extension, static_cast<int>(force));
}

void ZtFilePath::AddExtension(const char* extension, int force)
{
    const bool has_name = Count() != 0 && !ends_with_slash();
    if (has_name && !force &&
        std::strcmp(extension_part(), or_empty(extension)) == 0)
        return;
    put_extension(last_part(), extension);
}

void ZtFilePath::ReplaceHead(const char* head)
{
    const char* const tail = ends_with_slash() ? "" : last_part();
    const auto path = joined_text({or_empty(head), head ? "/" : "", tail});
    if (path)
        read_text(path.get());
}

int ZtFilePath::IsWritable() const
{
    return accessible(FullPath(), zt_platform::Access::Write);
}

int ZtFilePath::IsReadable() const
{
    return accessible(FullPath(), zt_platform::Access::Read);
}

int ZtFilePath::IsExecutable() const
{
    return IsReadable();
}

int ZtFilePath::Exists() const
{
    return accessible(FullPath(), zt_platform::Access::Exists);
}

int ZtFilePath::WouldWrite() const
{
    return accessible(Head(), zt_platform::Access::Write);
}

bool ZtFilePath::ends_with_slash() const
{
    return *last_part() == '/';
}

void ZtFilePath::append_slash()
{
    append_token("/");
}

void ZtFilePath::append_part(const char* name)
{
    if (!ends_with_slash())
        append_slash();
    append_token(name);
}

const char* ZtFilePath::last_part() const
{
    return or_empty(ArgText(Count() - 1));
}

// How many parts a caller's count means.
int ZtFilePath::parts_meant(int parts) const
{
    if (parts < 0)
        return std::max(Count() + parts, 0);
    return parts == 0 ? Count() : std::min(parts, Count());
}

const char* ZtFilePath::extension_part() const
{
    const char* const point = std::strrchr(last_part(), '.');
    return point ? point + 1 : "";
}

std::unique_ptr<char[]> ZtFilePath::parts_joined(int parts) const
{
    std::size_t length = 0;
    for (int part = 0; part < parts; ++part)
        length += std::strlen(ArgText(part));
    std::unique_ptr<char[]> text(new (std::nothrow) char[length + 1]);
    char* place = text.get();
    if (!place)
        return text;
    for (int part = 0; part < parts; ++part) {
        const std::string_view piece = ArgText(part);
        place = std::copy(piece.begin(), piece.end(), place);
    }
    *place = '\0';
    return text;
}

const char* ZtFilePath::text_of(int parts) const
{
    return ZtNewTempString(parts_joined(parts).get());
}

// Gives the last name, which is to be `root` without extension, an extension;
// or makes a name of the extension alone where there is no name. The arguments
// may be temporary strings, so none is made before they have been used.
void ZtFilePath::put_extension(std::string_view root, const char* extension)
{
    const bool has_name = Count() != 0 && !ends_with_slash();
    const auto name =
        joined_text({has_name ? root : "", ".", or_empty(extension)});
    if (!name)
        return;
    if (has_name)
        Replace(Count() - 1, name.get());
    else
        append_part(name.get());
}

void ZtFilePath::read_text(const char* text)
{
    zt_core::TextStream in(text);
    Read(in);
}
