// What must be redrawn when back buffers come back stale: the last frames' dirty rectangles too.

#include <nib/partial_update.h>

#include <cstdio>
#include <EGL/egl.h>

namespace
{

// [kept]
/// Whether the window's back buffer still holds the last frame (mode 0x09). In a task.
bool IsBackBufferKept()
{
    EGLint behaviour = EGL_BUFFER_DESTROYED;
    eglQuerySurface(eglGetCurrentDisplay(), eglGetCurrentSurface(EGL_DRAW), EGL_SWAP_BEHAVIOR,
                    &behaviour);
    return behaviour == EGL_BUFFER_PRESERVED;
}

/// What a frame draws in a window of a surface render thread; @p dirty is what it changes.
Nib::RectF AreaToDraw(const Nib::RectF& dirty, const Nib::RectF& window)
{
    return IsBackBufferKept() ? dirty : window;
}
// [kept]

} // namespace

int main()
{
    using namespace Nib;
    const RectF window(0, 0, 1080, 1920);
    // [history]
    ClipRect history(3); // three buffers in turn: each lacks the two frames after its own
    history.Init(1080, 1920);

    // Nothing is known about the buffers at first, so three frames redraw everything.
    const RectF dirty(100, 200, 300, 260);
    RectF area;
    for (int frame = 0; frame < 3; ++frame)
        area = history.AddUpdateRect(&dirty);
    const bool wasWhole = area == window;

    // From then on it is the union of what the last frames changed.
    const RectF next(400, 200, 500, 230);
    area = history.AddUpdateRect(&next);
    std::printf("redraw %g,%g to %g,%g\n", area.left, area.top, area.right, area.bottom);
    // [history]
    const bool isWhole = AreaToDraw(next, window) == window; // there is no window here
    return wasWhole && isWhole && area == RectF(100, 200, 500, 260) ? 0 : 1;
}
