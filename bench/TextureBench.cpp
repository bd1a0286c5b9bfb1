// What textures cost through the library beside the same GL calls written out: their making and
// ending, uploads, activations. Read each row as a ratio to the Gl row before it of the same run.

#include "BenchThread.h"

#include <nib/device.h>
#include <nib/render_target.h>
#include <nib/texture.h>

#include <GLES3/gl3.h>

#include <cstdint>
#include <vector>

using namespace Nib;

namespace
{

using Pixels = std::vector<std::uint32_t>;

Pixels PixelsOf(std::int64_t side)
{
    return Pixels(static_cast<std::size_t>(side * side), 0x80FF4020u);
}

Owned<ITextureObject> Texture(std::int64_t side, const Pixels& pixels)
{
    TextureDescriptor described;
    described.width = described.height = static_cast<int>(side);
    return Owned<ITextureObject>(
        RendererFactory::CreateTextureObject(described, pixels.data(), nullptr, 0, nullptr));
}

/// A GL texture and its sampler, with the parameters that the library gives an RGBA8 texture.
class GlTexture
{
public:
    GlTexture(std::int64_t side, const Pixels& pixels) : m_side(static_cast<GLsizei>(side))
    {
        glGenTextures(1, &m_texture);
        glGenSamplers(1, &m_sampler);
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glPixelStorei(GL_UNPACK_ALIGNMENT, 1);
        glSamplerParameteri(m_sampler, GL_TEXTURE_WRAP_S, GL_CLAMP_TO_EDGE);
        glSamplerParameteri(m_sampler, GL_TEXTURE_WRAP_T, GL_CLAMP_TO_EDGE);
        glSamplerParameteri(m_sampler, GL_TEXTURE_MAG_FILTER, GL_LINEAR);
        glSamplerParameteri(m_sampler, GL_TEXTURE_MIN_FILTER, GL_LINEAR);
        glSamplerParameteri(m_sampler, GL_TEXTURE_MIN_LOD, 0);
        glSamplerParameteri(m_sampler, GL_TEXTURE_MAX_LOD, 0);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, m_side, m_side, 0, GL_RGBA, GL_UNSIGNED_BYTE,
                     pixels.data());
        glPixelStorei(GL_UNPACK_ROW_LENGTH, 0);
        glPixelStorei(GL_UNPACK_SKIP_PIXELS, 0);
        glPixelStorei(GL_UNPACK_SKIP_ROWS, 0);
        benchmark::DoNotOptimize(glGetError());
        glBindTexture(GL_TEXTURE_2D, 0);
    }
    ~GlTexture()
    {
        glDeleteTextures(1, &m_texture);
        glDeleteSamplers(1, &m_sampler);
    }
    GlTexture(const GlTexture&) = delete;
    GlTexture& operator=(const GlTexture&) = delete;

    void Activate(GLuint unit) const
    {
        glActiveTexture(GL_TEXTURE0 + unit);
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glBindSampler(unit, m_sampler);
    }

    void Update(const Pixels& pixels) const
    {
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glPixelStorei(GL_UNPACK_SKIP_PIXELS, 0);
        glPixelStorei(GL_UNPACK_SKIP_ROWS, 0);
        glTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, m_side, m_side, GL_RGBA, GL_UNSIGNED_BYTE,
                        pixels.data());
    }

    void SetData(const Pixels& pixels) const
    {
        GLint previous = 0;
        glGetIntegerv(GL_TEXTURE_BINDING_2D, &previous);
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, m_side, m_side, 0, GL_RGBA, GL_UNSIGNED_BYTE,
                     pixels.data());
        glBindTexture(GL_TEXTURE_2D, static_cast<GLuint>(previous));
    }

private:
    const GLsizei m_side;
    GLuint m_texture = 0;
    GLuint m_sampler = 0;
};

void CountBytes(benchmark::State& state)
{
    state.SetBytesProcessed(state.iterations() * state.range(0) * state.range(0) * 4);
}

// ---- making and ending --------------------------------------------------------------------------

void BM_GlMakeTexture(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    for (auto _ : state)
        const GlTexture texture(state.range(0), pixels);
    CountBytes(state);
}
BENCHMARK(BM_GlMakeTexture)->Arg(4)->Arg(256)->Arg(1024);

// Besides: the subscription, two INFO lines, the descriptor's copies.
void BM_MakeTexture(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    for (auto _ : state)
        const Owned<ITextureObject> texture = Texture(state.range(0), pixels);
    CountBytes(state);
}
BENCHMARK(BM_MakeTexture)->Arg(4)->Arg(256)->Arg(1024);

