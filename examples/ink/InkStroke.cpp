#include "InkStroke.h"

#include <utility>

namespace Ink
{

InkStroke::InkStroke(const BrushStyle& style)
{
    m_piece.style = style;
    m_piece.startsStroke = true;
}

void InkStroke::Add(const PenPoint& point)
{
    if (m_piece.style.kind == BrushKind::Stamp)
        m_trail.Add(point, m_piece.dabs);
    else
        m_mesh.Add(point, m_piece.band);
}

void InkStroke::End()
{
    if (m_piece.style.kind == BrushKind::Stamp)
        m_trail.End(m_piece.dabs);
    else
        m_mesh.End(m_piece.band);
}

InkPiece InkStroke::Take()
{
    InkPiece rest;
    rest.style = m_piece.style;
    rest.startsStroke = m_piece.startsStroke && m_piece.IsEmpty(); // the ink has yet to start
    return std::exchange(m_piece, std::move(rest));
}

} // namespace Ink
