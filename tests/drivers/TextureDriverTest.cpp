// Textures on the process's driver: what is uploaded is what is sampled.

#include "drivers/GlesOnDriver.h"

#include <nib/device.h>
#include <nib/texture.h>

#include <cmath>
#include <cstdint>
#include <cstring>

using namespace Nib;

namespace
{

using TextureOnDriver = GlesOnDriver;

constexpr int kWidth = 8;
constexpr int kHeight = 4;

// Where the texture lies in a larger picture.
constexpr int kSkipPixels = 2;
constexpr int kSkipRows = 1;
constexpr int kRowLength = 11;
constexpr int kRows = 6;

/// The value of a channel, 0 to 255, at a pixel of the texture: different in every pixel.
int Value(int x, int y, int channel)
{
    return 16 * y + 7 * x + 64 * channel % 160 + channel;
}

std::uint16_t ToHalf(float value) // 0 or above 2 to the -14, cut off
{
    std::uint32_t bits = 0;
    std::memcpy(&bits, &value, sizeof bits);
    if (bits == 0)
        return 0;
    const std::uint32_t exponent = (bits >> 23) - 127 + 15;
    return static_cast<std::uint16_t>(exponent << 10 | (bits >> 13 & 0x3FF));
}

template <typename T>
void Append(std::vector<unsigned char>& bytes, T value)
{
    unsigned char raw[sizeof(T)];
    std::memcpy(raw, &value, sizeof(T));
    bytes.insert(bytes.end(), raw, raw + sizeof(T));
}

/// How a channel is stored in the client's memory.
enum class Storage
{
    Byte,
    Short,
    Int,
    Half,
    Float,
    NormalizedInt,
};

void AppendChannel(std::vector<unsigned char>& bytes, Storage storage, int value)
{
    switch (storage)
    {
    case Storage::Byte: return Append(bytes, static_cast<std::uint8_t>(value));
    case Storage::Short: return Append(bytes, static_cast<std::uint16_t>(value));
    case Storage::Int: return Append(bytes, static_cast<std::uint32_t>(value));
    case Storage::Half: return Append(bytes, ToHalf(static_cast<float>(value) / 255));
    case Storage::Float: return Append(bytes, static_cast<float>(value) / 255);
    case Storage::NormalizedInt:
        return Append(bytes, static_cast<std::uint32_t>(value) * 0x01010101u);
    }
}

// What the samplers give, as a colour.
constexpr const char* kSampleColor =
    "uniform sampler2D u_texture;\n"
    "void main() { color = texture(u_texture, gl_FragCoord.xy / vec2(8, 4)); }\n";
constexpr const char* kSampleUnsigned = "uniform highp usampler2D u_texture;\n"
                                        "void main() { color = vec4(float(texture(u_texture, "
                                        "gl_FragCoord.xy / vec2(8, 4)).r) / 255.0,\n"
                                        "                           0, 0, 1); }\n";
constexpr const char* kSampleSigned = "uniform highp isampler2D u_texture;\n"
                                      "void main() { color = vec4(float(texture(u_texture, "
                                      "gl_FragCoord.xy / vec2(8, 4)).r) / 255.0,\n"
                                      "                           0, 0, 1); }\n";
constexpr const char* kSampleDepth =
    "uniform highp sampler2DShadow u_texture;\n"
    "void main() { color = vec4(texture(u_texture, vec3(gl_FragCoord.xy / vec2(8, 4), 0.25)),\n"
    "                           0, 0, 1); }\n";

/// A pair of layouts that every driver takes.
struct PixelPair
{
    const char* name;
    int layout;
    int memoryLayout;
    int channels;
    Storage storage;
    const char* sample;
};

void PrintTo(const PixelPair& pair, std::ostream* out)
{
    *out << pair.name;
}

const PixelPair kPairs[] = {
    {"R8", 0, 0, 1, Storage::Byte, kSampleColor},
    {"SingleR8", 3, 0, 1, Storage::Byte, kSampleColor},
    {"RGBA8", 2, 6, 4, Storage::Byte, kSampleColor},
    {"Luminance", 6, 13, 1, Storage::Byte, kSampleColor},
    {"RGBA32F", 2, 10, 4, Storage::Float, kSampleColor},
    {"RGBA16F", 2, 14, 4, Storage::Float, kSampleColor},
    {"R32F", 0, 7, 1, Storage::Float, kSampleColor},
    {"SingleR32F", 3, 7, 1, Storage::Float, kSampleColor},
    {"RGB32F", 5, 9, 3, Storage::Float, kSampleColor},
    {"RGB16F", 5, 11, 3, Storage::Half, kSampleColor},
    {"R16UI", 1, 1, 1, Storage::Short, kSampleUnsigned},
    {"R16I", 1, 2, 1, Storage::Short, kSampleSigned},
    {"R32UI", 1, 3, 1, Storage::Int, kSampleUnsigned},
    {"R32I", 1, 4, 1, Storage::Int, kSampleSigned},
    {"Depth32F", 4, 8, 1, Storage::Float, kSampleDepth},
    {"DepthComponent", 4, 12, 1, Storage::NormalizedInt, kSampleDepth},
};

/// The picture around the texture; @p shift makes another one of it. What is skipped is 255.
std::vector<unsigned char> Memory(const PixelPair& pair, int rowLength, int skipPixels,
                                  int skipRows, int rows, int shift)
{
    std::vector<unsigned char> bytes;
    for (int y = -skipRows; y < rows - skipRows; ++y)
        for (int x = -skipPixels; x < rowLength - skipPixels; ++x)
            for (int channel = 0; channel < pair.channels; ++channel)
            {
                const bool inside = x >= 0 && x < kWidth && y >= 0 && y < kHeight;
                AppendChannel(bytes, pair.storage, inside ? Value(x, y, channel) + shift : 255);
            }
    return bytes;
}

Rgba ExpectedAt(const PixelPair& pair, int x, int y, int shift)
{
    const auto value = [&](int channel)
    { return static_cast<unsigned char>(Value(x, y, channel) + shift); };
    if (pair.sample == kSampleDepth) // passes where 0.25 is not above the depth
        return {static_cast<unsigned char>(value(0) >= 64 ? 255 : 0), 0, 0, 255};
    if (pair.layout == 6)
        return {value(0), value(0), value(0), 255};
    switch (pair.channels)
    {
    case 1: return {value(0), 0, 0, 255};
    case 3: return {value(0), value(1), value(2), 255};
    default: return {value(0), value(1), value(2), value(3)};
    }
}

void ExpectSampled(const PixelPair& pair, ITextureObject& texture, int shift, const char* step)
{
    Page page(kWidth, kHeight);
    Cover cover(pair.sample);
    texture.Activate(0);
    cover.Draw();
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR}) << step;
    const std::vector<Rgba> pixels = page.Pixels();
    for (int y = 0; y < kHeight; ++y)
        for (int x = 0; x < kWidth; ++x)
            EXPECT_TRUE(Near(pixels[static_cast<std::size_t>(y * kWidth + x)],
                             ExpectedAt(pair, x, y, shift)))
                << step << " at " << x << ", " << y;
}

