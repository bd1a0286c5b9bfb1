#include "base/Log.h"
#include "base/ThreadAnnotations.h"
#include "device/CheckTask.h"
#include "device/DeviceLists.h"
#include "device/GlText.h"

#include <nib/base.h>
#include <nib/device.h>
#include <nib/egl.h>
#include <nib/render_thread.h>

#include <string>
#include <unordered_map>

namespace Nib
{

namespace
{

/// An answer that is found once in a process, on the shared render thread.
struct CachedCheck
{
    bool checked = false;
    bool result = false;
};

// One lock for both checks. It is held while the render thread works: callers that come meanwhile
// find the answer ready.
CriticalSection g_checkLock{false};
CachedCheck g_glCompatible NIB_GUARDED_BY(g_checkLock);
CachedCheck g_inBlockList NIB_GUARDED_BY(g_checkLock);

// Renderer name -> whether GL_RENDERER begins with it. Without a lock: one GL thread at a time.
std::unordered_map<std::string, bool> gCheckedGPUs;

void LogAnswer(const char* function, bool answer)
{
    NIB_LOG_INFO("%s = %s", function, answer ? "true" : "false");
}

/// Runs @p check on the shared render thread, unless that was done before; never again, even if
/// the thread did not take it.
void RunOnce(void (*check)(bool*), CachedCheck& cache) NIB_REQUIRES(g_checkLock)
{
    if (cache.checked)
        return;
    RunCheck(*RenderThreadGLST::getInstance()->GetMsgQueue(), check, &cache.result);
    RenderThreadGLST::release();
    cache.checked = true;
}

bool IsGLSufficient()
{
    const char* version = OpenGLRenderer::getGLVersion();
    if (version == nullptr)
        return false; // no GL at all
    if (Contains(version, "OpenGL ES 1."))
    {
        NIB_LOG_ERROR("GPU doens't supported! Minimum required OpenGL ES 2.0 support!");
        return false;
    }
    if (!Contains(version, "OpenGL ES 2."))
        return true; // what the extensions give is part of OpenGL ES 3
    const char* extensions = OpenGLRenderer::getGLExtensions();
    if (Contains(extensions, "GL_EXT_unpack_subimage") &&
        Contains(extensions, "GL_EXT_blend_minmax"))
        return true;
    NIB_LOG_ERROR("GPU doesn't supported! Required extensions: GL_EXT_unpack_subimage, "
                  "GL_EXT_blend_minmax doens't supported");
    return false;
}

// Render thread.
void CheckGL(bool* compatible)
{
    *compatible = IsGLSufficient();
}

// Render thread.
void CheckBlockList(bool* inBlockList)
{
    *inBlockList = IsGpuIn(kNoFrontBufferGpus);
}

bool IsInBlockList()
{
    NIB_FUNCTION("bool Nib::IsInBlockList()");
    AutoCriticalSection lock(g_checkLock);
    RunOnce(&CheckBlockList, g_inBlockList);
    LogAnswer(function, g_inBlockList.result);
    return g_inBlockList.result;
}

bool HasFbrExtensions(const Egl& egl)
{
    for (const char* extension : kFrontBufferExtensions)
    {
        if (!egl.IsEglExtensionSupported(extension))
            return false;
    }
    return true;
}

} // namespace

bool IsCompatibleGL()
{
    NIB_FUNCTION("bool Nib::IsCompatibleGL()");
    AutoCriticalSection lock(g_checkLock);
    RunOnce(&CheckGL, g_glCompatible);
    LogAnswer(function, g_glCompatible.result);
    return g_glCompatible.result;
}

bool IsFBRSupported()
{
    NIB_FUNCTION("bool Nib::IsFBRSupported()");
    const Egl& egl = *Egl::GetInstance();
    // A desktop's stand-in for the front-buffer configuration is none.
    const bool supported = HasFbrExtensions(egl) && !IsInBlockList() && egl.HasFrontBufferConfig();
    LogAnswer(function, supported);
    return supported;
}

bool IsGPUNameEqualTo(const char* name)
{
    NIB_FUNCTION("bool Nib::IsGPUNameEqualTo(const char *)");
    if (name == nullptr)
    {
        NIB_LOG_INFO("%s input name is nullptr", function);
        return false;
    }
    const auto known = gCheckedGPUs.find(name);
    if (known != gCheckedGPUs.end())
        return known->second;
    const char* names[] = {name, nullptr};
    const bool answer = OpenGLRenderer::isGpuOneOf(names);
    gCheckedGPUs.emplace(name, answer);
    return answer;
}

} // namespace Nib
