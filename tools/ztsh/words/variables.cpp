#include "words/variables.h"

namespace ztsh {

namespace {

bool begins_name(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}

bool continues_name(char c)
{
    return begins_name(c) || (c >= '0' && c <= '9');
}

/// How many characters from `start` on are a name.
std::size_t name_length(const std::string& text, std::size_t start)
{
    std::size_t end = start;
    if (end < text.size() && begins_name(text[end]))
        while (end < text.size() && continues_name(text[end]))
            ++end;
    return end - start;
}

} // namespace

bool Variables::IsName(const std::string& name)
{
    return !name.empty() && name_length(name, 0) == name.size();
}

Variables::Variables(const Variables& other)
{
    *this = other;
}

Variables& Variables::operator=(const Variables& other)
{
    if (this == &other)
        return *this;
    while (!names.empty())
        Remove(*names.begin());
    for (const std::string& name : other.names)
        Set(name, other.Find(name));
    return *this;
}

const char* Variables::Find(const std::string& name) const
{
    return names.count(name) != 0 ? values.GetText(name.c_str()) : nullptr;
}

void Variables::Set(const std::string& name, const std::string& value)
{
    names.insert(name);
    values.Set(name.c_str(), value.c_str());
}

void Variables::Remove(const std::string& name)
{
    // The name may be the one that is about to be forgotten.
    values.Set(name.c_str(), "");
    names.erase(name);
}

std::string Variables::Expand(const std::string& text,
                              std::vector<std::string>& unknown) const
{
    std::string expanded;
    std::size_t at = 0;
    for (std::size_t dollar; (dollar = text.find('$', at)) != text.npos;) {
        expanded.append(text, at, dollar - at);
        bool braces = dollar + 1 < text.size() && text[dollar + 1] == '{';
        std::size_t start = dollar + (braces ? 2 : 1);
        std::size_t length = name_length(text, start);
        std::size_t end = start + length;
        if (braces && (end >= text.size() || text[end] != '}'))
            length = 0;
        if (length == 0) {
            expanded += '$';
            at = dollar + 1;
            continue;
        }
        at = end + (braces ? 1 : 0);
        std::string name = text.substr(start, length);
        if (const char* value = Find(name)) {
            expanded += value;
        } else {
            unknown.push_back(name);
            expanded.append(text, dollar, at - dollar);
        }
    }
    return expanded.append(text, at);
}

} // namespace ztsh
