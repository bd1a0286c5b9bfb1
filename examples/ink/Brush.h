#ifndef INK_BRUSH_H
#define INK_BRUSH_H

#include "InkPiece.h"
#include "Page.h"

namespace Ink
{

/// Paints pieces of strokes onto a page. One class a way of painting: PenBrush, MarkerBrush,
/// StampBrush.
///
/// Threads  made, used and destroyed on the render thread, in tasks.
/// Frames   the page is the same however a stroke is cut into pieces, and whatever happens between
///          them.
class Brush
{
public:
    Brush() = default;
    Brush(const Brush&) = delete;
    Brush& operator=(const Brush&) = delete;
    virtual ~Brush() = default;

    virtual void Paint(const InkPiece& piece, Page& page) = 0;

    /// Before the context is lost, and with the new one: a stroke goes on as if nothing had been.
    virtual void Suspend() = 0;
    virtual void Resume() = 0;
};

} // namespace Ink

#endif
