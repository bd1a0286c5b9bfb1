#ifndef INK_PAGE_H
#define INK_PAGE_H

#include "InkPainter.h"
#include "TrackedTexture.h"

#include <nib/nib.h>

#include <cstdint>
#include <vector>

namespace Ink
{

/// The sheet that ink is drawn on: an offscreen render target over a texture that can be shown.
/// Row 0 is the top. Made, used and destroyed on the render thread, in tasks.
class Page
{
public:
    /// @p width and @p height in pixels. Throws std::logic_error when the device cannot make it.
    Page(int width, int height, const Colour& paper);

    int Width() const { return m_texture->GetWidth(); }
    int Height() const { return m_texture->GetHeight(); }

    /// The texture that holds the page, for showing it.
    Nib::ITextureObject& Texture() { return *m_texture; }

    void Clear();

    /// Before the context is lost: gives the pixels out and lets go of the render target, whose
    /// name dies with the context.
    std::vector<std::uint8_t> Suspend();

    /// With the new context: puts @p pixels, as Suspend gave them, back onto the page.
    void Resume(const std::vector<std::uint8_t>& pixels);

    void Draw(InkPainter& painter, const std::vector<Vertex>& triangles, const Colour& colour);

    /// The pixels, RGBA with premultiplied alpha, top row first.
    std::vector<std::uint8_t> ReadPixels();

private:
    Colour m_paper;
    TrackedTexture m_texture;
    Owned<Nib::IOffscreenRenderTarget> m_target; // before the texture, which it draws into, ends
};

} // namespace Ink

#endif
