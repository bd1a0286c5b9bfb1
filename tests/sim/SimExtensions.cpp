#include "SimExtensions.h"

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
    entry.Gl().tiling = true;
}

void Sim::Extension::glEndTilingQCOM(GLbitfield preserveMask)
{
    GlEntry entry("glEndTilingQCOM", {preserveMask});
    if (!entry)
        return;
    if (!entry.Gl().tiling)
        return entry.Refuse(GL_INVALID_OPERATION);
    entry.Gl().tiling = false;
}
