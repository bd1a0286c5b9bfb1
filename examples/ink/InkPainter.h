#ifndef INK_INK_PAINTER_H
#define INK_INK_PAINTER_H

#include "Brush.h"

#include <map>
#include <memory>

namespace Ink
{

/// Paints pieces of strokes, each with the brush that its style asks for; a brush is made when it
/// is first asked for. Made, used and destroyed on the render thread, in tasks.
class InkPainter
{
public:
    /// Throws Nib::InvalidArgumentException when the driver refuses the brush's program. Pages are
    /// all of one size.
    void Paint(const InkPiece& piece, Page& page);

    /// Before the context is lost, and with the new one.
    void Suspend();
    void Resume();

private:
    std::map<BrushKind, std::unique_ptr<Brush>> m_brushes;
};

} // namespace Ink

#endif
