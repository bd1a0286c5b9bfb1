#include "math/MatrixTestSupport.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <limits>
#include <vector>

// The library computes several elements at a time; here stand the formulas of single ones, whose
// results must be the same to the bit, in the order that they are written in.

namespace
{

using Nib::RectF;

constexpr int kCases = 20000;

template <typename T>
testing::AssertionResult HasBits(const T* actual, const T* expected, int count)
{
    for (int i = 0; i < count; ++i)
    {
        if (std::isnan(actual[i]) && std::isnan(expected[i]))
            continue; // which NaN it is depends on the processor
        if (std::memcmp(actual + i, expected + i, sizeof(T)) != 0)
            return testing::AssertionFailure() << std::hexfloat << "number " << i << " is "
                                               << actual[i] << " instead of " << expected[i];
    }
    return testing::AssertionSuccess();
}

/// Elements of all kinds: a quarter of the matrices has ordinary ones only, the others more and
/// more that are special.
class Elements
{
public:
    std::vector<float> Next(int count)
    {
        const unsigned special = m_engine() % 4;
        std::vector<float> elements(static_cast<std::size_t>(count));
        for (float& element : elements)
            element = m_engine() % 8 < special ? Special() : m_values.Between(-10, 10);
        return elements;
    }

private:
    float Special()
    {
        using Limits = std::numeric_limits<float>;
        constexpr float kSpecial[] = {0.0f,
                                      -0.0f,
                                      1.0f,
                                      -1.0f,
                                      Limits::infinity(),
                                      -Limits::infinity(),
                                      Limits::quiet_NaN(),
                                      Limits::denorm_min(),
                                      -Limits::denorm_min(),
                                      Limits::min() / 3,
                                      Limits::max(),
                                      Limits::lowest(),
                                      1e-20f,
                                      3e19f};
        // A matrix with an infinity or a NaN has little else in its inverse: rarely.
        const unsigned choice = m_engine() % 64;
        return kSpecial[choice < std::size(kSpecial) ? choice : choice % 4];
    }

    Values m_values;
    std::mt19937 m_engine{7};
};

// ---- the formulas ----

/// Column after column; the sum over k, from k = 0.
std::vector<float> Product(const float* a, const float* b, int size)
{
    std::vector<float> product;
    for (int column = 0; column < size; ++column)
    {
        for (int row = 0; row < size; ++row)
        {
            float sum = a[row] * b[column * size];
            for (int k = 1; k < size; ++k)
                sum = sum + a[k * size + row] * b[column * size + k];
            product.push_back(sum);
        }
    }
    return product;
}

std::vector<float> Adjugate3(const float* m)
{
    return {m[4] * m[8] - m[7] * m[5], m[7] * m[2] - m[8] * m[1], m[5] * m[1] - m[4] * m[2],
            m[5] * m[6] - m[8] * m[3], m[8] * m[0] - m[2] * m[6], m[2] * m[3] - m[5] * m[0],
            m[7] * m[3] - m[4] * m[6], m[1] * m[6] - m[7] * m[0], m[4] * m[0] - m[1] * m[3]};
}

/// @p adjugate over the determinant, which its first entries give with the first row.
std::vector<float> Inverse(const float* m, const std::vector<float>& adjugate, int size)
{
    double determinant = static_cast<double>(adjugate[0]) * m[0];
    for (int k = 1; k < size; ++k)
        determinant =
            determinant + static_cast<double>(adjugate[static_cast<std::size_t>(k)]) * m[k * size];
    if (determinant == 0.0)
        return std::vector<float>(m, m + size * size);
    std::vector<float> inverse;
    for (const float cofactor : adjugate)
        inverse.push_back(static_cast<float>(1.0 / determinant * cofactor));
    return inverse;
}

/// Entry 4r + c leaves out row r and column c; the others give six products of three, in the
/// order of the columns from which the three rows take their factors.
std::vector<float> Adjugate4(const float* m)
{
    std::vector<float> adjugate;
    for (int out = 0; out < 16; ++out)
    {
        std::vector<int> r, c;
        for (int i = 0; i < 4; ++i)
        {
            if (i != out / 4)
                r.push_back(i);
            if (i != out % 4)
                c.push_back(4 * i);
        }
        const float x = (out / 4 + out % 4) % 2 != 0 ? -1.0f : 1.0f;
        const auto term = [&](std::size_t i, std::size_t j, std::size_t k)
        { return m[c[i] + r[0]] * m[c[j] + r[1]] * m[c[k] + r[2]]; };
        adjugate.push_back(x * term(0, 1, 2) - x * term(0, 2, 1) - x * term(1, 0, 2) +
                           x * term(1, 2, 0) + x * term(2, 0, 1) - x * term(2, 1, 0));
    }
    return adjugate;
}

RectF Mapped(const float* m, const RectF& src)
{
    RectF bounds;
    const float x[] = {src.left, src.right, src.right, src.left};
    const float y[] = {src.top, src.bottom, src.top, src.bottom};
    for (int i = 0; i < 4; ++i)
    {
        const float w = m[2] * x[i] + m[5] * y[i] + m[8];
        const float mappedX = (m[0] * x[i] + m[3] * y[i] + m[6]) / w;
        const float mappedY = (m[1] * x[i] + m[4] * y[i] + m[7]) / w;
        if (i == 0)
            bounds.Set(mappedX, mappedY, mappedX, mappedY);
        else
            bounds.MakeRect(mappedX, mappedY);
    }
    return bounds;
}

RectF ToRect(const std::vector<float>& edges)
{
    return {edges[0], edges[1], edges[2], edges[3]};
}

} // namespace

