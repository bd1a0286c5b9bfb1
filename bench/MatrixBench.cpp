// Matrices beside glm and Eigen, whose functions are compiled into the loop; ours are called in
// the library. Read each row as its ratio to the glm row of the same operation.

#include <nib/matrix.h>

#include <benchmark/benchmark.h>

#include <eigen3/Eigen/Dense>
#include <glm/glm.hpp>
#include <glm/gtc/matrix_inverse.hpp>

#include <algorithm>
#include <array>

namespace
{

using Mat3 = Nib::Matrix3<float>;
using Mat4 = Nib::Matrix4<float>;

// Turned, scaled, moved, and slightly in perspective: nothing in them is 0 or 1.
constexpr float kFirst3[] = {1.5f, 0.25f, 0.001f, -0.5f, 1.25f, 0.002f, 20.0f, 30.0f, 0.9f};
constexpr float kSecond3[] = {0.75f, -0.5f, 0.003f, 0.25f, 2.5f, 0.001f, -7.0f, 11.0f, 1.1f};
constexpr float kFirst4[] = {1.5f, 0.25f, 0.1f,  0.01f,  -0.5f, 1.25f, 0.2f,  0.02f,
                             0.3f, -0.4f, 1.75f, -0.03f, 20.0f, 30.0f, 40.0f, 0.9f};
constexpr float kSecond4[] = {0.75f, -0.5f, 0.3f, 0.04f, 0.25f, 2.5f, -0.1f, 0.05f,
                              -0.2f, 0.6f,  1.1f, 0.06f, -7.0f, 11.,  13.0f, 1.1f};

template <typename Matrix>
Matrix Glm(const float* elements)
{
    Matrix m;
    std::copy_n(elements, sizeof(Matrix) / sizeof(float), &m[0][0]);
    return m;
}

// ---- products: a new matrix from two ----

template <typename Matrix>
void NibProduct(benchmark::State& state, const float* first, const float* second)
{
    Matrix a(first), b(second);
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(a);
        benchmark::DoNotOptimize(b);
        Matrix product(a);
        product.preConcat(b);
        benchmark::DoNotOptimize(product);
    }
}

template <typename Matrix>
void PeerProduct(benchmark::State& state, Matrix a, Matrix b)
{
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(a);
        benchmark::DoNotOptimize(b);
        Matrix product = a * b;
        benchmark::DoNotOptimize(product);
    }
}

void BM_Nib3x3Product(benchmark::State& state)
{
    NibProduct<Mat3>(state, kFirst3, kSecond3);
}

void BM_Glm3x3Product(benchmark::State& state)
{
    PeerProduct(state, Glm<glm::mat3>(kFirst3), Glm<glm::mat3>(kSecond3));
}

void BM_Eigen3x3Product(benchmark::State& state)
{
    PeerProduct<Eigen::Matrix3f>(state, Eigen::Matrix3f(kFirst3), Eigen::Matrix3f(kSecond3));
}

void BM_Nib4x4Product(benchmark::State& state)
{
    NibProduct<Mat4>(state, kFirst4, kSecond4);
}

void BM_Glm4x4Product(benchmark::State& state)
{
    PeerProduct(state, Glm<glm::mat4>(kFirst4), Glm<glm::mat4>(kSecond4));
}

void BM_Eigen4x4Product(benchmark::State& state)
{
    PeerProduct<Eigen::Matrix4f>(state, Eigen::Matrix4f(kFirst4), Eigen::Matrix4f(kSecond4));
}

// ---- inverses ----

template <typename Matrix, typename Invert>
void Inverse(benchmark::State& state, Matrix m, Invert invert)
{
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(m);
        Matrix inverse = invert(m);
        benchmark::DoNotOptimize(inverse);
    }
}

void BM_Nib3x3Inverse(benchmark::State& state)
{
    Inverse(state, Mat3(kFirst3), [](const Mat3& m) { return m.inverse(); });
}