class PixelPairOnDriver : public TextureOnDriver, public testing::WithParamInterface<PixelPair>
{
};

std::vector<Rgba> Checkered(int width, int height, const Rgba& even, const Rgba& odd)
{
    std::vector<Rgba> pixels;
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            pixels.push_back((x + y) % 2 == 0 ? even : odd);
    return pixels;
}

constexpr Rgba kRed = {255, 0, 0, 255};
constexpr Rgba kGreen = {0, 255, 0, 255};
constexpr Rgba kBlue = {0, 0, 255, 255};
constexpr Rgba kWhite = {255, 255, 255, 255};

/// What the middle of @p texture looks like through @p sample, an expression.
Rgba Sampled(ITextureObject& texture, const std::string& declaration, const std::string& sample)
{
    Page page(1, 1);
    Cover cover(declaration + " void main() { color = " + sample + "; }");
    texture.Activate(0);
    cover.Draw();
    return page.At(0, 0);
}

Rgba SampledAt(ITextureObject& texture, const std::string& where)
{
    return Sampled(texture, "uniform sampler2D u_texture;", "texture(u_texture, " + where + ")");
}

} // namespace

// ---- pixels -------------------------------------------------------------------------------------

TEST_P(PixelPairOnDriver, IsSampledAsItWasUploaded)
{
    const PixelPair& pair = GetParam();
    const bool isWide = pair.storage != Storage::Byte && pair.storage != Storage::Short;
    if (DriverIs({"swiftshader"}) && isWide && pair.layout != 4)
        GTEST_SKIP() << "this driver compares what is sampled of other textures than depth, too";
    if (DriverIs({"swiftshader"}) && pair.memoryLayout == 12)
        GTEST_SKIP() << "this driver updates no texture of an unsized depth format";
    OnThread(
        [&]
        {
            const TextureBufferInfo info{kSkipPixels, kSkipRows, kRowLength};
            const auto part = Memory(pair, kRowLength, kSkipPixels, kSkipRows, kRows, 0);
            const auto texture = MadeTexture(
                Described(kWidth, kHeight, pair.layout, pair.memoryLayout), part.data(), &info);
            ExpectSampled(pair, *texture, 0, "creation with skips");

            const auto wide = Memory(pair, kRowLength, 0, 0, kHeight, 1);
            texture->Update(wide.data(), kRowLength);
            ExpectSampled(pair, *texture, 1, "update with a row length");

            const auto tight = Memory(pair, kWidth, 0, 0, kHeight, 2);
            texture->Update(tight.data(), 0);
            ExpectSampled(pair, *texture, 2, "update");

            texture->SetData(wide.data(), kRowLength);
            ExpectSampled(pair, *texture, 1, "new data with a row length");

            texture->SetData(tight.data(), 0);
            ExpectSampled(pair, *texture, 2, "new data");
        });
}

