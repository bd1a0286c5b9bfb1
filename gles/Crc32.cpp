#include "gles/Crc32.h"

#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <limits>

#if defined(__x86_64__)
#include <cpuid.h>
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
// 16 bytes, a lane, may be replaced by what has the same remainder and lies further back: each of
// their halves, times the remainder of the power of x that it is moved by. The first bit of a byte
// is the lowest, which makes a product one place too long; the factors make up for it.

constexpr std::uint64_t kPolynomial = 0x104C11DB7; // x^32 the highest bit
constexpr int kDegree = 32;

constexpr std::uint64_t Reflected(std::uint64_t bits, int count)
{
    std::uint64_t reflected = 0;
    for (int i = 0; i < count; ++i)
        reflected |= ((bits >> i) & 1) << (count - 1 - i);
    return reflected;
}

// The remainder of x to the @p power, as a factor.
constexpr std::uint64_t Factor(int power)
{
    std::uint64_t remainder = 1;
    for (int i = 0; i < power; ++i)
    {
        remainder <<= 1;
        if ((remainder >> kDegree) != 0)
            remainder ^= kPolynomial;
    }
    return Reflected(remainder, kDegree) << 1;
}

// x^64 divided by the polynomial, by which a remainder is found without dividing.
constexpr std::uint64_t Quotient()
{
    std::uint64_t quotient = 0;
    std::uint64_t rest = std::uint64_t{1} << kDegree;
    for (int place = kDegree; place >= 0; --place, rest <<= 1)
    {
        if ((rest >> kDegree) == 0)
            continue;
        quotient |= std::uint64_t{1} << place;
        rest ^= kPolynomial;
    }
    return quotient;
}

struct Pair
{
    std::uint64_t first; // of the bytes that come first
    std::uint64_t second;
};

constexpr std::size_t kLane = 16; // bytes
constexpr std::size_t kLanes = 4; // folded side by side
constexpr std::size_t kBlock = kLane * kLanes;

constexpr Pair FactorsOver(std::size_t bytes)
{
    const int bits = static_cast<int>(bytes * 8);
    return {Factor(bits + kDegree), Factor(bits - kDegree)};
}

constexpr Pair kOverBlock = FactorsOver(kBlock);
constexpr Pair kOverLane = FactorsOver(kLane);
constexpr Pair kOverHalf = {Factor(64), 0};
constexpr Pair kDivision = {Reflected(kPolynomial, kDegree + 1),
                            Reflected(Quotient(), kDegree + 1)};

#define NIB_CARRYLESS __attribute__((target("pclmul")))

// Which halves _mm_clmulepi64_si128 multiplies.
constexpr int kFirstByFirst = 0x00;
constexpr int kFirstBySecond = 0x10;
constexpr int kSecondBySecond = 0x11;

NIB_CARRYLESS inline __m128i Load(const unsigned char* bytes)
{
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes));
}

NIB_CARRYLESS inline void Store(unsigned char* bytes, __m128i lane)
{
    _mm_storeu_si128(reinterpret_cast<__m128i*>(bytes), lane);
}

NIB_CARRYLESS inline __m128i Vector(const Pair& pair)
{
    return _mm_set_epi64x(static_cast<long long>(pair.second), static_cast<long long>(pair.first));
}

// @p lane moved onto @p next.
NIB_CARRYLESS inline __m128i Folded(__m128i lane, __m128i factors, __m128i next)
{
    const __m128i first = _mm_clmulepi64_si128(lane, factors, kFirstByFirst);
    const __m128i second = _mm_clmulepi64_si128(lane, factors, kSecondBySecond);
    return _mm_xor_si128(_mm_xor_si128(first, second), next);
}

// The lane that stands for @p lane and for @p size bytes behind it, fewer than a lane.
NIB_CARRYLESS inline __m128i FoldedOntoRest(__m128i lane, const unsigned char* rest,
                                            std::size_t size)
{
    unsigned char joined[3 * kLane] = {}; // zeros before a message change nothing
    Store(joined + kLane, lane);
    std::memcpy(joined + 2 * kLane, rest, size);
    return Folded(Load(joined + size), Vector(kOverLane), Load(joined + size + kLane));
}

