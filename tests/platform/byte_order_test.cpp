#include "platform/byte_order.h"

#include <vector>

#include <gtest/gtest.h>

namespace {

using namespace zt_platform;

TEST(byte_order, TheMostSignificantByteComesFirst)
{
    const unsigned char bytes[] = {0x81, 0x92, 0xA3, 0xB4};

    EXPECT_EQ(load_big_16(bytes), 0x8192);
    EXPECT_EQ(load_big_32(bytes), 0x8192A3B4u);
}

TEST(byte_order, WhatIsStoredIsReadBack)
{
    std::vector<unsigned char> bytes(6);

    store_big_16(bytes.data(), 0xFE01);
    store_big_32(bytes.data() + 2, 0x89ABCDEF);

    EXPECT_EQ(bytes,
              (std::vector<unsigned char>{0xFE, 0x01, 0x89, 0xAB, 0xCD, 0xEF}));
    EXPECT_EQ(load_big_16(bytes.data()), 0xFE01);
    EXPECT_EQ(load_big_32(bytes.data() + 2), 0x89ABCDEFu);
}

} // namespace
