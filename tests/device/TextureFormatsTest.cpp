#include "device/TextureFormats.h"

#include <gtest/gtest.h>

using namespace Nib;

TEST(TextureFormats, EachMemoryLayoutHasItsInternalFormat)
{
    constexpr unsigned expected[] = {
        0x8229, // 0 R8
        0x8234, // 1 R16UI
        0x8233, // 2 R16I
        0x8236, // 3 R32UI
        0x8235, // 4 R32I
        0x8051, // 5 RGB8
        0x8058, // 6 RGBA8
        0x822E, // 7 R32F
        0x8CAC, // 8 DEPTH_COMPONENT32F
        0x8815, // 9 RGB32F
        0x8814, // 10 RGBA32F
        0x881B, // 11 RGB16F
        0x1902, // 12 DEPTH_COMPONENT
        0x1909, // 13 LUMINANCE
        0x881A, // 14 RGBA16F
        0x8234, // 15 R16UI
        0x93A1, // 16 BGRA8
    };
    for (int i = 0; i < 17; ++i)
        EXPECT_EQ(GLES::GetTextureInternalFormat(static_cast<TextureMemoryLayout>(i)), expected[i])
            << i;
}

TEST(TextureFormats, EachLayoutHasItsFormat)
{
    constexpr unsigned expected[] = {0x1903, 0x8D94, 0x1908, 0x1903,
                                     0x1902, 0x1907, 0x1909, 0x80E1};
    for (int i = 0; i < 8; ++i)
        EXPECT_EQ(GLES::GetTextureFormat(static_cast<TextureTargetLayout>(i)), expected[i]) << i;
}

TEST(TextureFormats, IrregularCellsOfTheTypeTableStay)
{
    const auto type = [](int layout, int memoryLayout)
    {
        return GLES::GetTextureType(static_cast<TextureTargetLayout>(layout),
                                    static_cast<TextureMemoryLayout>(memoryLayout));
    };
    EXPECT_EQ(type(0, 15), 0x1406u);
    EXPECT_EQ(type(2, 7), 0x1401u);
    EXPECT_EQ(type(2, 13), 0u);
    EXPECT_EQ(type(2, 14), 0x1406u);
    EXPECT_EQ(type(5, 12), 0x1405u);
    EXPECT_EQ(type(7, 14), 0u);
}

TEST(TextureFormats, EveryCellOfTheTypeTable)
{
    constexpr unsigned B = 0x1401, US = 0x1403, S = 0x1402, UI = 0x1405, I = 0x1404, F = 0x1406,
                       HF = 0x140B;
    // One row a layout, one column a memory layout, 0 to 16.
    constexpr unsigned expected[8][17] = {
        {B, US, S, UI, I, B, B, F, F, F, F, HF, UI, B, 0, F, 0}, // 0
        {B, US, S, UI, I, B, B, F, F, F, F, HF, UI, B, 0, 0, 0}, // 1
        {0, 0, 0, 0, 0, 0, B, B, F, F, F, HF, UI, 0, F, B, B},   // 2
        {B, US, S, UI, I, B, B, F, F, F, F, HF, UI, B, 0, 0, 0}, // 3
        {0, 0, 0, 0, 0, 0, 0, 0, F, F, F, HF, UI, B, 0, 0, 0},   // 4
        {0, 0, 0, 0, 0, 0, B, B, F, F, F, HF, UI, B, 0, 0, 0},   // 5
        {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, B, 0, 0, 0},     // 6
        {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, B, 0, B, B},     // 7
    };
    for (int layout = 0; layout < 8; ++layout)
        for (int memoryLayout = 0; memoryLayout < 17; ++memoryLayout)
            EXPECT_EQ(GLES::GetTextureType(static_cast<TextureTargetLayout>(layout),
                                           static_cast<TextureMemoryLayout>(memoryLayout)),
                      expected[layout][memoryLayout])
                << layout << ", " << memoryLayout;
}

TEST(TextureFormats, NoPairIsMarkedAsUnsupported)
{
    for (const auto& row : GLES::kTextureType.rows)
        for (const unsigned type : row)
            EXPECT_NE(type, 0xFFFFFFFFu);
}
