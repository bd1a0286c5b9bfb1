#include <nib/matrix.h>

#include "math/Float4.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <utility>

// The order of operations in each formula is part of the behaviour: results are the same to the bit
// on every processor (the build forbids fused multiply-add).

namespace Nib
{

namespace
{

constexpr float kHalfRadiansPerDegree = 0.008726646f;

template <typename T>
Vector3<T> Cross(const Vector3<T>& a, const Vector3<T>& b)
{
    return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}

template <typename T>
Vector3<T> Normalised(const Vector3<T>& v)
{
    const T length = std::sqrt(v.x * v.x + v.y * v.y + v.z * v.z);
    return {v.x / length, v.y / length, v.z / length};
}

template <typename T>
void SetColumn(Matrix4<T>& m, int column, const Vector3<T>& value)
{
    m(0, column) = value.x;
    m(1, column) = value.y;
    m(2, column) = value.z;
}

/// Column by column: element 4j + i is a(i) b(4j) + a(4 + i) b(4j + 1) + a(8 + i) b(4j + 2) +
/// a(12 + i) b(4j + 3).
void Multiply(const float* a, const float* b, float* product)
{
    const Float4 a0 = Load(a), a4 = Load(a + 4), a8 = Load(a + 8), a12 = Load(a + 12);
    const auto column = [&](Float4 by)
    {
        return a0 * Pick<0, 0, 0, 0>(by) + a4 * Pick<1, 1, 1, 1>(by) + a8 * Pick<2, 2, 2, 2>(by) +
               a12 * Pick<3, 3, 3, 3>(by);
    };
    const Float4 b0 = Load(b), b4 = Load(b + 4), b8 = Load(b + 8), b12 = Load(b + 12);
    Store(product, column(b0));
    Store(product + 4, column(b4));
    Store(product + 8, column(b8));
    Store(product + 12, column(b12));
}

/// A row of a matrix for the cofactor expansion, which takes from it one factor for each of the
/// four columns j that it leaves out: from the first, the second and the third of the columns
/// that remain.
struct Row
{
    explicit Row(Float4 row)
        : first(Pick<1, 0, 0, 0>(row)), second(Pick<2, 2, 1, 1>(row)), third(Pick<3, 3, 3, 2>(row))
    {
    }

    Float4 first, second, third;
};

/// The products of the factors of two rows, by the columns that these come from.
struct Products
{
    Products(const Row& a, const Row& b)
        : p12(a.first * b.second), p13(a.first * b.third), p21(a.second * b.first),
          p23(a.second * b.third), p31(a.third * b.first), p32(a.third * b.second)
    {
    }

    Float4 p12, p13, p21, p23, p31, p32;
};

/// The cofactors of one row, each the sum of six terms in the order of the columns that they
/// take. The sign of a cofactor is that of the last row's elements: negation is exact.
Float4 Cofactors(const Products& p, Float4 lastRow, Float4 signs)
{
    const Row last(lastRow);
    const Float4 first = Flip(last.first, signs), second = Flip(last.second, signs),
                 third = Flip(last.third, signs);
    return p.p12 * third - p.p13 * second - p.p21 * third + p.p23 * first + p.p31 * second -
           p.p32 * first;
}

/// The cofactors in the order of storage: those of row 0 first.
struct Adjugate4
{
    explicit Adjugate4(const float* m)
    {
        const Float4 c0 = Load(m), c1 = Load(m + 4), c2 = Load(m + 8), c3 = Load(m + 12);
        const Float4 low01 = Pick<0, 4, 1, 5>(c0, c1), high01 = Pick<2, 6, 3, 7>(c0, c1);
        const Float4 low23 = Pick<0, 4, 1, 5>(c2, c3), high23 = Pick<2, 6, 3, 7>(c2, c3);
        row0 = Pick<0, 1, 4, 5>(low01, low23);
        const Float4 row1 = Pick<2, 3, 6, 7>(low01, low23);
        const Float4 row2 = Pick<0, 1, 4, 5>(high01, high23);
        const Float4 row3 = Pick<2, 3, 6, 7>(high01, high23);

        const Float4 even = {0.0f, -0.0f, 0.0f, -0.0f}, odd = {-0.0f, 0.0f, -0.0f, 0.0f};
        const Row first(row0), second(row1), third(row2);
        columns[0] = Cofactors(Products(second, third), row3, even);
        columns[1] = Cofactors(Products(first, third), row3, odd);
        const Products upper(first, second);
        columns[2] = Cofactors(upper, row3, even);
        columns[3] = Cofactors(upper, row2, odd);
    }

