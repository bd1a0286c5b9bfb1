#ifndef INK_INK_SESSION_H
#define INK_INK_SESSION_H

#include "InkPiece.h"
#include "Page.h"
#include "PageView.h"

#include <nib/nib.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace Ink
{

/// A page on a render thread, as an application drives it: every operation may be called from the
/// application's thread and posts its GL work to the render thread.
///
/// Owner    the caller, who keeps @p thread started until after the session's end.
/// Failure  what goes wrong on the render thread is kept; Error() gives the first of it.
class InkSession
{
public:
    InkSession(Nib::RenderThreadGL& thread, int width, int height, const Colour& paper);
    ~InkSession(); ///< [blocks] ends the GL objects on their thread

    InkSession(const InkSession&) = delete;
    InkSession& operator=(const InkSession&) = delete;

    /// Shows the page in @p window, which has the page's size. [blocks]
    void AttachWindow(void* window);

    /// Paints a piece of a stroke onto the page; it is not shown yet. Never blocks.
    void Draw(InkPiece piece);

    /// Shows what changed since the last frame. [blocks] until the frame is presented.
    void Present();

    /// Has the render thread lose its context and get a new one, as an application does that goes
    /// into the background: everything on the page is kept. Only on threads that can be paused
    /// (offscreen ones with a parent). [blocks]
    void LoseContext();

    /// The page as it is now: RGBA, premultiplied, top row first. [blocks]
    std::vector<std::uint8_t> ReadPixels();

    /// [blocks] The first failure on the render thread, or an empty text.
    std::string Error();

private:
    struct GlState;
    template <typename Work>
    void PostGuarded(Work work);

    Nib::RenderThreadGL& m_thread;
    int m_width;
    int m_height;
    std::shared_ptr<GlState> m_gl; // its contents are touched on the render thread alone
    Nib::RectF m_dirty;            // page pixels, y downward; what changed since the last frame
};

} // namespace Ink

#endif
