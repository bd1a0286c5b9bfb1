#ifndef NIB_MATH_FLOAT4_H
#define NIB_MATH_FLOAT4_H

#include <cstring>

// Four floats side by side, in the compiler's own vector type: one source for SSE2 and NEON. Each
// lane is computed as the same expression of single floats would be, to the bit.

namespace Nib
{

using Float4 = float __attribute__((vector_size(16)));
using Bits4 = unsigned __attribute__((vector_size(16)));
using Double2 = double __attribute__((vector_size(16)));
using WideDouble4 = double __attribute__((vector_size(32)));

/// Reads four floats from anywhere.
inline Float4 Load(const void* from)
{
    Float4 value;
    std::memcpy(&value, from, sizeof value);
    return value;
}

/// Writes four floats to anywhere.
inline void Store(void* to, Float4 value)
{
    std::memcpy(to, &value, sizeof value);
}

/// The same value in all lanes.
inline Float4 All(float value)
{
    return Float4{value, value, value, value};
}

/// The lanes 0 to 3 of @p a, and 4 to 7, which are those of @p b, in the given order.
template <int I0, int I1, int I2, int I3>
inline Float4 Pick(Float4 a, Float4 b)
{
    return __builtin_shufflevector(a, b, I0, I1, I2, I3);
}

template <int I0, int I1, int I2, int I3>
inline Float4 Pick(Float4 a)
{
    return __builtin_shufflevector(a, a, I0, I1, I2, I3);
}

/// Four doubles, as two registers: a vector of four would need memory where no register is as wide.
struct Double4
{
    explicit Double4(Float4 value) : low(Half<0, 1>(value)), high(Half<2, 3>(value)) {}

    template <int I0, int I1>
    static Double2 Half(Float4 value)
    {
        const WideDouble4 wide = __builtin_convertvector(value, WideDouble4);
        return __builtin_shufflevector(wide, wide, I0, I1);
    }

    Double2 low, high;
};

/// Each lane times @p factor, in double, rounded to float.
inline Float4 Scaled(const Double4& value, double factor)
{
    const Double2 factors = {factor, factor};
    return __builtin_convertvector(
        __builtin_shufflevector(value.low * factors, value.high * factors, 0, 1, 2, 3), Float4);
}

/// Negates the lanes in which @p signs holds -0.0; the others must hold 0.0.
inline Float4 Flip(Float4 value, Float4 signs)
{
    return reinterpret_cast<Float4>(reinterpret_cast<Bits4>(value) ^
                                    reinterpret_cast<Bits4>(signs));
}

/// As std::min, also for NaN and for zeros of either sign.
inline Float4 Smaller(Float4 a, Float4 b)
{
    return b < a ? b : a;
}

/// As std::max, also for NaN and for zeros of either sign.
inline Float4 Greater(Float4 a, Float4 b)
{
    return a < b ? b : a;
}

} // namespace Nib

#endif
