#include "reception.h"

#include <algorithm>
#include <cstdint>
#include <cstring>

namespace framestore {

void Reception::Take(const char* bytes, std::size_t count)
{
    if (count_so_far < head_bytes) {
        const std::size_t part = std::min(count, head_bytes - count_so_far);
        std::memcpy(head + count_so_far, bytes, part);
        count_so_far += part;
        bytes += part;
        count -= part;
        if (count_so_far == head_bytes)
            file.emplace(storage, number());
    }
    if (!file || Complete())
        return;
    const std::size_t part = std::min(count, message_bytes - count_so_far);
    if (part == 0)
        return;
    file->Write(bytes, part);
    count_so_far += part;
    if (!Complete())
        return;
    why = file->Finish();
    written = file->Name();
    file.reset(); // A refused frame leaves nothing from now on.
}

std::string Reception::Line(const std::string& address) const
{
    return "frame " + std::to_string(number()) + " from " + sender() + " (" +
           address +
           "): " + (why.empty() ? "wrote " + written : "refused: " + why);
}

/// Gives the number in the message, the most significant byte first.
int Reception::number() const
{
    std::uint32_t number = 0;
    for (std::size_t i = name_bytes; i < head_bytes; ++i)
        number = number << 8 | static_cast<unsigned char>(head[i]);
    return static_cast<int>(number);
}

/// Gives the sender's name, made fit to be shown: it may be anything.
std::string Reception::sender() const
{
    std::string name(head, std::find(head, head + name_bytes, '\0'));
    for (char& character : name)
        if (character <= ' ' || character > '~')
            character = '?';
    return name.empty() ? "a nameless host" : name;
}

} // namespace framestore
