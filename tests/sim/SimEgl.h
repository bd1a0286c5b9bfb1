#ifndef NIB_SIM_EGL_H
#define NIB_SIM_EGL_H

#include "SimEntry.h"

namespace Sim
{

// Tokens that <EGL/eglext.h> of some systems lacks.
constexpr EGLint kMutableRenderBufferBit = 0x1000; // EGL_MUTABLE_RENDER_BUFFER_BIT_KHR
constexpr EGLint kFrontBufferAutoRefresh = 0x314C; // EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID

EGLDisplay TheDisplay();
EGLConfig ConfigHandle(int index);
/// -1 for a handle that is no configuration.
int ConfigIndex(EGLConfig handle, const SimGpu& gpu);

/// Takes a context that is destroyed and current nowhere out of the state.
void BuryContext(State& state, Context& context);
void BurySurface(State& state, Surface& surface);
/// Nothing is current on the thread afterwards.
void ReleaseCurrent(State& state, Thread& thread);
void DestroyAllContexts(State& state);
void DestroyAllSurfaces(State& state);

/// What a swap, a sub-buffer post or a refresh of the front buffer does to a window.
void PresentFrame(State& state, Surface& surface, const std::vector<Box>& damage);
void PresentRegion(State& state, Surface& surface, const Box& region);
/// glFlush and glFinish show a front buffer.
void ShowFrontBuffer(State& state, Surface& surface);
/// Where drawing goes: the back buffer, or the front one in single-buffer mode.
Image& DrawImage(State& state, Surface& surface);
/// What pixels hold that nothing has defined.
Color Undefined(const State& state);
/// A clear is about to change @p area of the back buffer: what its tiles held is lost, where they
/// are not loaded.
void LoseTiles(State& state, Surface& surface, const Box& area);

/// Fences of both kinds are passed: all of them.
void SignalAll(State& state);
/// Commands of the context are with the GPU: its fences can be waited for elsewhere.
void FlushContext(Context& context);

} // namespace Sim

#endif
