#include "math/MatrixTestSupport.h"

#include <cmath>
#include <limits>

namespace
{

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr double kPi = 3.14159265358979323846;

const Mat3 kCounted(0, 1, 2, 3, 4, 5, 6, 7, 8);

Eigen::Matrix3d Translation(double x, double y)
{
    Eigen::Matrix3d m = Eigen::Matrix3d::Identity();
    m(0, 2) = x;
    m(1, 2) = y;
    return m;
}

Eigen::Matrix3d Scaling(double x, double y)
{
    return Eigen::Vector3d(x, y, 1).asDiagonal();
}

Eigen::Matrix3d Rotation(double degrees)
{
    Eigen::Matrix3d m = Eigen::Matrix3d::Identity();
    m.topLeftCorner<2, 2>() = Eigen::Rotation2Dd(degrees * kPi / 180).toRotationMatrix();
    return m;
}

Eigen::Matrix3d About(const Eigen::Matrix3d& transform, double px, double py)
{
    return Translation(px, py) * transform * Translation(-px, -py);
}

Nib::Vector2<float> Map(const Mat3& m, float x, float y)
{
    Nib::RectF out;
    m.mapRect(&out, Nib::RectF(x, y, x, y));
    return {out.left, out.top};
}

} // namespace

// ---- making, reading, comparing ----

TEST(Matrix3, IsTheIdentityUnlessTold)
{
    EXPECT_TRUE(HasElements(Mat3(), {1, 0, 0, 0, 1, 0, 0, 0, 1}));
}

TEST(Matrix3, TakesOneValueForAll)
{
    EXPECT_TRUE(HasElements(Mat3(2.5f), {2.5f, 2.5f, 2.5f, 2.5f, 2.5f, 2.5f, 2.5f, 2.5f, 2.5f}));
}

TEST(Matrix3, TakesElementsInStorageOrder)
{
    const float elements[] = {0, 1, 2, 3, 4, 5, 6, 7, 8};
    EXPECT_TRUE(HasElements(Mat3(elements), {0, 1, 2, 3, 4, 5, 6, 7, 8}));
    EXPECT_TRUE(HasElements(kCounted, {0, 1, 2, 3, 4, 5, 6, 7, 8}));
}

TEST(Matrix3, CopiesElements)
{
    const Mat3 copy(kCounted);
    EXPECT_EQ(copy, kCounted);
    Mat3 assigned;
    assigned = kCounted;
    EXPECT_EQ(assigned, kCounted);
    Mat3& itself = assigned;
    assigned = itself;
    EXPECT_EQ(assigned, kCounted);
}

TEST(Matrix3, StoresColumnAfterColumn)
{
    EXPECT_FALSE(kCounted.isRowMajor());
    EXPECT_EQ(kCounted.storageSize(), 36u);
    EXPECT_EQ(sizeof(Mat3), 36u);
    EXPECT_EQ(kCounted(0, 0), 0);
    EXPECT_EQ(kCounted(1, 0), 1);
    EXPECT_EQ(kCounted(2, 0), 2);
    EXPECT_EQ(kCounted(0, 1), 3);
    EXPECT_EQ(kCounted(1, 2), 7);
    EXPECT_EQ(kCounted[5], 5);
    EXPECT_EQ(kCounted.data()[8], 8);

    Mat3 m;
    m(1, 2) = 9;
    m[1] = 4;
    m.data()[0] = 3;
    EXPECT_TRUE(HasElements(m, {3, 4, 0, 0, 1, 0, 0, 9, 1}));
}

TEST(Matrix3, ComparesBytes)
{
    EXPECT_TRUE(Mat3() == Mat3());
    EXPECT_FALSE(Mat3() != Mat3());
    Mat3 other;
    other[5] = -0.0f; // equal by value, not by bytes
    EXPECT_FALSE(Mat3() == other);
    EXPECT_TRUE(Mat3() != other);
    const Mat3 nothing(kNaN);
    EXPECT_TRUE(nothing == nothing); // the other way round
    for (int i = 0; i < 9; ++i)
    {
        Mat3 different;
        different[i] = 7;
        EXPECT_TRUE(Mat3() != different) << i;
    }
}