TEST(MatrixBits, Product3)
{
    Elements elements;
    for (int i = 0; i < kCases; ++i)
    {
        const std::vector<float> a = elements.Next(9), b = elements.Next(9);
        const std::vector<float> product = Product(a.data(), b.data(), 3);
        ASSERT_TRUE(HasBits(Mat3(a.data()).preConcat(Mat3(b.data())).data(), product.data(), 9));
        ASSERT_TRUE(HasBits(Mat3(b.data()).postConcat(Mat3(a.data())).data(), product.data(), 9));
    }
}

TEST(MatrixBits, Product4)
{
    Elements elements;
    for (int i = 0; i < kCases; ++i)
    {
        const std::vector<float> a = elements.Next(16), b = elements.Next(16);
        const std::vector<float> product = Product(a.data(), b.data(), 4);
        ASSERT_TRUE(HasBits(Mat4(a.data()).preConcat(Mat4(b.data())).data(), product.data(), 16));
        ASSERT_TRUE(HasBits(Mat4(b.data()).postConcat(Mat4(a.data())).data(), product.data(), 16));
    }
}

TEST(MatrixBits, Inverse3)
{
    Elements elements;
    for (int i = 0; i < kCases; ++i)
    {
        const std::vector<float> m = elements.Next(9);
        const std::vector<float> inverse = Inverse(m.data(), Adjugate3(m.data()), 3);
        ASSERT_TRUE(HasBits(Mat3(m.data()).inverse().data(), inverse.data(), 9));
        ASSERT_TRUE(HasBits(Mat3(m.data()).inverseSelf().data(), inverse.data(), 9));
    }
}

TEST(MatrixBits, Inverse4)
{
    Elements elements;
    for (int i = 0; i < kCases; ++i)
    {
        const std::vector<float> m = elements.Next(16);
        const std::vector<float> inverse = Inverse(m.data(), Adjugate4(m.data()), 4);
        ASSERT_TRUE(HasBits(Mat4(m.data()).inverse().data(), inverse.data(), 16));
        ASSERT_TRUE(HasBits(Mat4(m.data()).inverseSelf().data(), inverse.data(), 16));
    }
}

TEST(MatrixBits, Adjugates)
{
    Elements elements;
    for (int i = 0; i < kCases; ++i)
    {
        const std::vector<float> m = elements.Next(16);
        double written[16];
        Mat3(m.data()).calculateMatrix(written);
        const std::vector<float> three = Adjugate3(m.data());
        ASSERT_TRUE(HasBits(written, std::vector<double>(three.begin(), three.end()).data(), 9));
        Mat4(m.data()).calculaeMatrix(written);
        const std::vector<float> four = Adjugate4(m.data());
        ASSERT_TRUE(HasBits(written, std::vector<double>(four.begin(), four.end()).data(), 16));
    }
}

TEST(MatrixBits, MappedRectangle)
{
    Elements elements;
    for (int i = 0; i < kCases; ++i)
    {
        const std::vector<float> m = elements.Next(9);
        const RectF src = ToRect(elements.Next(4));
        const RectF expected = Mapped(m.data(), src);
        RectF rect = src;
        Mat3(m.data()).mapRect(&rect, rect);
        ASSERT_TRUE(HasBits(&rect.left, &expected.left, 4));
    }
}
