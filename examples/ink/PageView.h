#ifndef INK_PAGE_VIEW_H
#define INK_PAGE_VIEW_H

#include "PostTask.h"
#include "Program.h"

#include <nib/nib.h>

namespace Ink
{

/// Shows a page in the window of the render thread, one page pixel on one window pixel, the page's
/// top left corner in the window's. Made, used and destroyed on the render thread, in tasks.
class PageView
{
public:
    /// The window is @p width x @p height pixels.
    PageView(int width, int height);

    /// Draws the page into the window's back buffer: all of it, or @p dirty (window pixels, y
    /// downward) alone where the back buffer still holds the last frame.
    void Draw(Nib::ITextureObject& page, const Nib::RectF& dirty);

private:
    bool BackBufferIsKept() const;
    void LimitTo(const Nib::RectF& dirty) const;

    int m_height;
    bool m_isFirst = true;
    Program m_program;
    Owned<Nib::IRenderTarget> m_window;
    Owned<Nib::IParameterBinding> m_pageUnit;
    Owned<Nib::IGraphicsObject> m_quad;
    Owned<Nib::IBlendStateObject> m_blending;
};

} // namespace Ink

#endif
