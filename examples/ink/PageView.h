#ifndef INK_PAGE_VIEW_H
#define INK_PAGE_VIEW_H

#include "Page.h"
#include "PostTask.h"
#include "Program.h"

#include <nib/nib.h>

#include <cstdint>
#include <memory>
#include <vector>

namespace Ink
{

/// Shows a page in the window of the render thread, one page pixel on one window pixel, the page's
/// top left corner in the window's; or on an offscreen screen, which stands for a window where
/// there is none. Made, used and destroyed on the render thread, in tasks.
class PageView
{
public:
    enum class Surface
    {
        Window,
        Screen
    };

    /// The window, or the screen, is @p width x @p height pixels.
    PageView(int width, int height, Surface surface);

    /// Draws the page into the window's back buffer: all of it, or @p dirty (window pixels, y
    /// downward) alone where the back buffer still holds the last frame. On a screen, [blocks]
    /// until it is drawn, as presenting to a window does.
    void Draw(Nib::ITextureObject& page, const Nib::RectF& dirty);

    /// How many pixels all calls of Draw have drawn together.
    long long RedrawnPixels() const { return m_redrawnPixels; }

    /// What the screen shows, as Page::ReadPixels gives it. Empty for a window.
    std::vector<std::uint8_t> ReadScreen();

    /// Before the context is lost, and with the new one.
    void Suspend();
    void Resume();

private:
    bool BackBufferIsKept() const;
    void LimitTo(const Nib::RectF& dirty) const;
    long long PixelsWithinScissor() const;

    int m_width;
    int m_height;
    bool m_isFirst = true;
    long long m_redrawnPixels = 0;
    Program m_program;
    Owned<Nib::IParameterBinding> m_pageUnit;
    Owned<Nib::IRenderTarget> m_window;
    std::unique_ptr<Page> m_screen; ///< null for a window
    Owned<Nib::IGraphicsObject> m_quad;
    Owned<Nib::IBlendStateObject> m_blending;
};

} // namespace Ink

#endif
