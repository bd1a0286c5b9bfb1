#include "Page.h"

#include <array>

namespace Ink
{

Page::Page(int width, int height, const Colour& paper, const char* tag) : m_paper(paper)
{
    Nib::TextureDescriptor descriptor;
    descriptor.width = width;
    descriptor.height = height;
    const unsigned int nearest[] = {
        Nib::kTextureParamMagFilter,
        Nib::kTextureFilterNearest, // shown pixel by pixel
        Nib::kTextureParamMinFilter,
        Nib::kTextureFilterNearest,
    };
    m_texture.Reset(
        Nib::RendererFactory::CreateTextureObject(descriptor, nullptr, nearest, 2, nullptr), tag);
    m_target.reset(Nib::RendererFactory::CreateOffscreenRenderTarget(&*m_texture));
    Clear();
}

void Page::Clear()
{
    const std::array<float, 4> paper = Premultiplied(m_paper);
    m_target->ClearColor(paper[0], paper[1], paper[2], paper[3]);
}

void Page::Suspend()
{
    m_suspended = ReadPixels();
    m_target.reset();
    m_texture.Forget();
}

void Page::Resume()
{
    m_texture.Remember();
    m_texture->Update(m_suspended.data(), 0);
    m_suspended = {};
    m_target.reset(Nib::RendererFactory::CreateOffscreenRenderTarget(&*m_texture));
}

std::vector<std::uint8_t> Page::ReadPixels()
{
    const auto pixelCount = static_cast<std::size_t>(Width()) * static_cast<std::size_t>(Height());
    std::vector<std::uint8_t> pixels(pixelCount * 4);
    Nib::IRenderTarget::BufferDescriptor buffer;
    buffer.pixels = pixels.data();
    m_target->ReadPixels(0, 0, Width(), Height(), buffer);
    return pixels;
}

} // namespace Ink
