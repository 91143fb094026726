#include "sound/aiff_bytes.h"

#include <algorithm>
#include <cmath>
#include <utility>

std::string ByteString(std::initializer_list<int> bytes)
{
    std::string text;
    for (int byte : bytes)
        text += static_cast<char>(byte);
    return text;
}

std::string BigEndian16(std::uint32_t value)
{
    return ByteString(
        {static_cast<int>(value >> 8 & 0xFF), static_cast<int>(value & 0xFF)});
}

std::string BigEndian32(std::uint32_t value)
{
    return BigEndian16(value >> 16) + BigEndian16(value & 0xFFFF);
}

std::string Chunk(const std::string& name, const std::string& content)
{
    return name + BigEndian32(static_cast<std::uint32_t>(content.size())) +
           content + (content.size() % 2 ? std::string(1, '\0') : "");
}

std::string CommChunk(const Comm& comm)
{
    return Chunk("COMM",
                 BigEndian16(static_cast<std::uint32_t>(comm.channels)) +
                     BigEndian32(comm.frames) +
                     BigEndian16(static_cast<std::uint32_t>(comm.bits)) +
                     comm.rate + comm.compression);
}

std::string FverChunk()
{
    return Chunk("FVER", BigEndian32(0xA2805140));
}

std::string SsndChunk(const std::string& data, std::uint32_t offset)
{
    return Chunk("SSND", BigEndian32(offset) + BigEndian32(0) + data);
}

std::string Form(const std::string& chunks, const std::string& type)
{
    return Chunk("FORM", type + chunks);
}

std::string PlainData()
{
    return ByteString({1, 2, 3, 4, 5, 6, 7, 8});
}

std::string PlainAifc(const Comm& comm)
{
    return Form(FverChunk() + CommChunk(comm) + SsndChunk(PlainData()));
}

namespace {

/// Takes pieces from the front of a text; what is not there breaks it.
class Taker
{
public:
    explicit Taker(std::string content) : text(std::move(content)) {}

    std::string Text(std::size_t bytes)
    {
        whole = whole && Left() >= bytes;
        const std::string taken = whole ? text.substr(at, bytes) : "";
        at += std::min(bytes, Left());
        return taken;
    }

    std::uint32_t Number(std::size_t bytes)
    {
        std::uint32_t value = 0;
        for (char byte : Text(bytes))
            value = value << 8 | static_cast<unsigned char>(byte);
        return value;
    }

    bool IsEmpty() const { return Left() == 0; }
    std::size_t Left() const { return text.size() - at; }

    bool whole = true;

private:
    std::string text;
    std::size_t at = 0;
};

long double Extended(Taker& from)
{
    const std::uint32_t head = from.Number(2);
    const long double high = from.Number(4);
    const long double low = from.Number(4);
    const int exponent = static_cast<int>(head & 0x7FFF) - 16383 - 63;
    const long double size = std::ldexp(high * 4294967296.0L + low, exponent);
    return head & 0x8000 ? -size : size;
}

std::int32_t Sample(Taker& from, std::size_t bytes)
{
    const std::uint32_t value = from.Number(bytes)
                                << (32 - 8 * static_cast<unsigned>(bytes));
    return static_cast<std::int32_t>(value) >>
           (32 - 8 * static_cast<int>(bytes));
}

bool ReadComm(Taker chunk, SoundFile& found)
{
    found.channels = static_cast<int>(chunk.Number(2));
    found.frames = chunk.Number(4);
    found.bits = static_cast<int>(chunk.Number(2));
    found.rate = Extended(chunk);
    found.compression = chunk.Text(4);
    const std::size_t length = chunk.Number(1);
    chunk.Text(length);
    if (length % 2 == 0) // The length and the text are even together.
        chunk.Text(1);
    return chunk.whole && chunk.IsEmpty();
}

bool ReadSsnd(Taker chunk, SoundFile& found)
{
    const std::uint32_t offset = chunk.Number(4);
    const std::uint32_t block = chunk.Number(4);
    const auto bytes = static_cast<std::size_t>((found.bits + 7) / 8);
    while (chunk.whole && !chunk.IsEmpty() && bytes > 0)
        found.samples.push_back(Sample(chunk, bytes));
    return chunk.whole && offset == 0 && block == 0 &&
           found.samples.size() == std::size_t{found.frames} *
                                       static_cast<std::size_t>(found.channels);
}

} // namespace

std::optional<SoundFile> ReadAifc(const std::string& file)
{
    SoundFile found;
    Taker taker(file);
    bool is_sound = taker.Text(4) == "FORM";
    is_sound = is_sound && taker.Number(4) == taker.Left();
    is_sound = is_sound && taker.Text(4) == "AIFC";
    int chunks = 0;
    while (is_sound && !taker.IsEmpty()) {
        const std::string name = taker.Text(4);
        const std::uint32_t size = taker.Number(4);
        const std::string content = taker.Text(size);
        if (size % 2)
            is_sound = taker.Text(1) == std::string(1, '\0');
        is_sound = is_sound && taker.whole;
        if (name == "FVER")
            found.version = Taker(content).Number(4);
        else if (name == "COMM")
            is_sound = is_sound && ReadComm(Taker(content), found);
        else if (name == "SSND")
            is_sound = is_sound && ReadSsnd(Taker(content), found);
        ++chunks;
    }
    if (!is_sound || chunks != 3)
        return std::nullopt;
    return found;
}
