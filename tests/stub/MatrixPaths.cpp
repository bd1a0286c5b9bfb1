#include "HotPaths.h"

#include <nib/base.h>
#include <nib/matrix.h>

// What drawing code does with matrices. Nothing in them is 0 or 1.

using namespace Nib;

namespace
{

constexpr float kFirst3[] = {1.5f, 0.25f, 0.001f, -0.5f, 1.25f, 0.002f, 20.0f, 30.0f, 0.9f};
constexpr float kSecond3[] = {0.75f, -0.5f, 0.003f, 0.25f, 2.5f, 0.001f, -7.0f, 11.0f, 1.1f};
constexpr float kFirst4[] = {1.5f, 0.25f, 0.1f,  0.01f,  -0.5f, 1.25f, 0.2f,  0.02f,
                             0.3f, -0.4f, 1.75f, -0.03f, 20.0f, 30.0f, 40.0f, 0.9f};
constexpr float kSecond4[] = {0.75f, -0.5f, 0.3f, 0.04f, 0.25f, 2.5f,  -0.1f, 0.05f,
                              -0.2f, 0.6f,  1.1f, 0.06f, -7.0f, 11.0f, 13.0f, 1.1f};

/// As if somebody read the value, and wrote it.
template <typename Value>
void Use(Value& value)
{
    asm volatile("" : : "r"(&value) : "memory");
}

template <typename Matrix>
void Product(const float* first, const float* second, int times)
{
    Matrix a(first), b(second);
    for (; times != 0; --times)
    {
        Matrix product(a);
        product.preConcat(b);
        Use(product);
    }
}

template <typename Matrix>
void Inverse(const float* elements, int times)
{
    Matrix m(elements);
    for (; times != 0; --times)
    {
        Matrix inverse = m.inverse();
        Use(inverse);
    }
}

} // namespace

namespace HotPaths
{

void Product3(HotScene&, int times)
{
    Product<Matrix3<float>>(kFirst3, kSecond3, times);
}

void Product4(HotScene&, int times)
{
    Product<Matrix4<float>>(kFirst4, kSecond4, times);
}

void Inverse3(HotScene&, int times)
{
    Inverse<Matrix3<float>>(kFirst3, times);
}

void Inverse4(HotScene&, int times)
{
    Inverse<Matrix4<float>>(kFirst4, times);
}

void MapRect(HotScene&, int times)
{
    const Matrix3<float> m(kFirst3);
    const RectF rect(10, 20, 300, 400);
    for (; times != 0; --times)
    {
        RectF mapped;
        m.mapRect(&mapped, rect);
        Use(mapped);
    }
}

} // namespace HotPaths
