#include "SimExtensions.h"

#include "SimEgl.h"
#include "SimGl.h"

#include <cstring>

namespace
{

using namespace Sim;
using Function = __eglMustCastToProperFunctionPointerType;

/// An entry point, and the extension without which the device does not have it.
struct Row
{
    const char* name;
    const char* extension;
    Function function;
};

#define SIM_ROW(extension, name)                                                                   \
    {                                                                                              \
#name, extension, reinterpret_cast < Function>(&Extension::name)                           \
    }

constexpr const char* kFenceSync = "EGL_KHR_fence_sync";
constexpr const char* kTimestamps = "EGL_ANDROID_get_frame_timestamps";
constexpr const char* kDebug = "GL_KHR_debug";
constexpr const char* kTiling = "GL_QCOM_tiled_rendering";

const Row* FindRow(const char* name)
{
    static const Row rows[] = {
        SIM_ROW(kFenceSync, eglCreateSyncKHR),
        SIM_ROW(kFenceSync, eglDestroySyncKHR),
        SIM_ROW(kFenceSync, eglClientWaitSyncKHR),
        SIM_ROW(kFenceSync, eglGetSyncAttribKHR),
        SIM_ROW("EGL_KHR_swap_buffers_with_damage", eglSwapBuffersWithDamageKHR),
        SIM_ROW("EGL_KHR_partial_update", eglSetDamageRegionKHR),
        SIM_ROW("EGL_NV_post_sub_buffer", eglPostSubBufferNV),
        SIM_ROW(kTimestamps, eglGetCompositorTimingSupportedANDROID),
        SIM_ROW(kTimestamps, eglGetCompositorTimingANDROID),
        SIM_ROW(kTimestamps, eglGetFrameTimestampSupportedANDROID),
        SIM_ROW(kTimestamps, eglGetNextFrameIdANDROID),
        SIM_ROW(kTimestamps, eglGetFrameTimestampsANDROID),
        SIM_ROW("EGL_ANDROID_presentation_time", eglPresentationTimeANDROID),
        SIM_ROW(kTiling, glStartTilingQCOM),
        SIM_ROW(kTiling, glEndTilingQCOM),
        SIM_ROW(kDebug, glDebugMessageCallbackKHR),
        SIM_ROW(kDebug, glDebugMessageControlKHR),
        SIM_ROW(kDebug, glPushDebugGroupKHR),
        SIM_ROW(kDebug, glPopDebugGroupKHR),
        SIM_ROW(kDebug, glObjectLabelKHR),
    };
    for (const Row& row : rows)
    {
        if (std::strcmp(row.name, name) == 0)
            return &row;
    }
    return nullptr;
}

} // namespace

SIM_API Function eglGetProcAddress(const char* name)
{
    EglEntry entry("eglGetProcAddress", {name});
    if (!entry || !name)
        return nullptr;
    const Row* const row = FindRow(name);
    if (!row)
        return nullptr;
    const SimGpu& gpu = entry.state.gpu;
    const bool present = gpu.HasEglExtension(row->extension) || gpu.HasGlExtension(row->extension);
    return present ? row->function : nullptr;
}

namespace
{

constexpr GLbitfield kColorBuffer0 = 0x1; // GL_COLOR_BUFFER_BIT0_QCOM

/// What the tiled area held is gone, unless colour is preserved.
void LoseTilingArea(Sim::GlEntry& entry, GLbitfield preserveMask)
{
    if ((preserveMask & kColorBuffer0) != 0 || entry.Gl().drawFramebuffer != 0 ||
        !entry.DrawSurface())
        return;
    Sim::DrawImage(entry.state, *entry.DrawSurface())
        .Fill(*entry.Gl().tiling, Sim::Undefined(entry.state), {true, true, true, true});
}

} // namespace

// A frame may have several dirty rectangles, each of which starts a region, and every frame ends
// one, started or not: out of order the calls are errors without blame.

void Sim::Extension::glStartTilingQCOM(GLuint x, GLuint y, GLuint width, GLuint height,
                                       GLbitfield preserveMask)
{
    GlEntry entry("glStartTilingQCOM", {x, y, width, height, preserveMask});
    if (!entry)
        return;
    if (entry.Gl().tiling)
        return entry.Refuse(GL_INVALID_OPERATION);
    const Box area{static_cast<int>(x), static_cast<int>(y), static_cast<int>(width),
                   static_cast<int>(height)};
    entry.Gl().tiling = area;
    LoseTilingArea(entry, preserveMask);
}

void Sim::Extension::glEndTilingQCOM(GLbitfield preserveMask)
{
    GlEntry entry("glEndTilingQCOM", {preserveMask});
    if (!entry)
        return;
    if (!entry.Gl().tiling)
        return entry.Refuse(GL_INVALID_OPERATION);
    LoseTilingArea(entry, preserveMask);
    entry.Gl().tiling.reset();
}
