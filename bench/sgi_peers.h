#ifndef ZT_BENCH_SGI_PEERS_H
#define ZT_BENCH_SGI_PEERS_H

/// \file
/// Other programs' ways of reading and writing SGI files, as far as they were
/// found when the benchmark was built.

#include <functional>
#include <string>
#include <vector>

#include <ZT/image_sgi.h>

/// Writes the picture that it was made with; whether that went well.
using SgiWriter = std::function<bool(const char* path)>;

struct SgiPeer
{
    std::string name;
    /// Reads a file to 8-bit pixels in memory; whether that went well.
    bool (*read)(const char* path);
    /// Takes the pixels in the peer's own form, which is not timed; may be
    /// null.
    SgiWriter (*make_writer)(const std::vector<ZtPixel>& pixels, int width,
                             int height);
};

const std::vector<SgiPeer>& SgiPeers();

#endif
