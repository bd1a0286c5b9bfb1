#ifndef NIB_SIM_GL_H
#define NIB_SIM_GL_H

#include "SimEntry.h"

namespace Sim
{

/// What glEnable takes.
bool IsCapability(GLenum name);

VertexArray& CurrentVertexArray(GlState& gl);
const VertexArray& CurrentVertexArray(const GlState& gl);

/// Where the binding of a buffer target is kept; null for an unknown target.
GLuint* BufferBinding(GlState& gl, GLenum target);
/// The buffer bound to the target; null, with the error set, when there is none.
Buffer* BoundBuffer(GlEntry& entry, GLenum target);

/// The texture bound to the target of the active unit. The default textures, name 0, are not kept:
/// null, with the error set, for these and for unknown targets.
Texture* BoundTexture(GlEntry& entry, GLenum target);
/// GL_TEXTURE_CUBE_MAP for its faces, any other target unchanged; 0 when there is no such target.
GLenum BindTarget(GlEntry& entry, GLenum target);

/// The state of the framebuffer bound for drawing or reading: 0 for the window.
GLenum FramebufferStatus(GlEntry& entry, GLuint name);
/// Colour images that drawing goes to; empty, with the error set, when the framebuffer is not
/// complete.
std::vector<Image*> DrawImages(GlEntry& entry);
/// The colour image that is read from; null, with the error set, when there is none.
Image* ReadImage(GlEntry& entry);

/// Sets the error and answers false when @p count is negative.
bool CheckCount(GlEntry& entry, GLsizei count);

} // namespace Sim

#endif
