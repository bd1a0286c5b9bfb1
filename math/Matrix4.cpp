#include <nib/matrix.h>

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

// The cofactor expansion: each term takes one factor from each remaining row, in the order of the
// rows; the terms stand in the order of the columns that they take.
template <typename T>
void Matrix4<T>::calculaeMatrix(double* out) const
{
    const T* const m = m_elements;
    out[0] = m[5] * m[10] * m[15] - m[5] * m[14] * m[11] - m[9] * m[6] * m[15] +
             m[9] * m[14] * m[7] + m[13] * m[6] * m[11] - m[13] * m[10] * m[7];
    out[1] = -m[1] * m[10] * m[15] + m[1] * m[14] * m[11] + m[9] * m[2] * m[15] -
             m[9] * m[14] * m[3] - m[13] * m[2] * m[11] + m[13] * m[10] * m[3];
    out[2] = m[1] * m[6] * m[15] - m[1] * m[14] * m[7] - m[5] * m[2] * m[15] + m[5] * m[14] * m[3] +
             m[13] * m[2] * m[7] - m[13] * m[6] * m[3];
    out[3] = -m[1] * m[6] * m[11] + m[1] * m[10] * m[7] + m[5] * m[2] * m[11] -
             m[5] * m[10] * m[3] - m[9] * m[2] * m[7] + m[9] * m[6] * m[3];
    out[4] = -m[4] * m[10] * m[15] + m[4] * m[14] * m[11] + m[8] * m[6] * m[15] -
             m[8] * m[14] * m[7] - m[12] * m[6] * m[11] + m[12] * m[10] * m[7];
    out[5] = m[0] * m[10] * m[15] - m[0] * m[14] * m[11] - m[8] * m[2] * m[15] +
             m[8] * m[14] * m[3] + m[12] * m[2] * m[11] - m[12] * m[10] * m[3];
    out[6] = -m[0] * m[6] * m[15] + m[0] * m[14] * m[7] + m[4] * m[2] * m[15] -
             m[4] * m[14] * m[3] - m[12] * m[2] * m[7] + m[12] * m[6] * m[3];
    out[7] = m[0] * m[6] * m[11] - m[0] * m[10] * m[7] - m[4] * m[2] * m[11] + m[4] * m[10] * m[3] +
             m[8] * m[2] * m[7] - m[8] * m[6] * m[3];
    out[8] = m[4] * m[9] * m[15] - m[4] * m[13] * m[11] - m[8] * m[5] * m[15] +
             m[8] * m[13] * m[7] + m[12] * m[5] * m[11] - m[12] * m[9] * m[7];
    out[9] = -m[0] * m[9] * m[15] + m[0] * m[13] * m[11] + m[8] * m[1] * m[15] -
             m[8] * m[13] * m[3] - m[12] * m[1] * m[11] + m[12] * m[9] * m[3];
    out[10] = m[0] * m[5] * m[15] - m[0] * m[13] * m[7] - m[4] * m[1] * m[15] +
              m[4] * m[13] * m[3] + m[12] * m[1] * m[7] - m[12] * m[5] * m[3];
    out[11] = -m[0] * m[5] * m[11] + m[0] * m[9] * m[7] + m[4] * m[1] * m[11] - m[4] * m[9] * m[3] -
              m[8] * m[1] * m[7] + m[8] * m[5] * m[3];
    out[12] = -m[4] * m[9] * m[14] + m[4] * m[13] * m[10] + m[8] * m[5] * m[14] -
              m[8] * m[13] * m[6] - m[12] * m[5] * m[10] + m[12] * m[9] * m[6];
    out[13] = m[0] * m[9] * m[14] - m[0] * m[13] * m[10] - m[8] * m[1] * m[14] +
              m[8] * m[13] * m[2] + m[12] * m[1] * m[10] - m[12] * m[9] * m[2];
    out[14] = -m[0] * m[5] * m[14] + m[0] * m[13] * m[6] + m[4] * m[1] * m[14] -
              m[4] * m[13] * m[2] - m[12] * m[1] * m[6] + m[12] * m[5] * m[2];
    out[15] = m[0] * m[5] * m[10] - m[0] * m[9] * m[6] - m[4] * m[1] * m[10] + m[4] * m[9] * m[2] +
              m[8] * m[1] * m[6] - m[8] * m[5] * m[2];
}

template <typename T>
Matrix4<T>& Matrix4<T>::inverseSelf()
{
    double adjugate[16];
    calculaeMatrix(adjugate);
    const double determinant = m_elements[0] * adjugate[0] + m_elements[4] * adjugate[1] +
                               m_elements[8] * adjugate[2] + m_elements[12] * adjugate[3];
    if (determinant == 0.0)
        return *this;
    for (int i = 0; i < 16; ++i)
        m_elements[i] = static_cast<T>(adjugate[i] * (1.0 / determinant));
    return *this;
}

template <typename T>
Matrix4<T> Matrix4<T>::inverse() const
{
    return Matrix4(*this).inverseSelf();
}

template class Matrix4<float>;

} // namespace Nib
