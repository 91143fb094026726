#include "platform/pages.h"

#include <cstdint>
#include <limits>
#include <unistd.h>

#include <gtest/gtest.h>

namespace {

using zt_platform::Pages;

TEST(Pages, AreZeroedAlignedAndWritable)
{
    const std::size_t bytes = 100000;

    auto* const memory =
        static_cast<unsigned char*>(Pages::current().map(bytes));

    ASSERT_NE(memory, nullptr);
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(memory) %
                  static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE)),
              0u);
    for (std::size_t place = 0; place < bytes; ++place) {
        ASSERT_EQ(memory[place], 0);
        memory[place] = 1;
    }
    Pages::current().unmap(memory, bytes);
}

TEST(Pages, NoBytesAreOnePage)
{
    auto* const memory = static_cast<char*>(Pages::current().map(0));

    ASSERT_NE(memory, nullptr);
    memory[0] = 1;
    Pages::current().unmap(memory, 0);
}

TEST(Pages, AreNullWhenThereAreNone)
{
    EXPECT_EQ(Pages::current().map(std::numeric_limits<std::size_t>::max() / 4),
              nullptr);
}

TEST(Pages, UnmappingNullDoesNothing)
{
    Pages::current().unmap(nullptr, 100);
}

} // namespace
