#include "gles/Crc32.h"

#include <zlib.h>

#include <algorithm>
#include <limits>

#if defined(__x86_64__)
#include <immintrin.h>
#endif

namespace Nib
{

namespace
{

// In pieces that crc32() can count; the zlib of older devices has no crc32_z(). A null pointer
// would start anew in zlib, so no data is no call.
std::uint64_t ContinueByZlib(std::uint64_t crc, const unsigned char* bytes, std::size_t size)
{
    while (size != 0)
    {
        const auto piece =
            static_cast<uInt>(std::min<std::size_t>(size, std::numeric_limits<uInt>::max()));
        crc = crc32(static_cast<uLong>(crc), bytes, piece);
        bytes += piece;
        size -= piece;
    }
    return crc;
}

#if defined(__x86_64__)

// A CRC is the remainder of the message, as a polynomial over {0, 1}, by a fixed one. So the first
// 64 bytes may be replaced by what has the same remainder and lies further back: each 16 bytes, as
// two halves, times the remainder of the power of x that they are moved by. The first bit of a byte
// is the lowest, which makes a product one place too long; the factors make up for it.

constexpr std::uint32_t kPolynomial = 0xEDB88320; // x^32 and the rest, lowest power first

// The factor that moves a half by @p power places.
constexpr std::uint64_t Factor(int power)
{
    std::uint32_t remainder = 0x80000000; // 1
    for (int i = 0; i < power; ++i)
        remainder = (remainder >> 1) ^ ((remainder & 1) != 0 ? kPolynomial : 0);
    return std::uint64_t{remainder} << 1;
}

struct Factors
{
    std::uint64_t first;  // of the half that comes first
    std::uint64_t second; // of the other
};

constexpr std::size_t kLane = 16; // bytes
constexpr std::size_t kLanes = 4; // folded side by side
constexpr std::size_t kBlock = kLane * kLanes;

constexpr Factors FactorsOver(std::size_t bytes)
{
    const int bits = static_cast<int>(bytes * 8);
    return {Factor(bits + 32), Factor(bits - 32)};
}

constexpr Factors kOverBlock = FactorsOver(kBlock);
constexpr Factors kOverLane = FactorsOver(kLane);

#define NIB_CARRYLESS __attribute__((target("pclmul")))

NIB_CARRYLESS inline __m128i Load(const unsigned char* bytes)
{
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes));
}

NIB_CARRYLESS inline __m128i Vector(const Factors& factors)
{
    return _mm_set_epi64x(static_cast<long long>(factors.second),
                          static_cast<long long>(factors.first));
}

// @p lane moved onto @p next.
NIB_CARRYLESS inline __m128i Folded(__m128i lane, __m128i factors, __m128i next)
{
    const __m128i first = _mm_clmulepi64_si128(lane, factors, 0x00);
    const __m128i second = _mm_clmulepi64_si128(lane, factors, 0x11);
    return _mm_xor_si128(_mm_xor_si128(first, second), next);
}

// The CRC over whole blocks, @p count of them and at least one.
NIB_CARRYLESS std::uint64_t ContinueOverBlocks(std::uint64_t crc, const unsigned char* bytes,
                                               std::size_t count)
{
    __m128i lanes[kLanes];
    for (std::size_t i = 0; i < kLanes; ++i)
        lanes[i] = Load(bytes + i * kLane);
    lanes[0] = _mm_xor_si128(lanes[0], _mm_cvtsi32_si128(static_cast<int>(~crc)));

    const __m128i overBlock = Vector(kOverBlock);
    while (--count != 0)
    {
        bytes += kBlock;
        for (std::size_t i = 0; i < kLanes; ++i)
            lanes[i] = Folded(lanes[i], overBlock, Load(bytes + i * kLane));
    }

    const __m128i overLane = Vector(kOverLane);
    for (std::size_t i = 1; i < kLanes; ++i)
        lanes[i] = Folded(lanes[i - 1], overLane, lanes[i]);
    unsigned char last[kLane];
    _mm_storeu_si128(reinterpret_cast<__m128i*>(last), lanes[kLanes - 1]);
    // Its remainder, from the register 0 on, which is this CRC for zlib.
    return ContinueByZlib(0xFFFFFFFF, last, sizeof last);
}

#undef NIB_CARRYLESS

bool CanFold()
{
    return __builtin_cpu_supports("pclmul") != 0;
}

#endif

} // namespace

std::uint64_t ContinueCrc(std::uint64_t crc, const void* data, std::size_t size)
{
    const auto* bytes = static_cast<const unsigned char*>(data);
#if defined(__x86_64__)
    const std::size_t blocks = size / kBlock;
    if (blocks != 0 && CanFold())
    {
        crc = ContinueOverBlocks(crc, bytes, blocks);
        bytes += blocks * kBlock;
        size -= blocks * kBlock;
    }
#endif
    return ContinueByZlib(crc, bytes, size);
}

} // namespace Nib
