#ifndef NIB_TOOLS_RENDER_THREADS_H
#define NIB_TOOLS_RENDER_THREADS_H

#include <nib/nib.h>

#include <memory>
#include <string>

/// Throws UserError when there is no driver to draw with.
void CheckEgl();

/// A started render thread for a window, or for drawing without one. Throws UserError.
std::unique_ptr<Nib::RenderThreadGL> StartSurfaceThread();

/// Throws UserError unless @p failure, as a session tells it, is empty.
void CheckDrawn(const std::string& failure);

#endif
