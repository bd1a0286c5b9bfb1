#include "base/Log.h"
#include "device/DeviceLists.h"
#include "device/GlText.h"
#include "device/TextureLimits.h"

#include <nib/device.h>

#include <algorithm>
#include <cstdlib>
#include <iterator>

namespace Nib
{

namespace
{

// What getGPUVendor answers.
constexpr int kVendorUnknown = 0;
constexpr int kVendorArm = 1;
constexpr int kVendorQualcomm = 2;
constexpr int kVendorOther = 3;

constexpr int kDefaultMaxTextureSize = 8192; // pixels, until the driver has been asked

int DetectVendor(const char* vendor)
{
    if (Contains(vendor, "ARM"))
        return kVendorArm;
    return Contains(vendor, "Qualcomm") ? kVendorQualcomm : kVendorOther;
}

/// The version number behind the "OpenGL ES " of a GL_VERSION.
const char* SkipVersionPrefix(const char* version)
{
    constexpr std::size_t kPrefixLength = 10;
    return version + std::min(kPrefixLength, std::strlen(version));
}

GLint GetInteger(GLenum name)
{
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

} // namespace

// The members below are relaxed: each is a value of its own, and every thread that finds an old one
// reads the same answer from the driver. The initialised flag alone publishes the limits.
OpenGLRenderer::GlParameters OpenGLRenderer::m_glParameters = {kDefaultMaxTextureSize,
                                                               kDefaultMaxTextureSize, true, false};
std::atomic<bool> OpenGLRenderer::m_isSupportSampler{true};
std::atomic<int> OpenGLRenderer::m_vendor{kVendorUnknown};
std::atomic<int> OpenGLRenderer::m_maliDriverVersion{0};

void OpenGLRenderer::InitParameters()
{
    NIB_FUNCTION("static void Nib::OpenGLRenderer::InitParameters()");
    if (IsGLParameterInited())
        return;
    NIB_LOG_INFO("%s", function);
    m_glParameters.minMaxBlendingSupported.store(!IsGpuIn(kNoMinMaxBlendingGpus),
                                                 std::memory_order_relaxed);
    getGPUVendor();
    getSupportSampler();
    ReadTextureLimits();
    LogUniformLimits(function);
    InitOpenGLExtensions();
    // Pairs with the acquire of IsGLParameterInited.
    m_glParameters.initialised.store(true, std::memory_order_release);
}

void OpenGLRenderer::ReadTextureLimits()
{
    const GLint textureSize = GetInteger(GL_MAX_TEXTURE_SIZE);
    GLint viewportLimits[2] = {0, 0};
    glGetIntegerv(GL_MAX_VIEWPORT_DIMS, viewportLimits);
    m_glParameters.maxTextureWidth.store(std::min(textureSize, viewportLimits[0]),
                                         std::memory_order_relaxed);
    m_glParameters.maxTextureHeight.store(std::min(textureSize, viewportLimits[1]),
                                          std::memory_order_relaxed);
}

void OpenGLRenderer::LogUniformLimits(const char* function)
{
    NIB_LOG_INFO("%s GL_MAX_UNIFORM_BUFFER_BINDINGS = %d", function,
                 GetInteger(GL_MAX_UNIFORM_BUFFER_BINDINGS));
    NIB_LOG_INFO("%s GL_MAX_UNIFORM_BLOCK_SIZE = %d", function,
                 GetInteger(GL_MAX_UNIFORM_BLOCK_SIZE));
    NIB_LOG_INFO("%s GL_MAX_VERTEX_UNIFORM_BLOCKS = %d", function,
                 GetInteger(GL_MAX_VERTEX_UNIFORM_BLOCKS));
    // The line for fragments carries the limit for vertices, and is to stay so.
    NIB_LOG_INFO("%s GL_MAX_FRAGMENT_UNIFORM_BLOCKS = %d", function,
                 GetInteger(GL_MAX_VERTEX_UNIFORM_BLOCKS));
}

bool OpenGLRenderer::IsGLParameterInited()
{
    return m_glParameters.initialised.load(std::memory_order_acquire);
}

int OpenGLRenderer::getMaxTextureSize()
{
    return m_glParameters.maxTextureWidth.load(std::memory_order_relaxed);
}

int GetMaxTextureHeight()
{
    return OpenGLRenderer::m_glParameters.maxTextureHeight.load(std::memory_order_relaxed);
}

bool OpenGLRenderer::isMinMaxBlendingSupported()
{
    return m_glParameters.minMaxBlendingSupported.load(std::memory_order_relaxed);
}

bool OpenGLRenderer::isSupportSampler()
{
    return m_isSupportSampler.load(std::memory_order_relaxed);
}

bool OpenGLRenderer::getSupportSampler()
{
    NIB_FUNCTION("static bool Nib::OpenGLRenderer::getSupportSampler()");
    const char* version = getGLVersion();
    if (version == nullptr)
        return false;
    const char* number = SkipVersionPrefix(version);
    NIB_LOG_INFO("%s GPU getGLVersion = %s", function, number);
    const float value = std::strtof(number, nullptr);
    NIB_LOG_INFO("%s OpenGL version = %.1f", function, value);
    const bool supported = value > 3.05f;
    m_isSupportSampler.store(supported, std::memory_order_relaxed);
    NIB_LOG_INFO("%s OpenGL version m_isSupportSampler = %i", function, supported);
    return supported;
}

int OpenGLRenderer::getGPUVendor()
{
    int vendor = m_vendor.load(std::memory_order_relaxed);
    if (vendor != kVendorUnknown)
        return vendor;
    const char* text = GetGlText(GL_VENDOR);
    if (text == nullptr)
        return kVendorUnknown;
    vendor = DetectVendor(text);
    m_vendor.store(vendor, std::memory_order_relaxed);
    NIB_LOG_INFO("GPU vendor = %s", kGpuVendorNames[vendor]);
    return vendor;
}

bool OpenGLRenderer::isGpuOneOf(const char** names)
{
    NIB_FUNCTION("static bool Nib::OpenGLRenderer::isGpuOneOf(const char **)");
    const char* renderer = GetGlText(GL_RENDERER);
    if (renderer == nullptr)
        return false;
    for (; *names != nullptr; ++names)
    {
        if (std::strncmp(renderer, *names, std::strlen(*names)) == 0)
        {
            NIB_LOG_INFO("%s renderer - %s : %s", function, renderer, "IN LIST");
            return true;
        }
    }
    NIB_LOG_INFO("%s renderer - %s : %s", function, renderer, "NOT IN LIST");
    return false;
}

int OpenGLRenderer::getMaliDriverVersion()
{
    const int vendor = getGPUVendor();
    int revision = m_maliDriverVersion.load(std::memory_order_relaxed);
    if (revision != 0)
        return revision;
    if (vendor != kVendorArm)
        return 0;
    const char* version = getGLVersion();
    if (version == nullptr)
        return 0;
    NIB_LOG_INFO("GL_VERSION info = %s", version);
    constexpr char kRevisionMark[] = "v1.r";
    if (const char* mark = std::strstr(version, kRevisionMark))
    {
        revision = static_cast<int>(std::strtol(mark + std::strlen(kRevisionMark), nullptr, 10));
        m_maliDriverVersion.store(revision, std::memory_order_relaxed);
    }
    NIB_LOG_INFO("Mali driver Info: %s, version %i", kGpuVendorNames[vendor], revision);
    return revision;
}

const char* OpenGLRenderer::getGLVersion()
{
    return GetGlText(GL_VERSION);
}

const char* OpenGLRenderer::getGLExtensions()
{
    return GetGlText(GL_EXTENSIONS);
}

bool OpenGLRenderer::reportGLError(const char* label)
{
    NIB_FUNCTION("static bool Nib::OpenGLRenderer::reportGLError(const char *)");
    const GLenum error = glGetError();
    if (error == GL_NO_ERROR)
        return true;
    NIB_LOG_ERROR("%s : %s Err: 0x%04X", function, label != nullptr ? label : "", error);
    return false;
}

bool OpenGLRenderer::reportAndResetAllGLErrors(const char* label)
{
    NIB_FUNCTION("static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *)");
    bool clean = true;
    for (GLenum error = glGetError(); error != GL_NO_ERROR; error = glGetError())
    {
        NIB_LOG_ERROR("%s : %s glError = 0x%04X", function, label != nullptr ? label : "", error);
        clean = false;
    }
    return clean;
}

} // namespace Nib
