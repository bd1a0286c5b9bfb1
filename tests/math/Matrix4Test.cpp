#include "math/MatrixTestSupport.h"

#include <cmath>
#include <limits>

namespace
{

using Vec3 = Nib::Vector3<float>;

const Mat4 kCounted(0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15);

Eigen::Matrix4d Embed(const Eigen::Matrix3d& rotation)
{
    Eigen::Matrix4d m = Eigen::Matrix4d::Identity();
    m.topLeftCorner<3, 3>() = rotation;
    return m;
}

Eigen::Matrix3d Euler(double x, double y, double z)
{
    using Eigen::AngleAxisd;
    using Eigen::Vector3d;
    return (AngleAxisd(x, Vector3d::UnitX()) * AngleAxisd(y, Vector3d::UnitY()) *
            AngleAxisd(z, Vector3d::UnitZ()))
        .toRotationMatrix();
}

Eigen::Vector3d ToEigen(const Vec3& v)
{
    return {v.x, v.y, v.z};
}

Vec3 NextVector(Values& values)
{
    return {values.Between(-10, 10), values.Between(-10, 10), values.Between(-10, 10)};
}

bool Is(const Nib::Vector4<float>& v, float x, float y, float z, float w)
{
    return v.x == x && v.y == y && v.z == z && v.w == w;
}

} // namespace

// ---- making, reading, comparing ----

TEST(Matrix4, IsTheIdentityUnlessTold)
{
    EXPECT_TRUE(HasElements(Mat4(), {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}));
}

TEST(Matrix4, TakesOneValueForAll)
{
    EXPECT_TRUE(HasElements(Mat4(2.0f), {2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2}));
}

TEST(Matrix4, TakesElementsInStorageOrder)
{
    const float elements[] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15};
    EXPECT_EQ(Mat4(elements), kCounted);
    EXPECT_TRUE(HasElements(kCounted, {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15}));
}

TEST(Matrix4, CopiesElements)
{
    const Mat4 copy(kCounted);
    EXPECT_EQ(copy, kCounted);
    Mat4 assigned;
    assigned = kCounted;
    EXPECT_EQ(assigned, kCounted);
    Mat4& itself = assigned;
    assigned = itself;
    EXPECT_EQ(assigned, kCounted);
}

TEST(Matrix4, StoresColumnAfterColumn)
{
    EXPECT_FALSE(kCounted.isRowMajor());
    EXPECT_EQ(kCounted.storageSize(), 64u);
    EXPECT_EQ(sizeof(Mat4), 64u);
    EXPECT_EQ(kCounted(1, 0), 1);
    EXPECT_EQ(kCounted(0, 1), 4);
    EXPECT_EQ(kCounted(2, 3), 14);
    EXPECT_EQ(kCounted[7], 7);
    EXPECT_EQ(kCounted.data()[15], 15);

    Mat4 m;
    m(2, 3) = 9;
    m[1] = 4;
    m.data()[0] = 3;
    EXPECT_TRUE(HasElements(m, {3, 4, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 9, 1}));
}

TEST(Matrix4, ComparesBytes)
{
    EXPECT_TRUE(Mat4() == Mat4());
    EXPECT_FALSE(Mat4() != Mat4());
    Mat4 other;
    other[1] = -0.0f;
    EXPECT_FALSE(Mat4() == other);
    const Mat4 nothing(std::numeric_limits<float>::quiet_NaN());
    EXPECT_TRUE(nothing == nothing);
    for (int i = 0; i < 16; ++i)
    {
        Mat4 different;
        different[i] = 7;
        EXPECT_TRUE(Mat4() != different) << i;
    }
}

TEST(Matrix4, IsIdentityByValue)
{
    EXPECT_TRUE(Mat4().isIdentity());
    for (int i = 0; i < 16; ++i)
    {
        Mat4 m;
        m[i] = 7;
        EXPECT_FALSE(m.isIdentity()) << i;
    }
    Mat4 zeros;
    zeros[1] = -0.0f;
    EXPECT_TRUE(zeros.isIdentity());
}