// No GL call at all; beside BM_MakeTexture.
void BM_MakeAlias(benchmark::State& state)
{
    const Owned<ITextureObject> source = Texture(4, PixelsOf(4));
    const TextureDescriptor described(source.get());
    for (auto _ : state)
        RendererFactory::CreateTextureObject(described, nullptr, nullptr, 0, nullptr)->Release();
}
BENCHMARK(BM_MakeAlias);

// ---- uploads ------------------------------------------------------------------------------------

void BM_GlUpdateTexture(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    const GlTexture texture(state.range(0), pixels);
    for (auto _ : state)
        texture.Update(pixels);
    CountBytes(state);
}
BENCHMARK(BM_GlUpdateTexture)->Arg(64)->Arg(256)->Arg(1024);

void BM_UpdateTexture(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    const Owned<ITextureObject> texture = Texture(state.range(0), pixels);
    for (auto _ : state)
        texture->Update(pixels.data(), 0);
    CountBytes(state);
}
BENCHMARK(BM_UpdateTexture)->Arg(64)->Arg(256)->Arg(1024);

// With a row length, which asks the driver for the old one; beside BM_UpdateTexture.
void BM_UpdateTextureWithRowLength(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    const Owned<ITextureObject> texture = Texture(state.range(0), pixels);
    for (auto _ : state)
        texture->Update(pixels.data(), static_cast<int>(state.range(0)));
    CountBytes(state);
}
BENCHMARK(BM_UpdateTextureWithRowLength)->Arg(64)->Arg(256)->Arg(1024);

void BM_GlSetData(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    const GlTexture texture(state.range(0), pixels);
    for (auto _ : state)
        texture.SetData(pixels);
    CountBytes(state);
}
BENCHMARK(BM_GlSetData)->Arg(64)->Arg(1024);

void BM_SetData(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(state.range(0));
    const Owned<ITextureObject> texture = Texture(state.range(0), pixels);
    for (auto _ : state)
        texture->SetData(pixels.data(), 0);
    CountBytes(state);
}
BENCHMARK(BM_SetData)->Arg(64)->Arg(1024);

// ---- reading back -------------------------------------------------------------------------------

/// A texture that is drawn into and read from.
class Page
{
public:
    explicit Page(std::int64_t side)
        : m_texture(Texture(side, PixelsOf(side))),
          m_target(RendererFactory::CreateOffscreenRenderTarget(m_texture.get()))
    {
        m_target->Activate();
    }

private:
    Owned<ITextureObject> m_texture;
    Owned<IOffscreenRenderTarget> m_target;
};

void BM_GlReadPixels(benchmark::State& state)
{
    const Page page(state.range(0));
    Pixels pixels = PixelsOf(state.range(0));
    const auto side = static_cast<GLsizei>(state.range(0));
    for (auto _ : state)
        glReadPixels(0, 0, side, side, GL_RGBA, GL_UNSIGNED_BYTE, pixels.data());
    CountBytes(state);
}
BENCHMARK(BM_GlReadPixels)->Arg(64)->Arg(1024);

void BM_ReadPixels(benchmark::State& state)
{
    const Page page(state.range(0));
    Pixels pixels = PixelsOf(state.range(0));
    const int side = static_cast<int>(state.range(0));
    for (auto _ : state)
        OpenGLRenderer::readPixels(0, 0, side, side, pixels.data(), TextureTargetLayout::Rgba,
                                   TextureMemoryLayout::RGBA8);
    CountBytes(state);
}
BENCHMARK(BM_ReadPixels)->Arg(64)->Arg(1024);

// ---- activations --------------------------------------------------------------------------------

// Two textures in turn, so that no call is one that the driver may leave out.
void BM_GlActivateTexture(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(4);
    const GlTexture textures[] = {{4, pixels}, {4, pixels}};
    unsigned turn = 0;
    for (auto _ : state)
    {
        textures[turn % 2].Activate(turn / 2 % 4);
        ++turn;
    }
}
BENCHMARK(BM_GlActivateTexture);

void BM_ActivateTexture(benchmark::State& state)
{
    const Pixels pixels = PixelsOf(4);
    const Owned<ITextureObject> textures[] = {Texture(4, pixels), Texture(4, pixels)};
    unsigned turn = 0;
    for (auto _ : state)
    {
        textures[turn % 2]->Activate(static_cast<int>(turn / 2 % 4));
        ++turn;
    }
}
BENCHMARK(BM_ActivateTexture);

} // namespace

int main(int argc, char** argv)
{
    return RunBenchmarksOnRenderThread(argc, argv);
}