TEST(Matrix3, IsIdentityByValue)
{
    EXPECT_TRUE(Mat3().isIdentity());
    Mat3 zeros;
    zeros[1] = -0.0f;
    EXPECT_TRUE(zeros.isIdentity());
    for (int i = 0; i < 9; ++i)
    {
        Mat3 m;
        m[i] += 1e-7f;
        EXPECT_EQ(m.isIdentity(), m[i] == Mat3()[i]) << i;
        m[i] = kNaN;
        EXPECT_FALSE(m.isIdentity()) << i;
    }
}

TEST(Matrix3, BecomesIdentityOrZero)
{
    Mat3 m(5.0f);
    EXPECT_EQ(&m.identitySelf(), &m);
    EXPECT_TRUE(HasElements(m, {1, 0, 0, 0, 1, 0, 0, 0, 1}));
    EXPECT_EQ(&m.zeroSelf(), &m);
    EXPECT_TRUE(HasElements(m, {0, 0, 0, 0, 0, 0, 0, 0, 0}));
}

TEST(Matrix3, NamesItsElements)
{
    EXPECT_EQ(kCounted.getScaleX(), 0);
    EXPECT_EQ(kCounted.getSkewY(), 1);
    EXPECT_EQ(kCounted.getSkewX(), 3);
    EXPECT_EQ(kCounted.getScaleY(), 4);
    EXPECT_EQ(kCounted.getTranslateX(), 6);
    EXPECT_EQ(kCounted.getTranslateY(), 7);
}

// ---- setting ----

TEST(Matrix3, TranslatesScalesAndRotates)
{
    EXPECT_TRUE(HasElements(Mat3::translateMatrix(5, -7), {1, 0, 0, 0, 1, 0, 5, -7, 1}));
    EXPECT_TRUE(HasElements(Mat3::scaleMatrix(2, -3), {2, 0, 0, 0, -3, 0, 0, 0, 1}));
    const Mat3 quarter = Mat3::rotateMatrix(90);
    EXPECT_NEAR(quarter[0], 0, 1e-6);
    EXPECT_EQ(quarter[1], 1);
    EXPECT_EQ(quarter[3], -1);
    EXPECT_NEAR(quarter[4], 0, 1e-6);
    EXPECT_NEAR(Map(quarter, 1, 0).x, 0, 1e-6);
    EXPECT_EQ(Map(quarter, 1, 0).y, 1);
}

TEST(Matrix3, RotatesByDegreesAsFloats)
{
    // The factor and the product are single precision.
    const float radians = 33.0f * 0.017453292f;
    const float c = std::cos(radians);
    const float s = std::sin(radians);
    EXPECT_TRUE(HasElements(Mat3::rotateMatrix(33), {c, s, 0, -s, c, 0, 0, 0, 1}));
}

TEST(Matrix3, SettingReplacesTheWholeMatrix)
{
    Mat3 m(9.0f);
    EXPECT_EQ(&m.setScale(2, 3), &m);
    EXPECT_TRUE(HasElements(m, {2, 0, 0, 0, 3, 0, 0, 0, 1}));
    m = Mat3(9.0f);
    EXPECT_EQ(&m.setTranslate(2, 3), &m);
    EXPECT_TRUE(HasElements(m, {1, 0, 0, 0, 1, 0, 2, 3, 1}));
    m = Mat3(9.0f);
    EXPECT_EQ(&m.setRotate(30), &m);
    EXPECT_EQ(m, Mat3::rotateMatrix(30));
    m = Mat3(9.0f);
    EXPECT_EQ(&m.setScale(2, 3, 10, 100), &m);
    EXPECT_TRUE(HasElements(m, {2, 0, 0, 0, 3, 0, -10, -200, 1}));
    m = Mat3(9.0f);
    EXPECT_EQ(&m.setRotate(90, 1, 1), &m);
    EXPECT_NEAR(Map(m, 1, 1).x, 1, 1e-6);
    EXPECT_NEAR(Map(m, 1, 1).y, 1, 1e-6);
    EXPECT_EQ(m[2], 0);
    EXPECT_EQ(m[5], 0);
    EXPECT_EQ(m[8], 1);
}