TEST(Matrix4, BecomesIdentityOrZero)
{
    Mat4 m(5.0f);
    EXPECT_EQ(&m.zeroSelf(), &m);
    EXPECT_TRUE(HasElements(m, {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(&m.identitySelf(), &m);
    EXPECT_EQ(m, Mat4());
}

TEST(Matrix4, GivesRowsAndColumns)
{
    EXPECT_TRUE(Is(Mat4().row(1), 0, 1, 0, 0));
    EXPECT_TRUE(Is(kCounted.row(0), 0, 4, 8, 12));
    EXPECT_TRUE(Is(kCounted.row(3), 3, 7, 11, 15));
    EXPECT_TRUE(Is(kCounted.column(0), 0, 1, 2, 3));
    EXPECT_TRUE(Is(kCounted.column(2), 8, 9, 10, 11));
}

TEST(Matrix4, GivesItsRotationAndItsTranslation)
{
    EXPECT_TRUE(
        HasElements(kCounted.rotation(), {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 0, 0, 0, 15}));
    EXPECT_TRUE(
        HasElements(kCounted.translation(), {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 12, 13, 14, 1}));
}

// ---- projections, translations, scales ----

TEST(Matrix4, ProjectsAPerspective)
{
    const Mat4 m = Mat4::perspectiveMatrix(90, 1, 1, 100);
    EXPECT_FLOAT_EQ(m[0], 1);
    EXPECT_FLOAT_EQ(m[5], 1);
    EXPECT_FLOAT_EQ(m[10], -101.0f / 99);
    EXPECT_EQ(m[11], -1);
    EXPECT_FLOAT_EQ(m[14], -200.0f / 99);
    for (const int zero : {1, 2, 3, 4, 6, 7, 8, 9, 12, 13, 15})
        EXPECT_EQ(m[zero], 0) << zero;
}

TEST(Matrix4, ProjectsPerspectivesOfEveryShape)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const float fovy = values.Between(10, 150), aspect = values.Between(0.3f, 3);
        const float near = values.Between(0.1f, 10), far = near + values.Between(1, 1000);
        const double f = 1 / std::tan(fovy * 3.14159265358979 / 360);
        Eigen::Matrix4d expected = Eigen::Matrix4d::Zero();
        expected(0, 0) = f / aspect;
        expected(1, 1) = f;
        expected(2, 2) = -(double(far) + near) / (double(far) - near);
        expected(3, 2) = -1;
        expected(2, 3) = -2.0 * far * near / (double(far) - near);
        EXPECT_TRUE(IsNear(Mat4::perspectiveMatrix(fovy, aspect, near, far), expected, 300));
    }
}

TEST(Matrix4, ProjectsOrthogonally)
{
    const Mat4 m = Mat4::orthoMatrix(0, 8, 4, 0, -1, 3);
    EXPECT_TRUE(HasElements(m, {0.25f, 0, 0, 0, 0, -0.5f, 0, 0, 0, 0, -0.5f, 0, -1, 1, -0.5f, 1}));
    // The corners of the box are the corners of clip space.
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const float left = values.Between(-10, 10), right = left + values.Between(1, 20);
        const float bottom = values.Between(-10, 10), top = bottom - values.Between(1, 20);
        const float near = values.Between(-10, 10), far = near + values.Between(1, 20);
        const Eigen::Matrix4d e = ToEigen(Mat4::orthoMatrix(left, right, bottom, top, near, far));
        const Eigen::Vector4d low = e * Eigen::Vector4d(left, bottom, -near, 1);
        const Eigen::Vector4d high = e * Eigen::Vector4d(right, top, -far, 1);
        EXPECT_TRUE(IsNear(low, Eigen::Vector4d(-1, -1, -1, 1), 50));
        EXPECT_TRUE(IsNear(high, Eigen::Vector4d(1, 1, 1, 1), 50));
    }
}

TEST(Matrix4, TranslatesAndScales)
{
    EXPECT_TRUE(HasElements(Mat4::translateMatrix(2, 3, 4),
                            {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 2, 3, 4, 1}));
    EXPECT_EQ(Mat4::translateMatrix(Vec3(2, 3, 4)), Mat4::translateMatrix(2, 3, 4));
    EXPECT_TRUE(
        HasElements(Mat4::scaleMatrix(2, 3, 4), {2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 4, 0, 0, 0, 0, 1}));
    EXPECT_EQ(Mat4::scaleMatrix(Vec3(2, 3, 4)), Mat4::scaleMatrix(2, 3, 4));
}

// ---- rotations ----

