#include "InkPainter.h"

#include "MarkerBrush.h"
#include "PenBrush.h"
#include "StampBrush.h"

namespace Ink
{
namespace
{

std::unique_ptr<Brush> MakeBrush(BrushKind kind, const Page& page)
{
    switch (kind)
    {
    case BrushKind::Pen: return std::make_unique<PenBrush>();
    case BrushKind::Marker: return std::make_unique<MarkerBrush>(page.Width(), page.Height());
    case BrushKind::Stamp: return std::make_unique<StampBrush>();
    }
    return nullptr;
}

/// Whose way of painting a style needs: a translucent pen lays one coat, as a marker does, so that
/// its joins do not show.
BrushKind PainterOf(const BrushStyle& style)
{
    const bool isTranslucentPen = style.kind == BrushKind::Pen && style.colour.alpha < 1.0f;
    return isTranslucentPen ? BrushKind::Marker : style.kind;
}

} // namespace

void InkPainter::Paint(const InkPiece& piece, Page& page)
{
    const BrushKind kind = PainterOf(piece.style);
    std::unique_ptr<Brush>& brush = m_brushes[kind];
    if (!brush)
        brush = MakeBrush(kind, page);
    brush->Paint(piece, page);
}

void InkPainter::Suspend()
{
    for (const auto& [kind, brush] : m_brushes)
        brush->Suspend();
}

void InkPainter::Resume()
{
    for (const auto& [kind, brush] : m_brushes)
        brush->Resume();
}

} // namespace Ink
