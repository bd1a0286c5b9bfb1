#ifndef NIB_MATRIX_H
#define NIB_MATRIX_H

/// @file
/// 3x3 and 4x4 matrices of floats, and the vectors that go with them. Plain values; any thread.

#include <nib/base.h>
#include <nib/export.h>

#include <cstddef>

namespace Nib
{

/// A vector of the plane.
template <typename T>
struct Vector2
{
    T x{}; ///< along x
    T y{}; ///< along y

    constexpr Vector2() = default;
    constexpr Vector2(T x_, T y_) : x(x_), y(y_) {} ///< its coordinates
};

/// A vector of space.
template <typename T>
struct Vector3
{
    T x{}; ///< along x
    T y{}; ///< along y
    T z{}; ///< along z

    constexpr Vector3() = default;
    constexpr Vector3(T x_, T y_, T z_) : x(x_), y(y_), z(z_) {} ///< its coordinates
};

/// A vector of space in homogeneous coordinates.
template <typename T>
struct Vector4
{
    T x{}; ///< along x
    T y{}; ///< along y
    T z{}; ///< along z
    T w{}; ///< the homogeneous coordinate

    constexpr Vector4() = default;
    constexpr Vector4(T x_, T y_, T z_, T w_) : x(x_), y(y_), z(z_), w(w_) {} ///< its coordinates
};

/// A transform of the plane. Stored column after column: the element of row i and column j is
/// number 3j + i. A point (x, y) maps to
///     ((m0 x + m3 y + m6) / w, (m1 x + m4 y + m7) / w), w = m2 x + m5 y + m8.
/// Angles are degrees; positive ones turn x towards y. Exists for float only.
///
/// The "pre" operations apply the new transform to points first (this := this * X), the "post" ones
/// last (this := X * this). All of them, and those named ...Self, return this.
template <typename T>
class NIB_EXPORT Matrix3
{
public:
    Matrix3();                           ///< the identity
    explicit Matrix3(const T& value);    ///< all elements equal
    explicit Matrix3(const T* elements); ///< nine, in storage order
    Matrix3(const T& m0, const T& m1, const T& m2, const T& m3, const T& m4, const T& m5,
            const T& m6, const T& m7, const T& m8);     ///< in storage order
    Matrix3(const Matrix3& other) = default;            ///< a copy
    Matrix3& operator=(const Matrix3& other) = default; ///< a copy

    bool operator==(const Matrix3& other) const; ///< byte by byte: 0.0 and -0.0 differ
    bool operator!=(const Matrix3& other) const
    {
        return !(*this == other);
    } ///< any element differs

    T& operator()(int i, int j) { return m_elements[j * 3 + i]; }             ///< row i, column j
    const T& operator()(int i, int j) const { return m_elements[j * 3 + i]; } ///< row i, column j
    T& operator[](int k) { return m_elements[k]; }                            ///< in storage order
    const T& operator[](int k) const { return m_elements[k]; } ///< element k as stored
    T* data() { return m_elements; }                           ///< the elements as stored
    const T* data() const { return m_elements; }               ///< the elements as stored

    static bool isRowMajor() { return false; } ///< columns are stored one after the other
    static std::size_t storageSize() { return sizeof(T) * 9; } ///< bytes

    Matrix3& identitySelf(); ///< becomes the identity
    Matrix3& zeroSelf();     ///< becomes all zero
    bool isIdentity() const; ///< by value

    static Matrix3 translateMatrix(T tx, T ty); ///< adds (tx, ty)
    static Matrix3 scaleMatrix(T sx, T sy);     ///< multiplies by (sx, sy)
    static Matrix3 rotateMatrix(T degrees);     ///< turns about the origin

    // These set the whole matrix; those with a pivot leave the point (px, py) where it is.
    Matrix3& setScale(T sx, T sy);             ///< becomes a scaling about the origin
    Matrix3& setScale(T sx, T sy, T px, T py); ///< becomes a scaling about (px, py)
    Matrix3& setRotate(T degrees);             ///< becomes a turn about the origin
    Matrix3& setRotate(T degrees, T px, T py); ///< becomes a turn about (px, py)
    Matrix3& setTranslate(T tx, T ty);         ///< becomes a translation

    Matrix3& preScale(T sx, T sy);             ///< scales first
    Matrix3& preScale(T sx, T sy, T px, T py); ///< scales about (px, py) first
    Matrix3& preRotate(T degrees);             ///< turns first
    Matrix3& preRotate(T degrees, T px, T py); ///< turns about (px, py) first
    Matrix3& preTranslate(T tx, T ty);         ///< translates first
    Matrix3& preConcat(const Matrix3& other);  ///< this * other

    Matrix3& postScale(T sx, T sy);             ///< scales last
    Matrix3& postScale(T sx, T sy, T px, T py); ///< scales about (px, py) last
    Matrix3& postRotate(T degrees);             ///< turns last
    Matrix3& postRotate(T degrees, T px, T py); ///< turns about (px, py) last
    /// As the others, except that m1 grows by m1 * ty instead of m2 * ty; stored transforms depend
    /// on it.
    Matrix3& postTranslate(T tx, T ty);
    Matrix3& postConcat(const Matrix3& other); ///< other * this

    Matrix3& transposeSelf(); ///< swaps rows and columns
    /// The transpose, except that element 2 is m5 instead of m6; stored transforms depend on it.
    Matrix3 transpose() const;