    Float4 row0; ///< of the matrix
    Float4 columns[4];
};

/// Writes the inverse and returns true; false, and nothing written, for a singular matrix.
bool Invert(const float* m, float* inverse)
{
    const Adjugate4 adjugate(m);
    const Double4 a(adjugate.row0), b(adjugate.columns[0]);
    const Double2 low = a.low * b.low, high = a.high * b.high;
    const double determinant = low[0] + low[1] + high[0] + high[1];
    if (determinant == 0.0)
        return false;
    const double factor = 1.0 / determinant;
    for (int column = 0; column < 4; ++column)
        Store(inverse + 4 * column, Scaled(Double4(adjugate.columns[column]), factor));
    return true;
}

} // namespace

// ---- making and comparing ----

template <typename T>
Matrix4<T>::Matrix4() : Matrix4(1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1)
{
}

template <typename T>
Matrix4<T>::Matrix4(const T& value)
{
    std::fill_n(m_elements, 16, value);
}

template <typename T>
Matrix4<T>::Matrix4(const T* elements)
{
    std::copy_n(elements, 16, m_elements);
}

template <typename T>
Matrix4<T>::Matrix4(const T& m0, const T& m1, const T& m2, const T& m3, const T& m4, const T& m5,
                    const T& m6, const T& m7, const T& m8, const T& m9, const T& m10, const T& m11,
                    const T& m12, const T& m13, const T& m14, const T& m15)
    : m_elements{m0, m1, m2, m3, m4, m5, m6, m7, m8, m9, m10, m11, m12, m13, m14, m15}
{
}

template <typename T>
bool Matrix4<T>::operator==(const Matrix4& other) const
{
    // NOLINTNEXTLINE(bugprone-suspicious-memory-comparison): byte by byte is the exported rule
    return std::memcmp(m_elements, other.m_elements, sizeof m_elements) == 0;
}

template <typename T>
Matrix4<T>& Matrix4<T>::identitySelf()
{
    return *this = Matrix4();
}

template <typename T>
Matrix4<T>& Matrix4<T>::zeroSelf()
{
    return *this = Matrix4(T(0));
}

template <typename T>
bool Matrix4<T>::isIdentity() const
{
    const Matrix4 identity;
    return std::equal(m_elements, m_elements + 16, identity.m_elements);
}

// ---- projections, translations, scales ----

template <typename T>
Matrix4<T> Matrix4<T>::perspectiveMatrix(T fovyDegrees, T aspect, T near, T far)
{
    const T top = std::tan(fovyDegrees * kHalfRadiansPerDegree) * near;
    const T right = top * aspect;
    Matrix4 m(T(0));
    m[0] = 2 * near / (2 * right);
    m[5] = 2 * near / (2 * top);
    m[10] = -(near + far) / (far - near);
    m[11] = -1;
    m[14] = -(2 * far * near) / (far - near);
    return m;
}

template <typename T>
Matrix4<T> Matrix4<T>::orthoMatrix(T left, T right, T bottom, T top, T near, T far)
{
    Matrix4 m(T(0));
    m[0] = 2 / (right - left);
    m[5] = 2 / (top - bottom);
    m[10] = -2 / (far - near);
    m[12] = -(right + left) / (right - left);
    m[13] = -(top + bottom) / (top - bottom);
    m[14] = -(far + near) / (far - near);
    m[15] = 1;
    return m;
}

template <typename T>
Matrix4<T> Matrix4<T>::translateMatrix(T x, T y, T z)
{
    Matrix4 m;
    m[12] = x;
    m[13] = y;
    m[14] = z;
    return m;
}

template <typename T>
Matrix4<T> Matrix4<T>::translateMatrix(const Vector3<T>& offset)
{
    return translateMatrix(offset.x, offset.y, offset.z);
}

template <typename T>
Matrix4<T> Matrix4<T>::scaleMatrix(T x, T y, T z)
{
    Matrix4 m;
    m[0] = x;
    m[5] = y;
    m[10] = z;
    return m;
}

template <typename T>
Matrix4<T> Matrix4<T>::scaleMatrix(const Vector3<T>& factors)
{
    return scaleMatrix(factors.x, factors.y, factors.z);
}

// ---- rotations ----

template <typename T>
Matrix4<T> Matrix4<T>::rotateMatrix(T x, T y, T z)
{
    return Matrix4().rotateSelf(x, y, z);
}

template <typename T>
Matrix4<T> Matrix4<T>::rotateMatrix(Vector3<T> a, Vector3<T> b)
{
    const Vector3<T> c = Cross(a, b);
    const Vector3<T> d = Cross(c, a);
    Matrix4 m;
    SetColumn(m, 0, Normalised(c));
    SetColumn(m, 1, Normalised(d));
    SetColumn(m, 2, Normalised(a));
    return m;
}

template <typename T>
Matrix4<T> Matrix4<T>::rotateMatrix(T angle, Vector3<T>& axis)
{
    const Vector3<T> unit = Normalised(axis);
    const T x = unit.x, y = unit.y, z = unit.z;
    const T c = std::cos(angle);
    const T s = std::sin(angle);
    const T k = 1 - c;
    Matrix4 m;
    m[0] = c + x * x * k;
    m[1] = x * y * k - z * s;
    m[2] = x * z * k + y * s;
    m[4] = x * y * k + z * s;
    m[5] = c + y * y * k;
    m[6] = y * z * k - x * s;
    m[8] = x * z * k - y * s;
    m[9] = y * z * k + x * s;
    m[10] = c + z * z * k;
    return m;
}

template <typename T>
Matrix4<T>& Matrix4<T>::rotateSelf(T x, T y, T z)
{
    const T cx = std::cos(x), sx = std::sin(x);
    const T cy = std::cos(y), sy = std::sin(y);
    const T cz = std::cos(z), sz = std::sin(z);
    T* const m = m_elements;
    m[0] = cy * cz;
    m[1] = sx * sy * cz + cx * sz;
    m[2] = sx * sz - cx * sy * cz;
    m[4] = -cy * sz;
    m[5] = cx * cz - sx * sy * sz;
    m[6] = cx * sy * sz + sx * cz;
    m[8] = sy;
    m[9] = -sx * cy;
    m[10] = cx * cy;
    return *this;
}

template <typename T>
Matrix4<T> Matrix4<T>::rotate(T x, T y, T z) const
{
    return translation().rotateSelf(x, y, z);
}

// ---- combining ----

template <typename T>
Matrix4<T>& Matrix4<T>::preConcat(const Matrix4& other)
{
    Multiply(m_elements, other.m_elements, m_elements);
    return *this;
}

template <typename T>
Matrix4<T>& Matrix4<T>::postConcat(const Matrix4& other)
{
    Multiply(other.m_elements, m_elements, m_elements);
    return *this;
}

// ---- parts ----

template <typename T>
Vector4<T> Matrix4<T>::row(int i) const
{
    return {m_elements[i], m_elements[i + 4], m_elements[i + 8], m_elements[i + 12]};
}

template <typename T>
Vector4<T> Matrix4<T>::column(int j) const
{
    const T* const first = m_elements + 4 * j;
    return {first[0], first[1], first[2], first[3]};
}

template <typename T>
Matrix4<T> Matrix4<T>::rotation() const
{
    Matrix4 m(*this);
    m[12] = m[13] = m[14] = 0;
    return m;
}

template <typename T>
Matrix4<T> Matrix4<T>::translation() const
{
    return translateMatrix(m_elements[12], m_elements[13], m_elements[14]);
}

// ---- turning round ----

template <typename T>
Matrix4<T>& Matrix4<T>::transposeSelf()
{
    for (int i = 0; i < 4; ++i)
    {
        for (int j = i + 1; j < 4; ++j)
            std::swap((*this)(i, j), (*this)(j, i));
    }
    return *this;
}

template <typename T>
Matrix4<T> Matrix4<T>::transpose() const
{
    return Matrix4(*this).transposeSelf();
}

template <typename T>
void Matrix4<T>::calculaeMatrix(double* out) const
{
    const Adjugate4 adjugate(m_elements);
    for (int i = 0; i < 16; ++i)
        out[i] = adjugate.columns[i / 4][i % 4];
}

template <typename T>
Matrix4<T>& Matrix4<T>::inverseSelf()
{
    Invert(m_elements, m_elements);
    return *this;
}

template <typename T>
Matrix4<T> Matrix4<T>::inverse() const
{
    Matrix4 inverse(*this);
    Invert(m_elements, inverse.m_elements);
    return inverse;
}

template class Matrix4<float>;

} // namespace Nib