// The remainder of a lane with 32 zeros behind it.
NIB_CARRYLESS inline std::uint32_t Remainder(__m128i lane)
{
    const __m128i low = _mm_set_epi32(0, 0, 0, -1);
    __m128i rest = _mm_xor_si128(_mm_clmulepi64_si128(lane, Vector(kOverLane), kFirstBySecond),
                                 _mm_srli_si128(lane, 8)); // 96 bits
    rest = _mm_xor_si128(
        _mm_clmulepi64_si128(_mm_and_si128(rest, low), Vector(kOverHalf), kFirstByFirst),
        _mm_srli_si128(rest, 4)); // 64 bits
    const __m128i division = Vector(kDivision);
    __m128i multiple = _mm_clmulepi64_si128(_mm_and_si128(rest, low), division, kFirstBySecond);
    multiple = _mm_clmulepi64_si128(_mm_and_si128(multiple, low), division, kFirstByFirst);
    rest = _mm_xor_si128(rest, multiple);
    return static_cast<std::uint32_t>(_mm_cvtsi128_si32(_mm_srli_si128(rest, 4)));
}

// A lane that stands for all whole blocks; @p bytes is moved behind them. At least one.
NIB_CARRYLESS inline __m128i FoldedBlocks(__m128i first, const unsigned char*& bytes,
                                          std::size_t blocks)
{
    __m128i lanes[kLanes];
    for (std::size_t i = 0; i < kLanes; ++i)
        lanes[i] = Load(bytes + i * kLane);
    lanes[0] = _mm_xor_si128(lanes[0], first);
    const __m128i overBlock = Vector(kOverBlock);
    while (--blocks != 0)
    {
        bytes += kBlock;
        for (std::size_t i = 0; i < kLanes; ++i)
            lanes[i] = Folded(lanes[i], overBlock, Load(bytes + i * kLane));
    }
    bytes += kBlock;
    for (std::size_t i = 1; i < kLanes; ++i)
        lanes[i] = Folded(lanes[i - 1], Vector(kOverLane), lanes[i]);
    return lanes[kLanes - 1];
}

// For a lane or more.
NIB_CARRYLESS std::uint64_t ContinueByFolding(std::uint64_t crc, const unsigned char* bytes,
                                              std::size_t size)
{
    const __m128i start = _mm_cvtsi32_si128(static_cast<int>(~crc));
    const unsigned char* const end = bytes + size;
    __m128i lane;
    if (size >= kBlock)
    {
        lane = FoldedBlocks(start, bytes, size / kBlock);
    }
    else
    {
        lane = _mm_xor_si128(Load(bytes), start);
        bytes += kLane;
    }
    for (; bytes + kLane <= end; bytes += kLane)
        lane = Folded(lane, Vector(kOverLane), Load(bytes));
    if (bytes != end)
        lane = FoldedOntoRest(lane, bytes, static_cast<std::size_t>(end - bytes));
    return static_cast<std::uint32_t>(~Remainder(lane));
}

#undef NIB_CARRYLESS

// Asked at the first use. The compiler's own list of what a processor can do asks at load and for
// everything, and a virtual machine makes 5 us of every question.
bool HasCarryLessMultiplication()
{
    unsigned a, b, c, d;
    __cpuid(1, a, b, c, d);
    return (c & bit_PCLMUL) != 0;
}

bool CanFold(std::size_t size)
{
    static const bool can = HasCarryLessMultiplication();
    return size >= kLane && can;
}

#else

constexpr bool CanFold(std::size_t)
{
    return false;
}

std::uint64_t ContinueByFolding(std::uint64_t crc, const unsigned char* bytes, std::size_t size)
{
    return ContinueByZlib(crc, bytes, size);
}

#endif

} // namespace

std::uint64_t ContinueCrc(std::uint64_t crc, const void* data, std::size_t size)
{
    const auto* const bytes = static_cast<const unsigned char*>(data);
    return CanFold(size) ? ContinueByFolding(crc, bytes, size) : ContinueByZlib(crc, bytes, size);
}

} // namespace Nib