INSTANTIATE_TEST_SUITE_P(Every, PixelPairOnDriver, testing::ValuesIn(kPairs),
                         [](const auto& row) { return row.param.name; });

TEST_F(TextureOnDriver, RectangleIsTakenFromItsCornerAndLandsAtItsThirdField)
{
    OnThread(
        [&]
        {
            const auto texture = MadeTexture(Described(8, 8), std::vector<Rgba>(64, kWhite).data());
            std::vector<Rgba> picture(64, kRed);
            picture[2 * 8 + 1] = kGreen; // the rectangle's first pixel
            picture[3 * 8 + 2] = kBlue;  // and its last
            texture->Update(Rect(1, 2, 3, 4), picture.data(), 8);

            const auto target = Owned<IOffscreenRenderTarget>(
                RendererFactory::CreateOffscreenRenderTarget(texture.get()));
            std::vector<Rgba> pixels(64);
            IRenderTarget::BufferDescriptor buffer;
            buffer.pixels = pixels.data();
            target->ReadPixels(0, 0, 8, 8, buffer);
            std::vector<Rgba> expected(64, kWhite);
            expected[3 * 8 + 1] = kGreen;
            expected[3 * 8 + 2] = kRed;
            expected[4 * 8 + 1] = kRed;
            expected[4 * 8 + 2] = kBlue;
            EXPECT_EQ(pixels, expected);
        });
}

TEST_F(TextureOnDriver, CopiesTheFramebuffer)
{
    OnThread(
        [&]
        {
            Page page(4, 4);
            page.Target().ClearColor(0, 1, 0, 1);
            const auto copy = MadeTexture(Described(4, 4));
            copy->CopyFromFramebuffer();
            page.Target().ClearColor(1, 0, 0, 1);
            EXPECT_TRUE(Near(SampledAt(*copy, "vec2(0.5)"), kGreen));
        });
}

// ---- parameters ---------------------------------------------------------------------------------

TEST_F(TextureOnDriver, FiltersAndWrapsAreThoseThatWereSet)
{
    OnThread(
        [&]
        {
            const Rgba pixels[] = {kRed, kGreen};
            const auto texture = MadeTexture(Described(2, 1), pixels, nullptr, {});
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(0.5)"), {128, 128, 0, 255}));
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(1.25, 0.5)"), kGreen)) << "clamped";
            texture->SetParam(kTextureParamMagFilter, kTextureFilterNearest);
            texture->SetParam(kTextureParamMinFilter, kTextureFilterNearest);
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(0.49, 0.5)"), kRed));
            texture->SetParam(kTextureParamWrapS, kTextureWrapRepeat);
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(1.25, 0.5)"), kRed));
            texture->SetParam(kTextureParamWrapS, kTextureWrapMirroredRepeat);
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(1.25, 0.5)"), kGreen));
        });
}

TEST_F(TextureOnDriver, FourUnitsAtOnce)
{
    OnThread(
        [&]
        {
            std::vector<Owned<ITextureObject>> textures;
            for (const Rgba& pixel : {kRed, kGreen, kBlue, kWhite})
                textures.push_back(MadeTexture(Described(1, 1), &pixel));
            Page page(1, 1);
            Cover cover("uniform sampler2D a, b, c, d; void main() {"
                        " color = vec4(texture(a, vec2(0)).r, texture(b, vec2(0)).g,"
                        " texture(c, vec2(0)).b, texture(d, vec2(0)).r * 0.5); }");
            int unit = 0;
            for (const char* name : {"a", "b", "c", "d"})
                cover.SetSampler(name, unit++);
            for (int i = 0; i < 4; ++i)
                textures[static_cast<std::size_t>(i)]->Activate(i);
            cover.Draw();
            EXPECT_TRUE(Near(page.At(0, 0), {255, 255, 255, 128}));
        });
}

// ---- other targets ------------------------------------------------------------------------------