TEST(Matrix4, RotatesAboutTheAxesInTurn)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const float x = values.Between(-7, 7), y = values.Between(-7, 7), z = values.Between(-7, 7);
        EXPECT_TRUE(IsNear(Mat4::rotateMatrix(x, y, z), Embed(Euler(x, y, z)), 1));
    }
}

TEST(Matrix4, RotateSelfKeepsEverythingElse)
{
    Mat4 m(9.0f);
    EXPECT_EQ(&m.rotateSelf(0.5f, -1, 2), &m);
    const Mat4 rotation = Mat4::rotateMatrix(0.5f, -1, 2);
    for (const int same : {3, 7, 11, 12, 13, 14, 15})
        EXPECT_EQ(m[same], 9) << same;
    for (const int turned : {0, 1, 2, 4, 5, 6, 8, 9, 10})
        EXPECT_EQ(m[turned], rotation[turned]) << turned;
}

TEST(Matrix4, RotateTakesTheTranslationAlong)
{
    const Mat4 m = kCounted.rotate(0.5f, -1, 2);
    Mat4 expected = Mat4::rotateMatrix(0.5f, -1, 2);
    expected[12] = 12;
    expected[13] = 13;
    expected[14] = 14;
    EXPECT_EQ(m, expected);
    EXPECT_EQ(kCounted[0], 0); // the original is as it was
}

TEST(Matrix4, TurnsBackwardsAboutAnAxis)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        Vec3 axis = NextVector(values);
        if (ToEigen(axis).norm() < 0.1)
            continue;
        const float angle = values.Between(-7, 7);
        const Eigen::Matrix3d expected =
            Eigen::AngleAxisd(-angle, ToEigen(axis).normalized()).toRotationMatrix();
        EXPECT_TRUE(IsNear(Mat4::rotateMatrix(angle, axis), Embed(expected), 1));
    }
}

TEST(Matrix4, TurnsAboutZTheOtherWayThanTheEulerForm)
{
    Vec3 axis(0, 0, 5);
    const Mat4 m = Mat4::rotateMatrix(0.25f, axis);
    EXPECT_FLOAT_EQ(m[1], -std::sin(0.25f));
    EXPECT_FLOAT_EQ(m[4], std::sin(0.25f));
    EXPECT_FLOAT_EQ(Mat4::rotateMatrix(0, 0, 0.25f)[1], std::sin(0.25f));
    EXPECT_EQ(axis.x, 0);
    EXPECT_EQ(axis.y, 0);
    EXPECT_EQ(axis.z, 5); // as it was
}

TEST(Matrix4, MakesABasisOfTwoVectors)
{
    // a is column 2, what is perpendicular to both is column 0.
    EXPECT_TRUE(HasElements(Mat4::rotateMatrix(Vec3(0, 0, 2), Vec3(0, 3, 0)),
                            {-1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}));
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Vec3 a = NextVector(values);
        const Vec3 b = NextVector(values);
        const Eigen::Vector3d c = ToEigen(a).cross(ToEigen(b));
        if (c.norm() < 1)
            continue;
        Eigen::Matrix3d expected;
        expected << c.normalized(), c.cross(ToEigen(a)).normalized(), ToEigen(a).normalized();
        EXPECT_TRUE(IsNear(Mat4::rotateMatrix(a, b), Embed(expected), 50 / c.norm()));
    }
}

TEST(Matrix4, ABasisOfParallelVectorsIsNotFinite)
{
    const Mat4 m = Mat4::rotateMatrix(Vec3(1, 0, 0), Vec3(2, 0, 0));
    EXPECT_TRUE(std::isnan(m[0]));
    EXPECT_TRUE(std::isnan(m[4]));
    EXPECT_EQ(m[8], 1);
}

// ---- combining ----

TEST(Matrix4, PreConcatActsOnPointsFirst)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat4 m = values.NextMatrix4();
        const Mat4 other = values.NextMatrix4();
        EXPECT_TRUE(IsNear(Mat4(m).preConcat(other), ToEigen(m) * ToEigen(other), 400));
    }
}

TEST(Matrix4, PostConcatActsOnPointsLast)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat4 m = values.NextMatrix4();
        const Mat4 other = values.NextMatrix4();
        EXPECT_TRUE(IsNear(Mat4(m).postConcat(other), ToEigen(other) * ToEigen(m), 400));
    }
}

