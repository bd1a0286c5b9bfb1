// What must be redrawn when back buffers come back stale: the last frames' dirty rectangles too.

#include <nib/partial_update.h>

#include <cstdio>

int main()
{
    using namespace Nib;
    ClipRect history(3); // three buffers in turn: each lacks the two frames after its own
    history.Init(1080, 1920);

    // Nothing is known about the buffers at first, so three frames redraw everything.
    const RectF dirty(100, 200, 300, 260);
    RectF area;
    for (int frame = 0; frame < 3; ++frame)
        area = history.AddUpdateRect(&dirty);
    const bool wasWhole = area.Width() == 1080 && area.Height() == 1920;

    // From then on it is the union of what the last frames changed.
    const RectF next(400, 200, 500, 230);
    area = history.AddUpdateRect(&next);
    std::printf("redraw %g,%g to %g,%g\n", area.left, area.top, area.right, area.bottom);
    return wasWhole && area == RectF(100, 200, 500, 260) ? 0 : 1;
}