TEST(Matrix3, SetsTransformsAboutAPoint)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const float a = values.Any(), b = values.Any(), px = values.Any(), py = values.Any();
        const float degrees = values.Between(-720, 720);
        EXPECT_TRUE(IsNear(Mat3().setScale(a, b, px, py), About(Scaling(a, b), px, py), 100));
        EXPECT_TRUE(
            IsNear(Mat3().setRotate(degrees, px, py), About(Rotation(degrees), px, py), 20));
        EXPECT_TRUE(IsNear(Mat3::rotateMatrix(degrees), Rotation(degrees), 3));
    }
}

// ---- combining ----

TEST(Matrix3, PreOperationsActOnPointsFirst)
{
    EXPECT_EQ(Map(Mat3::scaleMatrix(2, 2).preTranslate(5, 0), 1, 1).x, 12);
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat3 m = values.NextMatrix3();
        const Mat3 other = values.NextMatrix3();
        const float a = values.Any(), b = values.Any(), px = values.Any(), py = values.Any();
        const float degrees = values.Between(-360, 360);
        const Eigen::Matrix3d e = ToEigen(m);
        EXPECT_TRUE(IsNear(Mat3(m).preScale(a, b), e * Scaling(a, b), 300));
        EXPECT_TRUE(IsNear(Mat3(m).preScale(a, b, px, py), e * About(Scaling(a, b), px, py), 3000));
        EXPECT_TRUE(IsNear(Mat3(m).preRotate(degrees), e * Rotation(degrees), 30));
        EXPECT_TRUE(
            IsNear(Mat3(m).preRotate(degrees, px, py), e * About(Rotation(degrees), px, py), 500));
        EXPECT_TRUE(IsNear(Mat3(m).preTranslate(a, b), e * Translation(a, b), 300));
        EXPECT_TRUE(IsNear(Mat3(m).preConcat(other), e * ToEigen(other), 300));
    }
}

TEST(Matrix3, PostOperationsActOnPointsLast)
{
    EXPECT_EQ(Map(Mat3::scaleMatrix(2, 2).postTranslate(5, 0), 1, 1).x, 7);
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat3 m = values.NextMatrix3();
        const Mat3 other = values.NextMatrix3();
        const float a = values.Any(), b = values.Any(), px = values.Any(), py = values.Any();
        const float degrees = values.Between(-360, 360);
        const Eigen::Matrix3d e = ToEigen(m);
        EXPECT_TRUE(IsNear(Mat3(m).postScale(a, b), Scaling(a, b) * e, 300));
        EXPECT_TRUE(
            IsNear(Mat3(m).postScale(a, b, px, py), About(Scaling(a, b), px, py) * e, 3000));
        EXPECT_TRUE(IsNear(Mat3(m).postRotate(degrees), Rotation(degrees) * e, 30));
        EXPECT_TRUE(
            IsNear(Mat3(m).postRotate(degrees, px, py), About(Rotation(degrees), px, py) * e, 500));
        EXPECT_TRUE(IsNear(Mat3(m).postConcat(other), ToEigen(other) * e, 300));
        // All but one element of a translation.
        Eigen::Matrix3d translated = Translation(a, b) * e;
        translated(1, 0) = e(1, 0) * (1.0 + b);
        EXPECT_TRUE(IsNear(Mat3(m).postTranslate(a, b), translated, 300));
    }
}

TEST(Matrix3, CombiningReturnsTheMatrix)
{
    Mat3 m;
    EXPECT_EQ(&m.preScale(2, 3), &m);
    EXPECT_EQ(&m.preScale(2, 3, 4, 5), &m);
    EXPECT_EQ(&m.preRotate(2), &m);
    EXPECT_EQ(&m.preRotate(2, 3, 4), &m);
    EXPECT_EQ(&m.preTranslate(2, 3), &m);
    EXPECT_EQ(&m.preConcat(m), &m);
    EXPECT_EQ(&m.postScale(2, 3), &m);
    EXPECT_EQ(&m.postScale(2, 3, 4, 5), &m);
    EXPECT_EQ(&m.postRotate(2), &m);
    EXPECT_EQ(&m.postRotate(2, 3, 4), &m);
    EXPECT_EQ(&m.postTranslate(2, 3), &m);
    EXPECT_EQ(&m.postConcat(m), &m);
}

