#include <nib/partial_update.h>

#include <nib/device.h>
#include <nib/egl.h>
#include <nib/texture.h>
#include <nib/trace.h>

#include "base/Log.h"
#include "device/DeviceLists.h"
#include "egl/EglTokens.h"
#include "render/UpdateArithmetic.h"

#include <cstdlib>

namespace Nib
{

namespace
{

// The bits of an update mode.
constexpr std::uint32_t kConfigured = 0x01; // every mode
constexpr std::uint32_t kAlignToTiles = 0x02;
constexpr std::uint32_t kKeepHistory = 0x04;    // of the dirty rectangles of 3 frames
constexpr std::uint32_t kPreserved = 0x08;      // the surface keeps its content across swaps
constexpr std::uint32_t kReportDamage = 0x10;   // in no mode that is ever chosen
constexpr std::uint32_t kTiledRendering = 0x20; // and the dirty rectangles of UseRect matter
constexpr std::uint32_t kDamageRegion = 0x40;
constexpr std::uint32_t kPostSubBuffer = 0x80;

// The modes that are chosen.
constexpr std::uint32_t kPostSubBufferMode = kPostSubBuffer | kConfigured;                  // 0x81
constexpr std::uint32_t kDamageRegionMode = kDamageRegion | kKeepHistory | kConfigured;     // 0x45
constexpr std::uint32_t kTileAlignedMode = kKeepHistory | kAlignToTiles | kConfigured;      // 0x07
constexpr std::uint32_t kTiledRenderingMode = kTiledRendering | kKeepHistory | kConfigured; // 0x25
constexpr std::uint32_t kPreservedMode = kPreserved | kConfigured;                          // 0x09
constexpr std::uint32_t kFullScreenMode = kConfigured;                                      // 0x01

constexpr int kMaliTileSize = 32;      // pixels
constexpr int kHistoryLength = 3;      // frames
constexpr int kMaxPropertyLength = 92; // the platform's, the end of the text included
constexpr int kKeepColor = 1;
constexpr int kDepthAndStencil = 6;
constexpr int kPreserveNothing = 0;

template <typename Function>
void Resolve(Function& entry, const char* name)
{
    entry = reinterpret_cast<Function>(eglGetProcAddress(name));
}

/// As the log has it.
const char* ModeText(std::uint32_t mode)
{
    switch (mode)
    {
    case kPostSubBufferMode: return "0x81";
    case kDamageRegionMode: return "0x45";
    case kTileAlignedMode: return "0x7";
    case kTiledRenderingMode: return "0x25";
    case kPreservedMode: return "0x9";
    case kFullScreenMode: return "0x1";
    default: return "none";
    }
}

EGLDisplay Display()
{
    return Egl::GetInstance()->GetDisplay();
}

} // namespace

UpdateRectangle::UpdateRectangle()
    : m_surface(nullptr), m_hwRotation(0), m_screenWidth(0), m_screenHeight(0), m_damageRect{},
      m_mode(0), m_tileSize(0), m_noBufferAge(false), m_setDamageRegion(nullptr),
      m_swapBuffersWithDamage(nullptr), m_postSubBuffer(nullptr)
{
    NIB_FUNCTION("Nib::UpdateRectangle::UpdateRectangle()");
    char value[kMaxPropertyLength] = {};
    if (android_property_get("ro.sf.hwrotation", value) != 0)
        m_hwRotation = std::atoi(value) / 90;
    NIB_LOG_INFO("%s hw rotation = %d", function, m_hwRotation);
}

UpdateRectangle::~UpdateRectangle() = default;

// ---- the decision, once -------------------------------------------------------------------------

void UpdateRectangle::Init(EglSurface* surface)
{
    // The width is asked for first.
    const int width = surface->GetWidth();
    const int height = surface->GetHeight();
    Init(surface, width, height);
}

void UpdateRectangle::Init(EglSurface* surface, int width, int height)
{
    m_surface = surface;
    if (surface == nullptr) // neither window nor pbuffer could be made: nothing is presented
        return SetScreenRect(width, height);
    if ((m_mode & kConfigured) == 0)
    {
        InitEGLExtensions();
        SetUpdateMode();
        InitClipRect();
    }
    SetScreenRect(width, height);
    if ((m_mode & kPreserved) != 0)
        SetPreserveBehavior(); // the surface may be another one
    m_clipRect->Reset();
}

void UpdateRectangle::InitEGLExtensions()
{
    NIB_FUNCTION("void Nib::UpdateRectangle::InitEGLExtensions()");
    const Egl* egl = Egl::GetInstance();
    if (m_setDamageRegion == nullptr && egl->IsEglExtensionSupported("EGL_KHR_partial_update"))
    {
        NIB_LOG_INFO("%s EGL_KHR_partial_update supported", function);
        Resolve(m_setDamageRegion, "eglSetDamageRegionKHR");
    }
    if (m_swapBuffersWithDamage == nullptr &&
        egl->IsEglExtensionSupported("EGL_KHR_swap_buffers_with_damage"))
    {
        NIB_LOG_INFO("%s EGL_KHR_swap_buffers_with_damage supported", function);
        Resolve(m_swapBuffersWithDamage, "eglSwapBuffersWithDamageKHR");
    }
    if (m_postSubBuffer == nullptr && egl->IsEglExtensionSupported("EGL_NV_post_sub_buffer"))
    {
        EGLint supported = 0;
        eglQuerySurface(egl->GetDisplay(), m_surface->Get(), EGL_POST_SUB_BUFFER_SUPPORTED_NV,
                        &supported);
        if (supported != EGL_TRUE)
            return;
        NIB_LOG_INFO("%s EGL_NV_post_sub_buffer supported", function);
        Resolve(m_postSubBuffer, "eglPostSubBufferNV");
    }
}

void UpdateRectangle::SetUpdateMode()
{
    NIB_FUNCTION("void Nib::UpdateRectangle::SetUpdateMode()");
    if (IsGpuIn(kNoBufferAgeGpus))
    {
        NIB_LOG_INFO("%s. Do not use BUFFER_AGE_KHR extension!", function);
        m_noBufferAge = true;
    }
    if (m_postSubBuffer != nullptr)
    {
        m_mode = kPostSubBufferMode;
        NIB_LOG_INFO("%s : eglPostSubBuffer Suported", function);
    }
    else if (IsGpuIn(PartialUpdateGpus(System::GetSDKVersion())) && m_setDamageRegion != nullptr &&
             !m_noBufferAge)
    {
        m_mode = kDamageRegionMode;
        NIB_LOG_INFO("%s: SupportPartialUpdateGPU Mode = 0x%X", function, m_mode);
    }
    else if (IsGpuIn(TileAlignedGpus(System::GetSDKVersion())))
    {
        m_mode = kTileAlignedMode;
        m_tileSize = kMaliTileSize;
        NIB_LOG_INFO("%s: Tiled Mali Renderer. Mode = 0x%X", function, m_mode);
    }
    else if (OpenGLRenderer::checkQCOMTilingSupport())
    {
        m_mode = kTiledRenderingMode;
        NIB_LOG_INFO("%s: QCOM tiled renderer. Mode = 0x%X", function, m_mode);
    }
    else if (SetPreserveBehavior())
    {
        m_mode = kPreservedMode;
        NIB_LOG_INFO("%s: Preserve Behavior. Mode = 0x%X", function, m_mode);
    }
    else
    {
        m_mode = kFullScreenMode;
        NIB_LOG_INFO("%s: Update full screen. Mode = 0x%X", function, m_mode);
    }
}

void UpdateRectangle::InitClipRect()
{
    m_clipRect = std::make_unique<ClipRect>((m_mode & kKeepHistory) != 0 ? kHistoryLength : 0);
}

void UpdateRectangle::SetScreenRect(int width, int height)
{
    NIB_FUNCTION("void Nib::UpdateRectangle::SetScreenRect(int, int)");
    m_screenWidth = width;
    m_screenHeight = height;
    NIB_LOG_INFO("%s. ScreenRect = %d * %d", function, width, height);
    if (m_clipRect != nullptr)
        m_clipRect->Init(width, height);
}

bool UpdateRectangle::SetPreserveBehavior()
{
    NIB_FUNCTION("bool Nib::UpdateRectangle::SetPreserveBehavior()");
    if (m_surface->SetAttribute(EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED))
    {
        NIB_LOG_INFO("%s : succeeded set EGL_BUFFER_PRESERVED", function);
        return true;
    }
    NIB_LOG_INFO("%s : failed to set EGL_BUFFER_PRESERVED", function);
    return false;
}

// ---- one frame, in the order it runs ------------------------------------------------------------

void UpdateRectangle::UseRect(RectF dirty, int rotation)
{
    if ((m_mode & kTiledRendering) != 0)
        RestrictToDirtyArea(dirty, rotation);
    if ((m_mode & kReportDamage) != 0)
        LogDamageRegionError();
    if ((m_mode & kPostSubBuffer) != 0)
        m_damageRect = WindowBox(dirty);
}

// What UseRect does where the GPU renders in tiles: only the tiles of the dirty area are drawn.
void UpdateRectangle::RestrictToDirtyArea(const RectF& dirty, int rotation)
{
    if (m_surface == nullptr)
        return;
    OpenGLRenderer::bindFramebuffer(FramebufferTarget::ReadAndDraw, 0);
    const RectF area =
        ClipToScreen(m_clipRect->AddUpdateRect(&dirty), {m_screenWidth, m_screenHeight});
    const int rotationIndex = static_cast<int>((std::int64_t{m_hwRotation} + rotation) % 4);
    ScissorBox box{};
    GetScissorRect(area, &box.x, &box.y, &box.width, &box.height, rotationIndex);
    if ((m_mode & kDamageRegion) != 0)
    {
        m_damageRect = box;
        if (m_setDamageRegion(Display(), m_surface->Get(), &m_damageRect.x, 1) != EGL_TRUE)
            LogDamageRegionError();
    }
    if ((m_mode & kPostSubBuffer) != 0)
        m_damageRect = box;
    OpenGLRenderer::startTilingQCOM(box.x, box.y, box.width, box.height, kPreserveNothing);
}

void UpdateRectangle::LogDamageRegionError() const
{
    NIB_LOG_ERROR("%s. eglSetDamageRegion failed(%d)",
                  "void Nib::UpdateRectangle::UseRect(Nib::RectF, int)", eglGetError());
}

void UpdateRectangle::GetScissorRect(const RectF& rect, int* x, int* y, int* width, int* height,
                                     int rotationIndex)
{
    const ScreenSize screen{m_screenWidth, m_screenHeight};
    ScissorBox box{};
    if (IsFramebufferDirty())
    {
        box = FullScreen(screen);
    }
    else if (!rect.IsEmpty())
    {
        box = FlippedBox(rect, screen);
        if ((m_mode & kAlignToTiles) != 0)
            box = AlignedToTiles(box, screen, m_tileSize, rotationIndex);
    }
    *x = box.x;
    *y = box.y;
    *width = box.width;
    *height = box.height;
}

bool UpdateRectangle::IsFramebufferDirty()
{
    int age = -1;
    if (!m_noBufferAge && m_surface->QueryAttribute(EGL_BUFFER_AGE_EXT, &age))
        return age == 0 || age > kHistoryLength;

    // Where nobody tells the age, a buffer that was never drawn into has no opaque centre.
    std::uint32_t pixel = 0;
    OpenGLRenderer::readPixels(m_screenWidth / 2, m_screenHeight / 2, 1, 1, &pixel,
                               TextureTargetLayout::Rgba, TextureMemoryLayout::RGBA8);
    return pixel == 0;
}

void UpdateRectangle::DamageRectFromScissor(DamageRect& damage, int x, int y, int width, int height)
{
    damage = {x, y, width, height};
}

void UpdateRectangle::SetDamageRect(const DamageRect& damage)
{
    m_damageRect = damage;
}

void UpdateRectangle::Reset()
{
    OpenGLRenderer::stopTilingQCOM(kKeepColor);
    OpenGLRenderer::discardFramebuffer(kDepthAndStencil);
}

bool UpdateRectangle::DoSwapBuffers()
{
    NIB_FUNCTION("bool Nib::UpdateRectangle::DoSwapBuffers()");
    const bool isPart = (m_mode & kPostSubBuffer) != 0 || NeedsDamageRect();
    const DamageRect part = isPart ? m_damageRect : DamageRect{0, 0, m_screenWidth, m_screenHeight};
    const TraceScope trace("frame", "swap",
                           {{"mode", ModeText(m_mode)},
                            {"x", part.x},
                            {"y", part.y},
                            {"width", part.width},
                            {"height", part.height}});
    if (!isPart)
        return m_surface->SwapBuffers();
    const EGLBoolean isShown =
        (m_mode & kPostSubBuffer) != 0
            ? m_postSubBuffer(Display(), m_surface->Get(), part.x, part.y, part.width, part.height)
            : m_swapBuffersWithDamage(Display(), m_surface->Get(), &m_damageRect.x, 1);
    // The render thread has nobody to return false to. Why it was refused is EGL's to tell, once.
    if (isShown != EGL_TRUE)
        NIB_LOG_ERROR("%s The frame is not shown", function);
    return isShown == EGL_TRUE;
}

// ---- what it has come to ------------------------------------------------------------------------

bool UpdateRectangle::NeedsDamageRect() const
{
    return (m_mode & kDamageRegion) != 0 && m_swapBuffersWithDamage != nullptr;
}

unsigned UpdateRectangle::GetUpdateMode() const
{
    return m_mode;
}

int UpdateRectangle::GetTileSize() const
{
    return m_tileSize;
}

UpdateRectangle::DamageRect UpdateRectangle::GetDamageRect() const
{
    return m_damageRect;
}

int UpdateRectangle::GetScreenWidth() const
{
    return m_screenWidth;
}

int UpdateRectangle::GetScreenHeight() const
{
    return m_screenHeight;
}

} // namespace Nib
