#include "KVO/KvoArray.h"

#include <type_traits>

#include <gtest/gtest.h>

TEST(KvoTypedArray, HasItsElementsSize)
{
    EXPECT_EQ(KvoFloatArray().elementSize, 4);
    EXPECT_EQ(KvoIntArray().elementSize, 4);
    EXPECT_EQ(KvoCharArray().elementSize, 1);
    EXPECT_EQ(KvoByteArray().elementSize, 1);
    EXPECT_EQ(KvoStringArray().elementSize, static_cast<int>(sizeof(char*)));
}

TEST(KvoTypedArray, KeepsItsElements)
{
    char text[] = "text";
    KvoFloatArray floats(2);
    KvoCharArray chars(2);
    KvoByteArray bytes(2);
    KvoStringArray texts(2);

    floats[1] = 2.5f;
    chars[1] = 'c';
    bytes[1] = 255;
    texts[1] = text;

    EXPECT_EQ(floats[1], 2.5f);
    EXPECT_EQ(chars[1], 'c');
    EXPECT_EQ(bytes[1], 255);
    EXPECT_EQ(texts[1], text);
    EXPECT_EQ(texts[0], nullptr);
}

namespace {

template <typename Array>
void CheckGrowth(const char* kind)
{
    Array array;

    auto& element = array[3];
    using Element = std::remove_reference_t<decltype(element)>;

    EXPECT_TRUE(element == Element()) << kind;
    EXPECT_EQ(array.size, 4) << kind;
    EXPECT_EQ(array.capacity, 5) << kind;
    for (int i = 0; i < 4; ++i)
        EXPECT_TRUE(array[i] == Element()) << kind << ' ' << i;
}

} // namespace

TEST(KvoTypedArray, GrowsWithZerosWhateverItsElements)
{
    CheckGrowth<KvoFloatArray>("float");
    CheckGrowth<KvoIntArray>("int");
    CheckGrowth<KvoCharArray>("char");
    CheckGrowth<KvoByteArray>("byte");
    CheckGrowth<KvoStringArray>("text");
}

TEST(KvoTypedArray, TextsOutliveTheArray)
{
    char text[] = "still here";
    {
        KvoStringArray array(1);
        array[0] = text;
    }

    EXPECT_STREQ(text, "still here");
}
