#ifndef INK_COAT_PAINTER_H
#define INK_COAT_PAINTER_H

#include "Colour.h"
#include "Page.h"
#include "PixelRect.h"
#include "PostTask.h"
#include "Program.h"

#include <nib/nib.h>

#include <vector>

namespace Ink
{

/// Lays one coat of a colour over a page, into another page of the same size: every pixel is worked
/// out from the page below and from how far the coat covers it, so that laying it again changes
/// nothing. Made, used and destroyed on the render thread, in tasks; nothing is lost with the
/// context.
class CoatPainter
{
public:
    CoatPainter();

    /// Fills @p areas of @p target with what @p below holds under a coat of @p colour where
    /// @p coverage has alpha. @p target is neither of the other two.
    void Lay(const std::vector<PixelRect>& areas, Page& below, Page& coverage, const Colour& colour,
             Page& target);

    /// Brings @p areas of @p source onto @p target as they are.
    void Copy(const std::vector<PixelRect>& areas, Page& source, Page& target);

    /// With a new context.
    void Resume() { m_program.CountRestore(); }

private:
    Program m_program;
    Owned<Nib::IParameterBinding> m_pageSize;
    Owned<Nib::IParameterBinding> m_colour;
    Owned<Nib::IParameterBinding> m_belowUnit;
    Owned<Nib::IParameterBinding> m_coverageUnit;
    Owned<Nib::IGraphicsObject> m_mesh;
    Owned<Nib::IBlendStateObject> m_replacing;
};

} // namespace Ink

#endif
