// The layout of what hosts see of the public structures: a host that was
// compiled against an older header of this version goes on working. The report
// of scripts/check-abi sees only what a function of the library mentions.

#include <KVO/KvoList.h>
#include <KVO/KvoObject.h>
#include <KVO/KvoSkipList.h>
#include <KVO/KvoTime.h>
#include <KVO/KvoVec.h>
#include <ZT/image_sgi.h>
#include <ZT/skip.h>
#include <ZT/timer.h>

#include <cstddef>

#include <gtest/gtest.h>

namespace {

// The same on every machine.
static_assert(sizeof(KvoTime) == 4);
static_assert(sizeof(ZtPixel) == 4);
static_assert(sizeof(QuarnHeader) == 10);
static_assert(offsetof(QuarnHeader, bits_per_pixel) == 8);
static_assert(sizeof(KvoVec3) == 12);
static_assert(offsetof(KvoVec3, z) == 8);
static_assert(sizeof(KvoVec4) == 16);
static_assert(offsetof(KvoVec4, w) == 12);
static_assert(sizeof(KvoMat) == 64);
static_assert(sizeof(KvoQuat) == 16);
static_assert(offsetof(KvoQuat, v) == 4);

// Where pointers have 64 bits.
constexpr bool wide = sizeof(void*) == 8;
static_assert(!wide || sizeof(KvoObject) == 16);
static_assert(!wide || sizeof(KvoNamedObject) == 24);
static_assert(!wide || sizeof(KvoClassInfo) == 16);
static_assert(!wide || sizeof(KvoList::Link) == 24);
static_assert(!wide || sizeof(KvoSkipList::SLNode) == 24);
static_assert(!wide || offsetof(KvoSkipList::SLNode, level) == 16);
static_assert(!wide || sizeof(ZtImageSGI) == 16);
static_assert(!wide || offsetof(ZtImageSGI, pixels) == 8);

} // namespace

// What the compiler has just checked must also hold for numbers in a file.
TEST(Layout, OfAPixAndATimeIsThatOfTheirFiles)
{
    EXPECT_EQ(sizeof(QuarnHeader), 5 * sizeof(std::uint16_t));
    EXPECT_EQ(sizeof(KvoTime), sizeof(std::int32_t));
}