TEST_F(TextureOnDriver, LayersOfAnArray)
{
    OnThread(
        [&]
        {
            const Rgba pixels[] = {kRed, kGreen, kBlue};
            TextureDescriptor described = Described(1, 1);
            described.target = kTextureTarget2DArray;
            described.depth = 3;
            const auto texture = MadeTexture(described, pixels);
            const std::string declaration = "uniform highp sampler2DArray u_texture;";
            EXPECT_TRUE(Near(
                Sampled(*texture, declaration, "texture(u_texture, vec3(0.5, 0.5, 0))"), kRed));
            EXPECT_TRUE(Near(
                Sampled(*texture, declaration, "texture(u_texture, vec3(0.5, 0.5, 2))"), kBlue));
        });
}

TEST_F(TextureOnDriver, VolumeAndItsNewData)
{
    OnThread(
        [&]
        {
            const Rgba pixels[] = {kRed, kGreen};
            TextureDescriptor described = Described(1, 1);
            described.target = kTextureTarget3D;
            described.depth = 2;
            const auto texture = MadeTexture(described, pixels);
            const std::string declaration = "uniform highp sampler3D u_texture;";
            EXPECT_TRUE(
                Near(Sampled(*texture, declaration, "texture(u_texture, vec3(0.5, 0.5, 0.75))"),
                     kGreen));
            const Rgba other[] = {kWhite, kBlue};
            texture->SetData(other, 0);
            EXPECT_TRUE(Near(
                Sampled(*texture, declaration, "texture(u_texture, vec3(0.5, 0.5, 0.75))"), kBlue));
        });
}

TEST_F(TextureOnDriver, CubeMapHasTheSamePictureOnEachFaceAndKeepsIt)
{
    OnThread(
        [&]
        {
            TextureDescriptor described = Described(1, 1);
            described.target = kTextureTargetCubeMap;
            const auto texture = MadeTexture(described, &kGreen);
            texture->SetData(&kRed, 0); // without effect
            for (const char* direction :
                 {"1, 0, 0", "-1, 0, 0", "0, 1, 0", "0, -1, 0", "0, 0, 1", "0, 0, -1"})
                EXPECT_TRUE(
                    Near(Sampled(*texture, "uniform highp samplerCube u_texture;",
                                 std::string("texture(u_texture, vec3(") + direction + "))"),
                         kGreen))
                    << direction;
        });
}

// ---- aliases and other threads ------------------------------------------------------------------

TEST_F(TextureOnDriver, TextureOfTheParentIsDrawnThroughAnAlias)
{
    const std::vector<Rgba> pixels = Checkered(512, 512, kRed, kRed);
    for (int round = 0; round < 20; ++round)
    {
        Owned<ITextureObject> texture;
        OnParent(
            [&]
            {
                TextureDescriptor fenced = Described(512, 512);
                fenced.syncOnCreate = true;
                texture = MadeTexture(fenced, pixels.data());
            });
        OnThread(
            [&]
            {
                const auto alias = MadeTexture(TextureDescriptor(texture.get()));
                EXPECT_TRUE(Near(SampledAt(*alias, "vec2(0.5)"), kRed));
            });
        OnParent(
            [&]
            {
                texture->Activate(0);
                texture.reset();
            });
    }
}

// ---- the loss of the context --------------------------------------------------------------------

TEST_F(TextureOnDriver, ComesBackEmptyWithItsSizeAndParameters)
{
    Owned<ITextureObject> texture;
    const Rgba pixels[] = {kRed, kGreen};
    OnThread(
        [&]
        {
            texture = MadeTexture(Described(2, 1), pixels, nullptr, {4, 0, 5, 0});
            texture->SetParam(kTextureParamWrapS, kTextureWrapRepeat);
        });
    LoseContext();
    OnThread(
        [&]
        {
            EXPECT_EQ(texture->GetWidth(), 2);
            SampledAt(*texture, "vec2(0.25, 0.5)"); // usable, whatever it holds
            texture->Update(pixels, 0);
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(0.49, 0.5)"), kRed)) << "not filtered";
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(1.25, 0.5)"), kRed)) << "repeated";
            texture.reset();
        });
}

TEST_F(TextureOnDriver, TakesANewSize)
{
    OnThread(
        [&]
        {
            const auto texture = MadeTexture(Described(2, 2));
            texture->SetDescriptor(Described(64, 32));
            const std::vector<Rgba> pixels(64 * 32, kBlue);
            texture->Update(pixels.data(), 0);
            EXPECT_TRUE(Near(SampledAt(*texture, "vec2(0.99)"), kBlue));
        });
}

TEST_F(TextureOnDriver, LargestSizeWorksAndOneMoreIsRefused)
{
    OnThread(
        [&]
        {
            const int largest = OpenGLRenderer::getMaxTextureSize();
            EXPECT_NO_THROW(MadeTexture(Described(largest, 1)));
            EXPECT_THROW(MadeTexture(Described(largest + 1, 1)), std::logic_error);
        });
}