    Matrix3& inverseSelf();  ///< a singular matrix stays as it is
    Matrix3 inverse() const; ///< a copy, for a singular matrix
    /// Writes the nine elements of the adjugate, in storage order.
    void calculateMatrix(double* out) const;

    /// The bounding box of the four mapped corners. For whole pixels it is rounded outward.
    void mapRect(RectF* dst, const RectF& src) const;
    /// As above, for whole pixels.
    void mapRect(Rect* dst, const Rect& src) const;

    T getScaleX() const { return m_elements[0]; }     ///< element 0
    T getSkewY() const { return m_elements[1]; }      ///< element 1
    T getSkewX() const { return m_elements[3]; }      ///< element 3
    T getScaleY() const { return m_elements[4]; }     ///< element 4
    T getTranslateX() const { return m_elements[6]; } ///< element 6
    T getTranslateY() const { return m_elements[7]; } ///< element 7

private:
    T m_elements[9];
};

/// A transform of space, as GL takes it: the element of row i and column j is number 4j + i, so
/// that data() goes to glUniformMatrix4fv without transposing. Angles are radians, but for
/// perspectiveMatrix. Exists for float only. Operations named ...Self return this.
template <typename T>
class NIB_EXPORT Matrix4
{
public:
    Matrix4();                           ///< the identity
    explicit Matrix4(const T& value);    ///< all elements equal
    explicit Matrix4(const T* elements); ///< sixteen, in storage order
    Matrix4(const T& m0, const T& m1, const T& m2, const T& m3, const T& m4, const T& m5,
            const T& m6, const T& m7, const T& m8, const T& m9, const T& m10, const T& m11,
            const T& m12, const T& m13, const T& m14, const T& m15); ///< in storage order
    Matrix4(const Matrix4& other) = default;                         ///< a copy
    Matrix4& operator=(const Matrix4& other) = default;              ///< a copy

    bool operator==(const Matrix4& other) const; ///< byte by byte: 0.0 and -0.0 differ
    bool operator!=(const Matrix4& other) const
    {
        return !(*this == other);
    } ///< any element differs

    T& operator()(int i, int j) { return m_elements[j * 4 + i]; }             ///< row i, column j
    const T& operator()(int i, int j) const { return m_elements[j * 4 + i]; } ///< row i, column j
    T& operator[](int k) { return m_elements[k]; }                            ///< in storage order
    const T& operator[](int k) const { return m_elements[k]; } ///< element k as stored
    T* data() { return m_elements; }                           ///< the elements as stored
    const T* data() const { return m_elements; }               ///< the elements as stored

    static bool isRowMajor() { return false; } ///< columns are stored one after the other
    static std::size_t storageSize() { return sizeof(T) * 16; } ///< bytes

    Matrix4& identitySelf(); ///< becomes the identity
    Matrix4& zeroSelf();     ///< becomes all zero
    bool isIdentity() const; ///< by value

    /// @param fovyDegrees  the whole vertical angle of view, in degrees
    static Matrix4 perspectiveMatrix(T fovyDegrees, T aspect, T near, T far);
    /// The parallel projection of a box onto the unit cube, as glOrtho defines it.
    static Matrix4 orthoMatrix(T left, T right, T bottom, T top, T near, T far);
    static Matrix4 translateMatrix(T x, T y, T z);            ///< adds (x, y, z)
    static Matrix4 translateMatrix(const Vector3<T>& offset); ///< adds the offset
    static Matrix4 scaleMatrix(T x, T y, T z);                ///< multiplies by (x, y, z)
    static Matrix4 scaleMatrix(const Vector3<T>& factors);    ///< multiplies by the factors

    static Matrix4 rotateMatrix(T x, T y, T z); ///< Rx(x) * Ry(y) * Rz(z)
    /// The basis whose third column is a, and whose first is perpendicular to a and b, each of
    /// length 1. Not finite when a and b are parallel.
    static Matrix4 rotateMatrix(Vector3<T> a, Vector3<T> b);
    /// Turns by -@p angle about @p axis, which is not changed: the other way than the Euler form.
    static Matrix4 rotateMatrix(T angle, Vector3<T>& axis);

    /// Replaces the upper left 3x3 elements by Rx(x) * Ry(y) * Rz(z).
    Matrix4& rotateSelf(T x, T y, T z);
    /// Rx(x) * Ry(y) * Rz(z) with this matrix's translation.
    Matrix4 rotate(T x, T y, T z) const;

    Matrix4& preConcat(const Matrix4& other);  ///< this * other
    Matrix4& postConcat(const Matrix4& other); ///< other * this

    Vector4<T> row(int i) const;    ///< i from 0 to 3
    Vector4<T> column(int j) const; ///< j from 0 to 3
    Matrix4 rotation() const;       ///< a copy without the translation
    Matrix4 translation() const;    ///< the translation alone

    Matrix4& transposeSelf();  ///< swaps rows and columns
    Matrix4 transpose() const; ///< with rows and columns swapped

    Matrix4& inverseSelf();  ///< a singular matrix stays as it is
    Matrix4 inverse() const; ///< a copy, for a singular matrix
    /// Writes the sixteen elements of the adjugate, in storage order.
    void calculaeMatrix(double* out) const;

private:
    T m_elements[16];
};

extern template class Matrix3<float>;
extern template class Matrix4<float>;

} // namespace Nib

#endif
