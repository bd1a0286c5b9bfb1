#include "PenBrush.h"

namespace Ink
{

PenBrush::PenBrush()
    : m_over(Nib::RendererFactory::CreateBlendStateObject(Nib::BlendStateDescriptor(true)))
{
}

void PenBrush::Paint(const InkPiece& piece, Page& page)
{
    page.Begin();
    m_over->Activate();
    m_band.Draw(piece.band, CoatOf(piece.style), page.Width(), page.Height());
    page.End();
}

} // namespace Ink
