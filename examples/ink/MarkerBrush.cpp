#include "MarkerBrush.h"

namespace Ink
{
namespace
{

constexpr Colour kUncovered{0.0f, 0.0f, 0.0f, 0.0f};
constexpr Colour kCovered{1.0f, 1.0f, 1.0f, 1.0f};

Nib::BlendStateDescriptor Greatest()
{
    using Nib::BlendingFactor;
    using Nib::BlendingFunction;
    Nib::BlendStateDescriptor greatest(true);
    greatest.SetColorBlendingMode(BlendingFunction::Max, BlendingFactor::One, BlendingFactor::One);
    greatest.SetAlphaBlendingMode(BlendingFunction::Max, BlendingFactor::One, BlendingFactor::One);
    return greatest;
}

/// Limits drawing to an area of a page while it lives.
class Scissor
{
public:
    explicit Scissor(const PixelRect& area)
    {
        m_rasterizer->SetScissorRect({area.left, area.top, area.Width(), area.Height()});
        m_rasterizer->SetScissorEnabled(true);
    }
    ~Scissor() { m_rasterizer->SetScissorEnabled(false); }
    Scissor(const Scissor&) = delete;
    Scissor& operator=(const Scissor&) = delete;

private:
    Nib::IRasterizerState* m_rasterizer = Nib::RendererFactory::GetRasterizerState();
};

} // namespace

MarkerBrush::MarkerBrush(int width, int height)
    : m_below(width, height, kUncovered, "marker below"),
      m_coverage(width, height, kUncovered, "marker coverage"),
      m_greatest(Nib::RendererFactory::CreateBlendStateObject(Greatest()))
{
}

void MarkerBrush::Paint(const InkPiece& piece, Page& page)
{
    if (piece.startsStroke)
        m_reach = PixelRect();
    const PixelRect area = PixelsIn(piece.Bounds(), page.Width(), page.Height());
    if (area.IsEmpty())
        return;
    GrowTo(area, page);
    Cover(piece);
    m_coat.Lay({area}, m_below, m_coverage, CoatOf(piece.style), page);
}

/// Looks after @p area, too: the stroke has not touched what is new, so the page still shows what
/// lies below.
void MarkerBrush::GrowTo(const PixelRect& area, Page& page)
{
    const PixelRect reach = Union(m_reach, area);
    const std::vector<PixelRect> added = Around(m_reach, reach);
    m_reach = reach;
    m_coat.Copy(added, page, m_below);
    for (const PixelRect& strip : added)
    {
        const Scissor scissor(strip);
        m_coverage.Clear();
    }
}

void MarkerBrush::Cover(const InkPiece& piece)
{
    m_coverage.Begin();
    m_greatest->Activate();
    m_band.Draw(piece.band, kCovered, m_coverage.Width(), m_coverage.Height());
    m_coverage.End();
}

void MarkerBrush::Suspend()
{
    m_below.Suspend();
    m_coverage.Suspend();
    m_band.Suspend();
}

void MarkerBrush::Resume()
{
    m_below.Resume();
    m_coverage.Resume();
    m_band.Resume();
    m_coat.Resume();
}

} // namespace Ink
