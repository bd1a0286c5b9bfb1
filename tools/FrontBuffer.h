#ifndef NIB_TOOLS_FRONT_BUFFER_H
#define NIB_TOOLS_FRONT_BUFFER_H

#include <nib/nib.h>

#include <memory>
#include <string>

/// Why the device cannot have a front-buffer render thread; empty where it can.
std::string FrontBufferObstacle();

/// A front-buffer render thread beside @p parent, not started; null, after one line on standard
/// error that says why, where the device cannot have one.
std::unique_ptr<Nib::RenderThreadGL> FrontBufferThread(Nib::RenderThreadGL& parent);

#endif