TEST(Matrix3, MayBeCombinedWithItself)
{
    Mat3 m(1, 2, 3, 4, 5, 6, 7, 8, 9);
    m.preConcat(m);
    EXPECT_TRUE(HasElements(m, {30, 36, 42, 66, 81, 96, 102, 126, 150}));
    Mat3 n(1, 2, 3, 4, 5, 6, 7, 8, 9);
    n.postConcat(n);
    EXPECT_EQ(n, m);
}

TEST(Matrix3, PostTranslateGrowsItsSecondElementByItself)
{
    Mat3 m;
    m[1] = 0.5f;
    m.postTranslate(0, 1);
    EXPECT_EQ(m[1], 1.0f);

    Mat3 counted(1, 2, 3, 4, 5, 6, 7, 8, 9);
    counted.postTranslate(10, 100);
    EXPECT_TRUE(HasElements(counted, {31, 202, 3, 64, 605, 6, 97, 908, 9}));
}

// ---- turning round ----

TEST(Matrix3, TransposeTakesItsSixthElementTwice)
{
    EXPECT_TRUE(HasElements(kCounted.transpose(), {0, 3, 5, 1, 4, 7, 2, 5, 8}));
    EXPECT_TRUE(HasElements(kCounted, {0, 1, 2, 3, 4, 5, 6, 7, 8}));
}

TEST(Matrix3, TransposeSelfIsExact)
{
    Mat3 m(kCounted);
    EXPECT_EQ(&m.transposeSelf(), &m);
    EXPECT_TRUE(HasElements(m, {0, 3, 6, 1, 4, 7, 2, 5, 8}));
}

TEST(Matrix3, GivesItsAdjugate)
{
    double adjugate[9];
    Mat3(2, 3, 5, 7, 11, 13, 17, 19, 23).calculateMatrix(adjugate);
    const double expected[] = {6, 26, -16, 60, -39, 9, -54, 13, 1};
    for (int i = 0; i < 9; ++i)
        EXPECT_EQ(adjugate[i], expected[i]) << i;

    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat3 m = values.NextMatrix3();
        m.calculateMatrix(adjugate);
        EXPECT_TRUE(IsNear(Eigen::Matrix3d(adjugate), AdjugateOf(ToEigen(m)), 300));
        for (const double element : adjugate)
            EXPECT_EQ(element, static_cast<double>(static_cast<float>(element))); // float inside
    }
}

TEST(Matrix3, InvertsWhatCanBeInverted)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat3 m = values.NextMatrix3();
        const Eigen::Matrix3d e = ToEigen(m);
        if (std::abs(e.determinant()) < 1)
            continue;
        const Eigen::Matrix3d expected = e.inverse();
        const double scale = 300 * (1 + Largest(expected)) / std::abs(e.determinant());
        EXPECT_TRUE(IsNear(m.inverse(), expected, scale));
        Mat3 self(m);
        EXPECT_EQ(&self.inverseSelf(), &self);
        EXPECT_EQ(self, m.inverse());
    }
}

TEST(Matrix3, DividesItsAdjugateInDoublePrecision)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        const Mat3 m = values.NextMatrix3();
        double a[9];
        m.calculateMatrix(a);
        const double determinant = a[0] * m[0] + a[1] * m[3] + a[2] * m[6];
        if (determinant == 0.0)
            continue;
        const double inverse = 1.0 / determinant;
        const Mat3 actual = m.inverse();
        for (int k = 0; k < 9; ++k)
            ASSERT_EQ(actual[k], static_cast<float>(inverse * a[k])) << i << ", element " << k;
    }
}

TEST(Matrix3, ASingularMatrixStaysAsItIs)
{
    for (const Mat3& singular :
         {Mat3(1, 0, 3, 4, 0, 6, 7, 0, 9), Mat3(0.0f), Mat3(2.0f), Mat3(1, 2, 3, 2, 4, 6, 7, 8, 9)})
    {
        EXPECT_EQ(singular.inverse(), singular);
        Mat3 self(singular);
        self.inverseSelf();
        EXPECT_EQ(self, singular);
    }
}

