#include "GlReport.h"

#include "EglReport.h"
#include "LogLines.h"

#include "device/DeviceLists.h"

#include <nib/base.h>
#include <nib/device.h>
#include <nib/egl.h>
#include <nib/partial_update.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>
#include <GLES3/gl3.h>

#include <cstdio>
#include <memory>
#include <string>

namespace
{

struct Limit
{
    const char* name;
    GLenum parameter;
};

constexpr Limit kLimits[] = {
    {"maxTextureSize", GL_MAX_TEXTURE_SIZE},
    {"maxRenderbufferSize", GL_MAX_RENDERBUFFER_SIZE},
    {"maxVertexAttributes", GL_MAX_VERTEX_ATTRIBS},
    {"maxVertexUniformVectors", GL_MAX_VERTEX_UNIFORM_VECTORS},
    {"maxFragmentUniformVectors", GL_MAX_FRAGMENT_UNIFORM_VECTORS},
    {"maxUniformBlockSize", GL_MAX_UNIFORM_BLOCK_SIZE},
    {"maxTextureUnits", GL_MAX_COMBINED_TEXTURE_IMAGE_UNITS},
    {"maxSamples", GL_MAX_SAMPLES},
    {"subpixelBits", GL_SUBPIXEL_BITS},
    {"programBinaryFormats", GL_NUM_PROGRAM_BINARY_FORMATS},
};

Report Text(GLenum name)
{
    const GLubyte* const text = glGetString(name);
    return text != nullptr ? Report(reinterpret_cast<const char*>(text)) : Report(nullptr);
}

Report ReadLimits()
{
    Report limits;
    for (const Limit& limit : kLimits)
    {
        GLint value = 0;
        glGetIntegerv(limit.parameter, &value);
        limits[limit.name] = glGetError() == GL_NO_ERROR ? Report(value) : Report(nullptr);
    }
    limits["maxDrawnTextureSize"] = Nib::OpenGLRenderer::getMaxTextureSize();
    return limits;
}

Report Name(const char* const* names)
{
    Report list = Report::array();
    for (; *names != nullptr; ++names)
        list.push_back(*names);
    return list;
}

template <std::size_t Size>
Report GpuList(const char* meaning, const std::array<const char*, Size>& names)
{
    return {{"meaning", meaning}, {"names", Name(names.data())}, {"matches", Nib::IsGpuIn(names)}};
}

std::string Hexadecimal(unsigned value)
{
    char text[16];
    std::snprintf(text, sizeof text, "0x%02X", value);
    return text;
}

const char* PriorityName(EGLint priority)
{
    switch (static_cast<Nib::EglContext::Priority>(priority))
    {
    case Nib::EglContext::Priority::High: return "high";
    case Nib::EglContext::Priority::Medium: return "medium";
    case Nib::EglContext::Priority::Low: return "low";
    }
    return "another";
}

} // namespace

Report ReadGl()
{
    using Nib::OpenGLRenderer;
    const int vendor = OpenGLRenderer::getGPUVendor();
    return {
        {"vendor", Text(GL_VENDOR)},
        {"renderer", Text(GL_RENDERER)},
        {"version", Text(GL_VERSION)},
        {"shadingLanguage", Text(GL_SHADING_LANGUAGE_VERSION)},
        {"gpuVendor",
         {{"code", vendor}, {"name", Nib::kGpuVendorNames.at(static_cast<std::size_t>(vendor))}}},
        {"armDriverRevision", OpenGLRenderer::getMaliDriverVersion()},
        {"samplers", OpenGLRenderer::isSupportSampler()},
        {"minMaxBlending", OpenGLRenderer::isMinMaxBlendingSupported()},
        {"tiledRendering", OpenGLRenderer::checkQCOMTilingSupport()},
        {"limits", ReadLimits()},
        {"extensions", Words(OpenGLRenderer::getGLExtensions())}};
}

Report ReadGpuLists()
{
    const int sdk = Nib::System::GetSDKVersion();
    return {GpuList("no blending by minimum and maximum", Nib::kNoMinMaxBlendingGpus),
            GpuList(kNoFrontBuffer, Nib::kNoFrontBufferGpus),
            GpuList("no buffer age", Nib::kNoBufferAgeGpus),
            GpuList("damage region", Nib::PartialUpdateGpus(sdk)),
            GpuList("rectangles aligned to tiles", Nib::TileAlignedGpus(sdk))};
}

Report ReadUpdateMode()
{
    constexpr int kSize = 64; // pixels; no frame is drawn
    constexpr int kInfo = 4;  // ANDROID_LOG_INFO
    const std::unique_ptr<Nib::EglSurface> surface(
        Nib::Egl::GetInstance()->CreateOffscreenSurface(kSize, kSize));
    if (!surface)
        return {{"missing", "the driver refuses a pbuffer"}};
    const LogLines log(kInfo);
    Nib::UpdateRectangle update;
    update.Init(surface.get(), kSize, kSize);
    Report reasons = Report::array();
    for (const std::string& line : log.Lines())
    {
        if (line.find("android_property_get") == std::string::npos) // no step of the decision
            reasons.push_back(line);
    }
    return {{"mode", Hexadecimal(update.GetUpdateMode())},
            {"tileSize", update.GetTileSize()},
            {"askedOf", "a pbuffer; a window of this driver may allow another"},
            {"reasons", std::move(reasons)}};
}

Report ReadContextPriority()
{
    const Nib::Egl& egl = *Nib::Egl::GetInstance();
    Report report = {{"asked", "high"}, {"granted", nullptr}};
    EGLint granted = 0;
    if (!egl.IsEglExtensionSupported("EGL_IMG_context_priority"))
        report["missing"] = "the display has no EGL_IMG_context_priority";
    else if (eglQueryContext(egl.GetDisplay(), eglGetCurrentContext(),
                             EGL_CONTEXT_PRIORITY_LEVEL_IMG, &granted) == EGL_TRUE)
        report["granted"] = PriorityName(granted);
    return report;
}
