#ifndef NIB_TESTS_MATH_MATRIX_TEST_SUPPORT_H
#define NIB_TESTS_MATH_MATRIX_TEST_SUPPORT_H

#include <nib/matrix.h>

#include <gtest/gtest.h>

#include <eigen3/Eigen/Dense>

#include <array>
#include <cstddef>
#include <random>

using Mat3 = Nib::Matrix3<float>;
using Mat4 = Nib::Matrix4<float>;

/// Reproducible values; some of them are the awkward ones.
class Values
{
public:
    float Between(float low, float high)
    {
        return std::uniform_real_distribution<float>(low, high)(m_engine);
    }

    /// Mostly between -10 and 10; one in eight is 0, 1 or -1.
    float Any()
    {
        constexpr float kSpecial[] = {0.0f, 1.0f, -1.0f};
        const unsigned choice = static_cast<unsigned>(m_engine() % 24);
        return choice < 3 ? kSpecial[choice] : Between(-10, 10);
    }

    template <typename Matrix, std::size_t Count>
    Matrix NextMatrix()
    {
        std::array<float, Count> elements;
        for (float& element : elements)
            element = Any();
        return Matrix(elements.data());
    }

    Mat3 NextMatrix3() { return NextMatrix<Mat3, 9>(); }
    Mat4 NextMatrix4() { return NextMatrix<Mat4, 16>(); }

private:
    std::mt19937 m_engine{20240607};
};

inline Eigen::Matrix3d ToEigen(const Mat3& m)
{
    return Eigen::Map<const Eigen::Matrix3f>(m.data()).cast<double>();
}

inline Eigen::Matrix4d ToEigen(const Mat4& m)
{
    return Eigen::Map<const Eigen::Matrix4f>(m.data()).cast<double>();
}

/// Element by element; @p scale is the size of the terms that each element is the sum of.
template <typename Matrix, typename Expected>
testing::AssertionResult IsNear(const Matrix& actual, const Expected& expected, double scale)
{
    const double tolerance = 2e-6 * std::max(scale, 1.0);
    for (int column = 0; column < expected.cols(); ++column)
    {
        for (int row = 0; row < expected.rows(); ++row)
        {
            const double difference =
                std::abs(static_cast<double>(actual(row, column)) - expected(row, column));
            if (!(difference <= tolerance))
                return testing::AssertionFailure()
                       << "(" << row << ", " << column << ") is " << actual(row, column)
                       << " instead of " << expected(row, column);
        }
    }
    return testing::AssertionSuccess();
}

template <typename Matrix>
testing::AssertionResult HasElements(const Matrix& actual, std::initializer_list<float> expected)
{
    int i = 0;
    for (const float element : expected)
    {
        if (actual[i] != element)
            return testing::AssertionFailure()
                   << "element " << i << " is " << actual[i] << " instead of " << element;
        ++i;
    }
    return testing::AssertionSuccess();
}

/// The adjugate from its definition: the determinants of what is left without a row and a column.
template <typename Matrix>
Matrix AdjugateOf(const Matrix& m)
{
    constexpr int kSize = Matrix::RowsAtCompileTime;
    Matrix adjugate;
    for (int row = 0; row < kSize; ++row)
    {
        for (int column = 0; column < kSize; ++column)
        {
            Eigen::Matrix<double, kSize - 1, kSize - 1> minor;
            for (int i = 0; i < kSize - 1; ++i)
            {
                for (int j = 0; j < kSize - 1; ++j)
                    minor(i, j) = m(i + (i >= row), j + (j >= column));
            }
            adjugate(column, row) = ((row + column) % 2 ? -1 : 1) * minor.determinant();
        }
    }
    return adjugate;
}

/// The largest element, for the size of the terms.
template <typename Matrix>
double Largest(const Matrix& m)
{
    return m.cwiseAbs().maxCoeff();
}

inline constexpr int kRandomCases = 2000;

#endif
