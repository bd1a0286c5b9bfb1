#ifndef INK_PAGE_H
#define INK_PAGE_H

#include "Colour.h"
#include "PostTask.h"
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
    /// @p width and @p height in pixels; @p tag names the texture in the log. Throws
    /// std::logic_error when the device cannot make it.
    Page(int width, int height, const Colour& paper, const char* tag = "page");

    int Width() const { return m_texture->GetWidth(); }
    int Height() const { return m_texture->GetHeight(); }

    /// The texture that holds the page, for showing it.
    Nib::ITextureObject& Texture() { return *m_texture; }

    /// Fills the page with its paper: all of it, or what the scissor leaves.
    void Clear();

    /// From Begin to End, what is drawn comes onto the page.
    void Begin() { m_target->Activate(); }
    void End() { m_target->Deactivate(true, true); }

    /// Before the context is lost: keeps the pixels here and lets go of the render target, whose
    /// name dies with the context.
    void Suspend();

    /// With the new context: puts the pixels back onto the page.
    void Resume();

    /// The pixels, RGBA with premultiplied alpha, top row first.
    std::vector<std::uint8_t> ReadPixels();

private:
    Colour m_paper;
    TrackedTexture m_texture;
    Owned<Nib::IOffscreenRenderTarget> m_target; // before the texture, which it draws into, ends
    std::vector<std::uint8_t> m_suspended;       ///< the pixels, while there is no context
};

} // namespace Ink

#endif