void BM_Glm3x3Inverse(benchmark::State& state)
{
    Inverse(state, Glm<glm::mat3>(kFirst3), [](const glm::mat3& m) { return glm::inverse(m); });
}

void BM_Eigen3x3Inverse(benchmark::State& state)
{
    Inverse(state, Eigen::Matrix3f(kFirst3),
            [](const Eigen::Matrix3f& m) -> Eigen::Matrix3f { return m.inverse(); });
}

void BM_Nib4x4Inverse(benchmark::State& state)
{
    Inverse(state, Mat4(kFirst4), [](const Mat4& m) { return m.inverse(); });
}

void BM_Glm4x4Inverse(benchmark::State& state)
{
    Inverse(state, Glm<glm::mat4>(kFirst4), [](const glm::mat4& m) { return glm::inverse(m); });
}

void BM_Eigen4x4Inverse(benchmark::State& state)
{
    Inverse(state, Eigen::Matrix4f(kFirst4),
            [](const Eigen::Matrix4f& m) -> Eigen::Matrix4f { return m.inverse(); });
}

// ---- the bounding box of a mapped rectangle ----

constexpr Nib::RectF kRect(10, 20, 300, 400);

void BM_NibMapRect(benchmark::State& state)
{
    Mat3 m(kFirst3);
    Nib::RectF rect = kRect;
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(m);
        benchmark::DoNotOptimize(rect);
        Nib::RectF bounds;
        m.mapRect(&bounds, rect);
        benchmark::DoNotOptimize(bounds);
    }
}

/// As a user of a library without rectangles writes it.
template <typename Matrix, typename MapCorner>
void PeerMapRect(benchmark::State& state, Matrix m, MapCorner map)
{
    Nib::RectF rect = kRect;
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(m);
        benchmark::DoNotOptimize(rect);
        const std::array corners{map(m, rect.left, rect.top), map(m, rect.right, rect.bottom),
                                 map(m, rect.right, rect.top), map(m, rect.left, rect.bottom)};
        auto low = corners[0], high = corners[0];
        for (std::size_t i = 1; i < corners.size(); ++i)
        {
            low = {std::min(low[0], corners[i][0]), std::min(low[1], corners[i][1])};
            high = {std::max(high[0], corners[i][0]), std::max(high[1], corners[i][1])};
        }
        Nib::RectF bounds(low[0], low[1], high[0], high[1]);
        benchmark::DoNotOptimize(bounds);
    }
}

void BM_GlmMapRect(benchmark::State& state)
{
    PeerMapRect(state, Glm<glm::mat3>(kFirst3),
                [](const glm::mat3& m, float x, float y)
                {
                    const glm::vec3 mapped = m * glm::vec3(x, y, 1);
                    return glm::vec2(mapped) / mapped.z;
                });
}

void BM_EigenMapRect(benchmark::State& state)
{
    PeerMapRect(state, Eigen::Matrix3f(kFirst3),
                [](const Eigen::Matrix3f& m, float x, float y) -> Eigen::Vector2f
                { return (m * Eigen::Vector3f(x, y, 1)).hnormalized(); });
}

} // namespace

BENCHMARK(BM_Nib3x3Product);
BENCHMARK(BM_Glm3x3Product);
BENCHMARK(BM_Eigen3x3Product);
BENCHMARK(BM_Nib4x4Product);
BENCHMARK(BM_Glm4x4Product);
BENCHMARK(BM_Eigen4x4Product);
BENCHMARK(BM_Nib3x3Inverse);
BENCHMARK(BM_Glm3x3Inverse);
BENCHMARK(BM_Eigen3x3Inverse);
BENCHMARK(BM_Nib4x4Inverse);
BENCHMARK(BM_Glm4x4Inverse);
BENCHMARK(BM_Eigen4x4Inverse);
BENCHMARK(BM_NibMapRect);
BENCHMARK(BM_GlmMapRect);
BENCHMARK(BM_EigenMapRect);

BENCHMARK_MAIN();
