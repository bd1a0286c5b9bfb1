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

/// What a session has had done.
struct SessionFigures
{
    long long tasks = 0;         ///< that were given to the render thread
    long long redrawnPixels = 0; ///< of the window or the screen, in all frames together
};

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

    /// The window goes; the page stays. [blocks]
    void DetachWindow();

    /// Without a window, frames go to an offscreen screen of the page's size. Never blocks.
    void AttachScreen();

    /// Gives the page, which becomes blank, and the window, if there is one, another size. [blocks]
    void Resize(int width, int height);

    /// Takes all ink off the page. Never blocks.
    void Clear();

    /// The next frame shows the whole page again: the window has lost what it showed.
    void Invalidate();

    /// Paints a piece of a stroke onto the page; it is not shown yet. Never blocks.
    void Draw(InkPiece piece);

    /// Shows what changed since the last frame. [blocks] until the frame is presented.
    void Present();

    /// Has the render thread give up its context, as an application does that goes into the
    /// background: everything on the page is kept. Only on threads that can be paused: those with
    /// a parent, offscreen and front-buffer ones. Until Resume nothing is drawn. [blocks]
    void Pause();

    /// Has it go on where Pause found it, with a new context. [blocks]
    void Resume();

    /// Pause and Resume in one. [blocks]
    void LoseContext();

    /// The page as it is now: RGBA, premultiplied, top row first. [blocks]
    std::vector<std::uint8_t> ReadPixels();

    /// What the screen shows, as ReadPixels gives the page. Empty without a screen. [blocks]
    std::vector<std::uint8_t> ReadScreen();

    /// What the session has had done so far. [blocks]
    SessionFigures Figures();

    /// Until everything so far is drawn. [blocks]
    void Wait();

    /// [blocks] The first failure on the render thread, or an empty text.
    std::string Error();

private:
    struct GlState;
    template <typename Work>
    void PostGuarded(Work work);
    std::vector<std::uint8_t> ReadBack(std::vector<std::uint8_t> (*read)(GlState&));

    Nib::RenderThreadGL& m_thread;
    int m_width;
    int m_height;
    Colour m_paper;
    void* m_window = nullptr;
    std::shared_ptr<GlState> m_gl; // its contents are touched on the render thread alone
    long long m_tasks = 0;
    Nib::RectF m_dirty; // page pixels, y downward; what changed since the last frame
};

} // namespace Ink

#endif
