#ifndef ZT_TESTS_SOUND_AIFF_BYTES_H
#define ZT_TESTS_SOUND_AIFF_BYTES_H

/// \file
/// Sound files spelled out byte by byte, and a reader of them that shares
/// nothing with the library.

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

/// Makes a string of these bytes.
std::string ByteString(std::initializer_list<int> bytes);

std::string BigEndian16(std::uint32_t value);
std::string BigEndian32(std::uint32_t value);

/// A chunk: its name, its size and its content, padded to an even length.
std::string Chunk(const std::string& name, const std::string& content);

/// What a COMM chunk says; every field as it stands in the file.
struct Comm
{
    int channels = 1;
    std::uint32_t frames = 4;
    int bits = 16;
    std::string rate = ByteString({0x40, 0x0B, 0xFA, 0, 0, 0, 0, 0, 0, 0});
    std::string compression = std::string("NONE\0\0", 6);
};

std::string CommChunk(const Comm& comm);
std::string FverChunk();

/// An SSND chunk of these bytes of samples.
std::string SsndChunk(const std::string& data, std::uint32_t offset = 0);

/// A FORM of these chunks.
std::string Form(const std::string& chunks, const std::string& type = "AIFC");

/// Eight bytes of samples: 258, 772, 1286 and 1800 in sixteen bits.
std::string PlainData();

/// The ordinary file: four frames, mono, 16 bits, 8000 hertz.
std::string PlainAifc(const Comm& comm = {});

/// What a reader finds in a sound file.
struct SoundFile
{
    int channels = 0;
    std::uint32_t frames = 0;
    int bits = 0;
    long double rate = 0;
    std::string compression;
    std::uint32_t version = 0;
    std::vector<std::int32_t> samples; ///< As wide as they are.
};

/// Reads an AIFF-C file, strictly: every size has to be right.
///
/// Returns: nothing for a file that breaks any rule of the format.
std::optional<SoundFile> ReadAifc(const std::string& file);

#endif
