#ifndef INK_BAND_PAINTER_H
#define INK_BAND_PAINTER_H

#include "Colour.h"
#include "PostTask.h"
#include "Program.h"
#include "StrokeMesh.h"
#include "TrackedTexture.h"

#include <nib/nib.h>

#include <vector>

namespace Ink
{

/// Draws the triangles of a StrokeMesh into the render target that is current, with the blend state
/// that is current: a program with its bindings, a mesh, and a texture that holds the profile of an
/// edge.
///
/// Threads  made, used and destroyed on the render thread, in tasks.
/// Pause    the program, the mesh and the texture come back with the context, the latter two
///          empty: call Suspend before the loss and Resume after it.
class BandPainter
{
public:
    /// Throws Nib::InvalidArgumentException when the driver refuses the program.
    BandPainter();

    /// Draws @p triangles, three vertices each, onto a page of @p width x @p height pixels.
    void Draw(const std::vector<Vertex>& triangles, const Colour& colour, int width, int height);

    void Suspend();
    void Resume(); ///< uploads the edge again, with the new context

private:
    Program m_program;
    Owned<Nib::IParameterBinding> m_pageSize;
    Owned<Nib::IParameterBinding> m_colour;
    Owned<Nib::IParameterBinding> m_edgeUnit;
    Owned<Nib::IGraphicsObject> m_mesh;
    TrackedTexture m_edge;
};

} // namespace Ink

#endif
