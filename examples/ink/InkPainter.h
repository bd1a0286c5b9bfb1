#ifndef INK_INK_PAINTER_H
#define INK_INK_PAINTER_H

#include "PostTask.h"
#include "StrokeMesh.h"
#include "TrackedTexture.h"

#include <nib/nib.h>

#include <vector>

namespace Ink
{

/// A colour with straight (not premultiplied) alpha, each channel from 0 to 1.
struct Colour
{
    float red = 0.0f;
    float green = 0.0f;
    float blue = 0.0f;
    float alpha = 1.0f;
};

/// Draws triangles of ink into the render target that is current: a program with its bindings, a
/// mesh, a brush texture that holds the profile of an edge, and premultiplied-alpha blending.
///
/// Threads  made, used and destroyed on the render thread, in tasks.
/// Pause    the program, the mesh and the texture come back with the context, the latter two
///          empty: call RestoreContents() after a resume.
class InkPainter
{
public:
    /// Throws Nib::InvalidArgumentException when the driver refuses the program.
    InkPainter();

    /// Draws @p triangles, three vertices each, over what a page of @p width x @p height pixels
    /// holds already.
    void Draw(const std::vector<Vertex>& triangles, const Colour& colour, int width, int height);

    /// Before the context is lost.
    void ForgetContents();

    /// Uploads the brush again, with the new context.
    void RestoreContents();

private:
    Owned<Nib::IShaderProgram> m_program;
    Owned<Nib::IParameterBinding> m_pageSize;
    Owned<Nib::IParameterBinding> m_colour;
    Owned<Nib::IParameterBinding> m_brushUnit;
    Owned<Nib::IGraphicsObject> m_mesh;
    TrackedTexture m_brush;
    Owned<Nib::IBlendStateObject> m_blending;
};

} // namespace Ink

#endif
