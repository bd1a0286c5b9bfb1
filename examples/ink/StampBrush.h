#ifndef INK_STAMP_BRUSH_H
#define INK_STAMP_BRUSH_H

#include "Brush.h"
#include "PostTask.h"
#include "Program.h"
#include "TrackedTexture.h"

#include <nib/nib.h>

namespace Ink
{

/// Presses a grain onto the page, dab by dab over what is there: one square, drawn once for each
/// dab, with the dabs as a second vertex buffer that advances with the instances.
class StampBrush : public Brush
{
public:
    StampBrush();

    void Paint(const InkPiece& piece, Page& page) override;
    void Suspend() override;
    void Resume() override;

private:
    Program m_program;
    Owned<Nib::IParameterBinding> m_pageSize;
    Owned<Nib::IParameterBinding> m_colour;
    Owned<Nib::IParameterBinding> m_grainUnit;
    Owned<Nib::IGraphicsObject> m_dabs;
    Owned<Nib::IBlendStateObject> m_over;
    TrackedTexture m_grain;
};

} // namespace Ink

#endif
