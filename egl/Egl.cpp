#include <nib/base.h>
#include <nib/egl.h>

#include "base/Log.h"
#include "egl/EglTokens.h"

#include <android/native_window.h>

#include <cstring>
#include <vector>

namespace Nib
{

namespace
{

// One attribute a line.
// clang-format off

// What eglChooseConfig is asked for. The colour sizes are minimums; alpha and depth are left out,
// because the selection among the matches judges them.
constexpr EGLint kOrdinaryAttributes[] = {
    EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT_KHR,
    EGL_SURFACE_TYPE,    EGL_WINDOW_BIT | EGL_PBUFFER_BIT,
    EGL_RED_SIZE,        4,
    EGL_GREEN_SIZE,      4,
    EGL_BLUE_SIZE,       4,
    EGL_STENCIL_SIZE,    0,
    EGL_NONE,
};

constexpr EGLint kFrontBufferAttributes[] = {
    EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT_KHR,
    EGL_SURFACE_TYPE,    EGL_MUTABLE_RENDER_BUFFER_BIT_KHR | EGL_WINDOW_BIT | EGL_PBUFFER_BIT,
    EGL_RED_SIZE,        4,
    EGL_GREEN_SIZE,      4,
    EGL_BLUE_SIZE,       4,
    EGL_STENCIL_SIZE,    0,
    EGL_NONE,
};

// The ordinary list where no window is ever to be drawn into.
constexpr EGLint kPbufferAttributes[] = {
    EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT_KHR,
    EGL_SURFACE_TYPE,    EGL_PBUFFER_BIT,
    EGL_RED_SIZE,        4,
    EGL_GREEN_SIZE,      4,
    EGL_BLUE_SIZE,       4,
    EGL_STENCIL_SIZE,    0,
    EGL_NONE,
};

constexpr EGLint kSubBufferSurfaceAttributes[] = {
    EGL_POST_SUB_BUFFER_SUPPORTED_NV, EGL_TRUE,
    EGL_NONE,
};

// clang-format on

// Both are ready before any code of the library runs. The instance lives until the process ends.
CriticalSection g_instanceLock(false);
std::atomic<Egl*> g_instance{nullptr};

EGLint QueryConfig(EGLDisplay display, EGLConfig config, EGLint attribute)
{
    EGLint value = 0;
    eglGetConfigAttrib(display, config, attribute, &value);
    return value;
}

int CountMatching(EGLDisplay display, const EGLint* attributes)
{
    EGLint total = 0;
    eglChooseConfig(display, attributes, nullptr, 0, &total);
    return total;
}

// The depth and stencil bits of an RGBA8888 configuration, or -1 for any other.
int Cost(EGLDisplay display, EGLConfig config)
{
    const EGLint depth = QueryConfig(display, config, EGL_DEPTH_SIZE);
    const EGLint stencil = QueryConfig(display, config, EGL_STENCIL_SIZE);
    const EGLint red = QueryConfig(display, config, EGL_RED_SIZE);
    const EGLint green = QueryConfig(display, config, EGL_GREEN_SIZE);
    const EGLint blue = QueryConfig(display, config, EGL_BLUE_SIZE);
    const EGLint alpha = QueryConfig(display, config, EGL_ALPHA_SIZE);
    if (red != 8 || green != 8 || blue != 8 || alpha != 8)
        return -1;
    return depth + stencil;
}

// The cheapest RGBA8888 configuration, the earlier one among equals; null when there is none.
EGLConfig Cheapest(EGLDisplay display, const std::vector<EGLConfig>& configs)
{
    EGLConfig candidate = nullptr;
    int candidateCost = 0;
    for (EGLConfig config : configs)
    {
        const int cost = Cost(display, config);
        if (cost < 0 || (candidate != nullptr && cost >= candidateCost))
            continue;
        candidate = config;
        candidateCost = cost;
    }
    return candidate;
}

} // namespace

// ---- the instance -------------------------------------------------------------------------------

Egl::Egl()
    : m_display(EGL_NO_DISPLAY), m_config(nullptr), m_frontBufferConfig(nullptr), m_status(2),
      m_ordinaryForFrontBuffer(false)
{
}

Egl::~Egl()
{
    eglTerminate(m_display);
}

Egl* Egl::GetInstance()
{
    // Acquire pairs with the release below: who sees the pointer sees the configurations.
    if (Egl* instance = g_instance.load(std::memory_order_acquire))
        return instance;

    AutoCriticalSection guard(g_instanceLock);
    if (Egl* instance = g_instance.load(std::memory_order_relaxed))
        return instance;
    Egl* instance = new Egl;
    instance->Init(); // a failure stays: callers see the status and the missing configuration
    g_instance.store(instance, std::memory_order_release);
    return instance;
}

int Egl::GetEglStatus()
{
    return GetInstance()->m_status;
}

bool Egl::Init()
{
    NIB_FUNCTION("bool Nib::Egl::Init()");
    NIB_LOG_INFO("%s Initilizing EGL", function);
    if (!InitializeAPI())
        return false;
    m_config = nullptr;
    FindConfig(false, &m_config);
    const bool found = FindConfig(true, &m_frontBufferConfig);
    m_ordinaryForFrontBuffer = !found && m_config != nullptr && System::GetDesktopFallbacks();
    if (m_ordinaryForFrontBuffer)
        NIB_LOG_INFO("%s: the ordinary configuration stands for the front-buffer one", function);
    return m_config != nullptr;
}

bool Egl::InitializeAPI()
{
    NIB_FUNCTION("bool Nib::Egl::InitializeAPI()");
    m_display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    m_status = 0;

    EGLint major = 0;
    EGLint minor = 0;
    if (eglInitialize(m_display, &major, &minor) != EGL_TRUE)
    {
        const EGLint error = eglGetError();
        NIB_LOG_ERROR("%s: eglInitialize failed. Display: %p, Err: 0x%4X", function, m_display,
                      static_cast<unsigned>(error));
        m_status = error == EGL_NOT_INITIALIZED ? 1 : 2;
        m_display = EGL_NO_DISPLAY;
        return false;
    }
    NIB_LOG_INFO("%s Version: %d.%d", function, major, minor);

    if (eglQueryAPI() != EGL_OPENGL_ES_API)
    {
        eglBindAPI(EGL_OPENGL_ES_API);
        if (eglQueryAPI() != EGL_OPENGL_ES_API)
        {
            NIB_LOG_ERROR("%s: eglBindAPI failed", function);
            return false;
        }
    }
    NIB_LOG_INFO("%s EGL_EXTENSIONS=%s", function, GetEglExtensions());
    return true;
}

// ---- configurations -----------------------------------------------------------------------------

const EGLint* Egl::GetConfigAttributes(bool frontBuffer) const
{
    NIB_FUNCTION("const EGLint *Nib::Egl::GetConfigAttributes(bool) const");
    if (!frontBuffer)
        return kOrdinaryAttributes;
    if (IsEglExtensionSupported("EGL_KHR_mutable_render_buffer"))
        return kFrontBufferAttributes;
    NIB_LOG_ERROR("%s - front buffer requested but NOT supported.", function);
    return nullptr;
}

bool Egl::FindConfig(bool frontBuffer, EGLConfig* out)
{
    NIB_FUNCTION("bool Nib::Egl::FindConfig(bool, EGLConfig *)");
    const EGLint* attributes = GetConfigAttributes(frontBuffer);
    if (attributes == nullptr)
    {
        NIB_LOG_ERROR("%s - failed to fill expectedConfigAttribs", function);
        return false;
    }
    int total = CountMatching(m_display, attributes);
    if (total <= 0)
    {
        NIB_LOG_ERROR("%s: No configArray match configSpec", function);
        if (frontBuffer || !System::GetDesktopFallbacks())
            return false;
        NIB_LOG_INFO("%s: no configuration for windows, looking for one for pbuffers", function);
        attributes = kPbufferAttributes;
        total = CountMatching(m_display, attributes);
        if (total <= 0)
            return false;
    }
    return ChooseMatching(attributes, total, out);
}

// The rest of FindConfig, in whose name it logs.
bool Egl::ChooseMatching(const EGLint* attributes, int total, EGLConfig* out) const
{
    static constexpr const char* function = "bool Nib::Egl::FindConfig(bool, EGLConfig *)";
    std::vector<EGLConfig> configs(static_cast<std::size_t>(total));
    EGLint read = 0;
    eglChooseConfig(m_display, attributes, configs.data(), total, &read);
    if (read != total)
    {
        NIB_LOG_ERROR("%s: Not all configArray readed: %d from %d", function, read, total);
        return false;
    }
    const EGLConfig chosen = Cheapest(m_display, configs);
    if (chosen == nullptr)
    {
        NIB_LOG_ERROR("%s: Requred config not found", function);
        return false;
    }
    *out = chosen;
    return true;
}

EGLConfig Egl::GetConfig(bool frontBuffer) const
{
    return frontBuffer && !m_ordinaryForFrontBuffer ? m_frontBufferConfig : m_config;
}

bool Egl::HasFrontBufferConfig() const
{
    return m_frontBufferConfig != nullptr;
}

// ---- the display --------------------------------------------------------------------------------

EGLDisplay Egl::GetDisplay() const
{
    return m_display;
}

const char* Egl::GetEglExtensions() const
{
    const char* extensions = eglQueryString(m_display, EGL_EXTENSIONS);
    return extensions != nullptr ? extensions : "";
}

bool Egl::IsEglExtensionSupported(const char* name) const
{
    return std::strstr(GetEglExtensions(), name) != nullptr;
}

bool Egl::MakeCurrent(const EglContext* context, const EglSurface* surface) const
{
    NIB_FUNCTION(
        "bool Nib::Egl::MakeCurrent(const Nib::EglContext *, const Nib::EglSurface *) const");
    const EGLSurface handle = surface != nullptr ? surface->Get() : EGL_NO_SURFACE;
    const EGLContext contextHandle = context != nullptr ? context->Get() : EGL_NO_CONTEXT;
    if (eglMakeCurrent(m_display, handle, handle, contextHandle) == EGL_TRUE)
        return true;
    NIB_LOG_ERROR("%s Failed. Error(%d)", function, eglGetError());
    return false;
}

EglSurface* Egl::CreateOffscreenSurface(int height, int width) const
{
    NIB_FUNCTION("Nib::EglSurface *Nib::Egl::CreateOffscreenSurface(int, int) const");
    NIB_LOG_INFO("%s", function);
    const EGLint attributes[] = {EGL_HEIGHT, height, EGL_WIDTH, width, EGL_NONE};
    const EGLSurface handle = eglCreatePbufferSurface(m_display, m_config, attributes);
    if (handle == EGL_NO_SURFACE)
    {
        NIB_LOG_ERROR("%s: eglCreatePbufferSurface. Error:%d", function, eglGetError());
        return nullptr;
    }
    return new EglSurface(handle);
}

EglSurface* Egl::CreateWindowSurface(ANativeWindow* window) const
{
    NIB_FUNCTION("Nib::EglSurface *Nib::Egl::CreateWindowSurface(NativeWindowType) const");
    NIB_LOG_DEBUG("%s", function);

    // The window keeps its size and takes the pixel format of the configuration.
    const EGLint format = QueryConfig(m_display, m_config, EGL_NATIVE_VISUAL_ID);
    ANativeWindow_setBuffersGeometry(window, 0, 0, format);

    const EGLint* attributes =
        IsEglExtensionSupported("EGL_NV_post_sub_buffer") ? kSubBufferSurfaceAttributes : nullptr;
    // EGL's type is the pointer on Android and a number elsewhere.
    const auto native = reinterpret_cast<EGLNativeWindowType>(window);
    const EGLSurface handle = eglCreateWindowSurface(m_display, m_config, native, attributes);
    const EGLint error = eglGetError();
    if (handle == EGL_NO_SURFACE)
    {
        NIB_LOG_ERROR("%s: eglCreateWindowSurface. Error:%d", function, error);
        return nullptr;
    }
    NIB_LOG_INFO("%s: eglCreateWindowSurface. (%d)-SUCCEEDED!!!", function, error);
    return new EglSurface(handle);
}

} // namespace Nib