TEST(Matrix4, MayBeCombinedWithItself)
{
    Mat4 m(kCounted);
    EXPECT_EQ(&m.preConcat(m), &m);
    EXPECT_TRUE(HasElements(
        m, {56, 62, 68, 74, 152, 174, 196, 218, 248, 286, 324, 362, 344, 398, 452, 506}));
    Mat4 n(kCounted);
    EXPECT_EQ(&n.postConcat(n), &n);
    EXPECT_EQ(n, m);
}

// ---- turning round ----

TEST(Matrix4, Transposes)
{
    const auto expected = {0.f, 4.f, 8.f,  12.f, 1.f, 5.f, 9.f,  13.f,
                           2.f, 6.f, 10.f, 14.f, 3.f, 7.f, 11.f, 15.f};
    EXPECT_TRUE(HasElements(kCounted.transpose(), expected));
    Mat4 m(kCounted);
    EXPECT_EQ(&m.transposeSelf(), &m);
    EXPECT_TRUE(HasElements(m, expected));
}

TEST(Matrix4, GivesItsAdjugate)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat4 m = values.NextMatrix4();
        double adjugate[16];
        m.calculaeMatrix(adjugate);
        EXPECT_TRUE(IsNear(Eigen::Matrix4d(adjugate), AdjugateOf(ToEigen(m)), 8000));
        for (const double element : adjugate)
            EXPECT_EQ(element, static_cast<double>(static_cast<float>(element))); // float inside
    }
}

TEST(Matrix4, GivesEachElementOfItsAdjugateExactly)
{
    // Whole numbers: every product and sum is exact.
    std::mt19937 engine(7);
    for (int i = 0; i < kRandomCases; ++i)
    {
        Mat4 m;
        for (int k = 0; k < 16; ++k)
            m[k] = static_cast<float>(static_cast<int>(engine() % 19) - 9);
        double adjugate[16];
        m.calculaeMatrix(adjugate);
        const Eigen::Matrix4d expected = AdjugateOf(ToEigen(m));
        for (int k = 0; k < 16; ++k)
            ASSERT_EQ(adjugate[k], std::round(expected.data()[k])) << "element " << k;
    }
}

TEST(Matrix4, InvertsWhatCanBeInverted)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat4 m = values.NextMatrix4();
        const Eigen::Matrix4d e = ToEigen(m);
        if (std::abs(e.determinant()) < 10)
            continue;
        const Eigen::Matrix4d expected = e.inverse();
        const double scale = 8000 * (1 + Largest(expected)) / std::abs(e.determinant());
        EXPECT_TRUE(IsNear(m.inverse(), expected, scale));
        Mat4 self(m);
        EXPECT_EQ(&self.inverseSelf(), &self);
        EXPECT_EQ(self, m.inverse());
    }
}

TEST(Matrix4, DividesItsAdjugateInDoublePrecision)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat4 m = values.NextMatrix4();
        double a[16];
        m.calculaeMatrix(a);
        const double determinant = m[0] * a[0] + m[4] * a[1] + m[8] * a[2] + m[12] * a[3];
        if (determinant == 0.0)
            continue;
        const Mat4 actual = m.inverse();
        for (int k = 0; k < 16; ++k)
            ASSERT_EQ(actual[k], static_cast<float>(a[k] * (1.0 / determinant)))
                << i << ", element " << k;
    }
}

TEST(Matrix4, ASingularMatrixStaysAsItIs)
{
    Mat4 zeroRow = kCounted;
    for (const int k : {2, 6, 10, 14})
        zeroRow[k] = 0;
    for (const Mat4& singular : {zeroRow, Mat4(0.0f), Mat4(3.0f)})
    {
        EXPECT_EQ(singular.inverse(), singular);
        Mat4 self(singular);
        self.inverseSelf();
        EXPECT_EQ(self, singular);
    }
}

TEST(Vectors, AreZeroUnlessTold)
{
    EXPECT_EQ(Nib::Vector2<float>().x, 0);
    EXPECT_EQ(Nib::Vector3<float>().z, 0);
    EXPECT_EQ(Nib::Vector4<float>().w, 0);
    EXPECT_EQ(Nib::Vector2<float>(1, 2).y, 2);
    EXPECT_EQ(Nib::Vector3<float>(1, 2, 3).z, 3);
    EXPECT_TRUE(Is(Nib::Vector4<float>(1, 2, 3, 4), 1, 2, 3, 4));
}
