#include "core/slab.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <set>

#include <gtest/gtest.h>

#include "support/FailingMemory.h"

namespace {

using zt_core::Slab;

constexpr std::size_t piece_bytes = 4096;

/// Carves a piece and remembers where it lies: slabs are held by nothing but
/// their pieces, and a memory checker takes those without any for lost.
char* Carve()
{
    static constinit std::array<void*, 20000> pieces = {};
    static constinit std::size_t count = 0;
    void* const piece = Slab::carve(piece_bytes);
    if (piece)
        pieces.at(count++) = piece;
    return static_cast<char*>(piece);
}

/// Cuts a block, writes to all of it, and remembers it likewise.
char* CutAndFill()
{
    static constinit std::array<void*, 2000> blocks = {};
    static constinit std::size_t count = 0;
    void* const block = Slab::cut_block();
    if (!block)
        return nullptr;
    std::memset(block, 1, Slab::block_bytes);
    blocks.at(count++) = block;
    return static_cast<char*>(block);
}

/// Carves so much that the slabs have begun to grow.
void CarveAMegabyte()
{
    for (std::size_t bytes = 0; bytes < std::size_t{1} << 20;
         bytes += piece_bytes)
        ASSERT_NE(Carve(), nullptr);
}

} // namespace

TEST(Slab, PiecesOfManySlabsLieApart)
{
    std::set<char*> pieces;

    for (int i = 0; i < 4000; ++i) {
        char* piece = Carve();
        ASSERT_NE(piece, nullptr);
        std::memset(piece, i % 256, piece_bytes);
        pieces.insert(piece);
    }

    ASSERT_EQ(pieces.size(), 4000u);
    const char* end = nullptr;
    for (const char* piece : pieces) {
        EXPECT_TRUE(!end || piece >= end);
        end = piece + piece_bytes;
    }
}

TEST(Slab, IsASmallOneWhenALargeOneIsRefused)
{
    CarveAMegabyte();
    FailingMemory one_refusal(0, 1);

    char* piece = nullptr;
    while (!FailingMemory::Failed())
        ASSERT_NE(piece = Carve(), nullptr);

    EXPECT_NE(piece, nullptr);
}

TEST(Slab, GivesNothingWithoutMemoryAndGoesOnAfterwards)
{
    {
        FailingMemory none;
        while (Carve()) {
        }
        EXPECT_TRUE(FailingMemory::Failed());
    }

    EXPECT_NE(Carve(), nullptr);
}

TEST(Slab, BlocksAreAlignedAndLieApart)
{
    std::set<char*> blocks;

    for (int i = 0; i < 100; ++i)
        blocks.insert(CutAndFill());

    ASSERT_EQ(blocks.size(), 100u);
    const char* end = nullptr;
    for (const char* block : blocks) {
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % Slab::block_bytes,
                  0u);
        EXPECT_TRUE(!end || block >= end);
        end = block + Slab::block_bytes;
    }
}

TEST(Slab, GivesNoBlockWithoutMemoryAndGoesOnAfterwards)
{
    {
        FailingMemory none;
        while (CutAndFill()) {
        }
        EXPECT_TRUE(FailingMemory::Failed());
    }

    EXPECT_NE(CutAndFill(), nullptr);
}
