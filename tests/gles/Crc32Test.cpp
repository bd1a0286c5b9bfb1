#include "gles/Crc32.h"

#include <gtest/gtest.h>

#include <vector>

using Nib::ContinueCrc;
using Bytes = std::vector<unsigned char>;

namespace
{

constexpr std::size_t kLongest = 700; // several blocks, whatever their size, and their remainders

Bytes SomeBytes()
{
    Bytes bytes(kLongest + 16);
    std::uint32_t state = 1;
    for (unsigned char& byte : bytes)
    {
        state = state * 1664525 + 1013904223;
        byte = static_cast<unsigned char>(state >> 24);
    }
    return bytes;
}

/// Bit by bit, as the sum is defined.
std::uint64_t PlainCrc(std::uint64_t crc, const unsigned char* bytes, std::size_t size)
{
    auto state = ~static_cast<std::uint32_t>(crc);
    for (std::size_t i = 0; i < size; ++i)
    {
        state ^= bytes[i];
        for (int bit = 0; bit < 8; ++bit)
            state = (state >> 1) ^ ((state & 1) != 0 ? 0xEDB88320u : 0u);
    }
    return static_cast<std::uint32_t>(~state);
}

} // namespace

TEST(Crc32, OfKnownTexts)
{
    EXPECT_EQ(ContinueCrc(0, "123456789", 9), 0xCBF43926u);
    EXPECT_EQ(ContinueCrc(0, Bytes(32, 0x00).data(), 32), 0x190A55ADu);
    EXPECT_EQ(ContinueCrc(0, Bytes(32, 0xFF).data(), 32), 0xFF6CAB0Bu);
    EXPECT_EQ(ContinueCrc(0, Bytes(1024, 'a').data(), 1024), 0x7C5597B9u);
}

TEST(Crc32, OfNothingStaysAsItIs)
{
    EXPECT_EQ(ContinueCrc(0, nullptr, 0), 0u);
    EXPECT_EQ(ContinueCrc(0x12345678, "", 0), 0x12345678u);
}

TEST(Crc32, OfEveryLengthIsThatOfItsBits)
{
    const Bytes bytes = SomeBytes();
    for (std::size_t size = 0; size <= kLongest; ++size)
        ASSERT_EQ(ContinueCrc(0, bytes.data(), size), PlainCrc(0, bytes.data(), size)) << size;
}

TEST(Crc32, DoesNotDependOnWhereTheBytesLie)
{
    const Bytes bytes = SomeBytes();
    for (std::size_t start = 0; start < 16; ++start)
        ASSERT_EQ(ContinueCrc(0, &bytes[start], 600), PlainCrc(0, &bytes[start], 600)) << start;
}

TEST(Crc32, MayBeTakenInPieces)
{
    const Bytes bytes = SomeBytes();
    const std::uint64_t whole = ContinueCrc(0, bytes.data(), kLongest);
    for (std::size_t border = 0; border <= kLongest; ++border)
    {
        const std::uint64_t first = ContinueCrc(0, bytes.data(), border);
        ASSERT_EQ(ContinueCrc(first, &bytes[border], kLongest - border), whole) << border;
    }
}
