#include "Page.h"

namespace Ink
{

Page::Page(int width, int height, const Colour& paper) : m_paper(paper)
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
        Nib::RendererFactory::CreateTextureObject(descriptor, nullptr, nearest, 2, nullptr),
        "page");
    m_target.reset(Nib::RendererFactory::CreateOffscreenRenderTarget(&*m_texture));
    Clear();
}

void Page::Clear()
{
    m_target->ClearColor(m_paper.red * m_paper.alpha, m_paper.green * m_paper.alpha,
                         m_paper.blue * m_paper.alpha, m_paper.alpha);
}

std::vector<std::uint8_t> Page::Suspend()
{
    std::vector<std::uint8_t> pixels = ReadPixels();
    m_target.reset();
    m_texture.Forget();
    return pixels;
}

void Page::Resume(const std::vector<std::uint8_t>& pixels)
{
    m_texture.Remember();
    m_texture->Update(pixels.data(), 0);
    m_target.reset(Nib::RendererFactory::CreateOffscreenRenderTarget(&*m_texture));
}

void Page::Draw(InkPainter& painter, const std::vector<Vertex>& triangles, const Colour& colour)
{
    m_target->Activate();
    painter.Draw(triangles, colour, Width(), Height());
    m_target->Deactivate(true, true);
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