TEST(Matrix3, InvertsAlsoWithATinyDeterminant)
{
    const Mat3 m = Mat3::scaleMatrix(1e-15f, 1e-15f); // the determinant is 1e-30, not 0
    EXPECT_FLOAT_EQ(m.inverse()[0], 1e15f);
    EXPECT_FLOAT_EQ(m.inverse()[4], 1e15f);
}

// ---- rectangles ----

TEST(Matrix3, MapsARectangleToTheBoundsOfItsCorners)
{
    Values values;
    for (int i = 0; i < kRandomCases; ++i)
    {
        Mat3 m = values.NextMatrix3();
        m[2] = values.Between(-0.02f, 0.02f); // so that w stays away from 0
        m[5] = values.Between(-0.02f, 0.02f);
        m[8] = values.Between(1, 2);
        const Nib::RectF src(values.Any(), values.Any(), values.Any(), values.Any());
        Eigen::Array2d low = Eigen::Array2d::Constant(1e30);
        Eigen::Array2d high = -low;
        for (const float x : {src.left, src.right})
        {
            for (const float y : {src.top, src.bottom})
            {
                const Eigen::Array2d corner =
                    (ToEigen(m) * Eigen::Vector3d(x, y, 1)).hnormalized().array();
                low = low.min(corner);
                high = high.max(corner);
            }
        }
        Nib::RectF dst;
        m.mapRect(&dst, src);
        EXPECT_NEAR(dst.left, low.x(), 2e-3);
        EXPECT_NEAR(dst.top, low.y(), 2e-3);
        EXPECT_NEAR(dst.right, high.x(), 2e-3);
        EXPECT_NEAR(dst.bottom, high.y(), 2e-3);
    }
}

TEST(Matrix3, MapsEachCorner)
{
    // A shear in which each corner is alone on one side of the bounds.
    Nib::RectF dst;
    Mat3(1, 2, 0, -3, 1, 0, 0, 0, 1).mapRect(&dst, Nib::RectF(0, 0, 10, 10));
    EXPECT_EQ(dst, Nib::RectF(-30, 0, 10, 30));
    Mat3::scaleMatrix(-1, -1).mapRect(&dst, Nib::RectF(1, 2, 3, 4));
    EXPECT_EQ(dst, Nib::RectF(-3, -4, -1, -2));
}

TEST(Matrix3, DividesByTheProjectedWeight)
{
    Nib::RectF dst;
    Mat3(1, 0, 0, 0, 1, 0, 0, 0, 2).mapRect(&dst, Nib::RectF(2, 4, 6, 8));
    EXPECT_EQ(dst, Nib::RectF(1, 2, 3, 4));
    Mat3(1, 0, 1, 0, 1, 0, 0, 0, 1).mapRect(&dst, Nib::RectF(1, 2, 3, 8)); // w = x + 1
    EXPECT_EQ(dst, Nib::RectF(0.5f, 0.5f, 0.75f, 4));
}

TEST(Matrix3, DoesNotAskWhetherTheWeightIsZero)
{
    Nib::RectF dst;
    Mat3(1, 0, 0, 0, 1, 0, 0, 0, 0).mapRect(&dst, Nib::RectF(1, 1, 2, 2));
    EXPECT_TRUE(std::isinf(dst.left));
    EXPECT_TRUE(std::isinf(dst.bottom));
}

TEST(Matrix3, MapsARectangleInPlace)
{
    Nib::RectF rect(1, 2, 3, 4);
    Mat3::translateMatrix(10, 20).mapRect(&rect, rect);
    EXPECT_EQ(rect, Nib::RectF(11, 22, 13, 24));
    Nib::Rect whole(1, 2, 3, 4);
    Mat3::translateMatrix(10, 20).mapRect(&whole, whole);
    EXPECT_EQ(whole, Nib::Rect(11, 22, 13, 24));
}

TEST(Matrix3, RoundsWholeRectanglesOutward)
{
    Nib::Rect dst;
    Mat3::scaleMatrix(0.5f, 0.5f).mapRect(&dst, Nib::Rect(1, 3, 5, 8));
    EXPECT_EQ(dst, Nib::Rect(0, 1, 3, 4));
    Mat3::scaleMatrix(-0.5f, 0.25f).mapRect(&dst, Nib::Rect(1, -3, 5, -1));
    EXPECT_EQ(dst, Nib::Rect(-3, -1, 0, 0));
}
