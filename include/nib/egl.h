#ifndef NIB_EGL_H
#define NIB_EGL_H

/// @file
/// The EGL display of the process, and owners of EGL contexts and surfaces.

#include <nib/export.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>

#include <atomic>
#include <cstdint>

struct ANativeWindow;

namespace Nib
{

class EglContext;
class EglSurface;

/// The default EGL display, its two configurations, and the operations of a display that need them.
///
/// Owner    the process: made by the first GetInstance(), never deleted by the library.
/// Threads  GetInstance() from any thread. All other operations take no lock: what they read was
///          written before the instance was published. MakeCurrent() acts on the calling thread.
/// Failure  false or null, and an ERROR line with the EGL error code. Nothing throws. A failed
///          initialisation is not repeated; everything that follows then fails in EGL.
///
/// Linux drivers lack some of what devices have. With System::SetDesktopFallbacks on, a display
/// without a configuration for windows and pbuffers gets one for pbuffers alone, and a display
/// without a front-buffer configuration answers the ordinary one; each writes one INFO line.
class NIB_EXPORT Egl
{
public:
    /// The instance, never null: made and initialised by the first call, on whichever thread. Ask
    /// GetEglStatus() or GetConfig() whether the initialisation succeeded.
    static Egl* GetInstance();

    /// The result of the initialisation: 0 initialised, 1 eglInitialize failed with
    /// EGL_NOT_INITIALIZED, 2 it failed otherwise. Makes the instance when there is none.
    static int GetEglStatus();

    Egl(const Egl&) = delete;
    Egl& operator=(const Egl&) = delete;
    ~Egl(); ///< Terminates the display. The library itself never deletes the instance.

    /// Opens the display again and chooses the configurations, as GetInstance() did.
    /// @return whether an ordinary configuration was found
    bool Init();

    /// Opens the default display and binds the OpenGL ES API.
    bool InitializeAPI();

    /// Chooses among the configurations that match GetConfigAttributes(): exactly 8 bits for each
    /// of red, green, blue and alpha, then the fewest depth and stencil bits, then EGL's own order.
    /// @param out receives the choice; untouched when there is none
    bool FindConfig(bool frontBuffer, EGLConfig* out);

    /// The list, ended by EGL_NONE, that configurations must match. Static storage. Null for a
    /// front buffer on a display without EGL_KHR_mutable_render_buffer.
    const EGLint* GetConfigAttributes(bool frontBuffer) const;

    /// The configuration chosen at start, null when none was found.
    EGLConfig GetConfig(bool frontBuffer) const;

    /// Whether the display has a front-buffer configuration of its own, so that GetConfig(true)
    /// does not stand for the ordinary one.
    bool HasFrontBufferConfig() const;

    EGLDisplay GetDisplay() const; ///< null after a failed initialisation

    /// The display's extensions, asked for afresh; "" when EGL has no answer. Owned by EGL.
    const char* GetEglExtensions() const;

    /// Whether @p name occurs in GetEglExtensions(). A plain substring counts, also one that is
    /// only the beginning of a longer name.
    bool IsEglExtensionSupported(const char* name) const;

    /// Makes @p context current on the calling thread, to draw to and read from @p surface. Null
    /// for both releases what is current.
    bool MakeCurrent(const EglContext* context, const EglSurface* surface) const;

    /// Makes a pbuffer with the ordinary configuration. Note the order: the height comes first.
    /// @return a surface that the caller deletes, or null
    EglSurface* CreateOffscreenSurface(int height, int width) const;

    /// Makes a surface for @p window (borrowed; it must outlive the surface) with the ordinary
    /// configuration, whose pixel format the window takes.
    /// @return a surface that the caller deletes, or null
    EglSurface* CreateWindowSurface(ANativeWindow* window) const;

private:
    Egl();

    bool ChooseMatching(const EGLint* attributes, int total, EGLConfig* out) const;

    EGLDisplay m_display;
    EGLConfig m_config;
    EGLConfig m_frontBufferConfig;
    std::int32_t m_status;
    bool m_ordinaryForFrontBuffer; // a desktop fallback
};

/// Owns one EGL context. Belongs to one render thread, which alone makes, uses and destroys it.
class NIB_EXPORT EglContext
{
public:
    /// The values are those of EGL_IMG_context_priority and go to EGL unchanged.
    enum class Priority : int
    {
        High = 0x3101,
        Medium = 0x3102,
        Low = 0x3103,
    };

    EglContext() = default;
    EglContext(const EglContext&) = delete;
    EglContext& operator=(const EglContext&) = delete;
    ~EglContext(); ///< the steps of Destroy()

    /// Makes the context. Call it only on an empty object: a handle that is held is overwritten.
    /// @param shareContext      shares its objects and decides the client version; null: version 3
    /// @param enableFrontBuffer whether to use the front-buffer configuration
    /// @param priority          ignored on displays without EGL_IMG_context_priority
    /// @return false, with an ERROR line, when there is no configuration or EGL refuses
    bool Create(const EGLContext shareContext, bool enableFrontBuffer, Priority priority);

    void Destroy(); ///< Empties the object; one that is empty stays so.

    EGLContext Get() const; ///< null while empty

private:
    EGLContext m_context = EGL_NO_CONTEXT;
};

/// The root context of the process: every surface render thread shares its objects with it. It is
/// never made current by the library.
class NIB_EXPORT SharedContext
{
public:
    /// The context, never null, made by the first call on whichever thread and destroyed when the
    /// library is unloaded. Its handle is null when EGL refused; that is not tried again.
    static EglContext* GetInstance();
};

/// Owns one EGL surface. Belongs to one render thread.
class NIB_EXPORT EglSurface
{
public:
    explicit EglSurface(EGLSurface handle); ///< takes the handle over
    EglSurface(const EglSurface&) = delete;
    EglSurface& operator=(const EglSurface&) = delete;
    ~EglSurface(); ///< the steps of Destroy()

    void Destroy();         ///< Destroys the surface, once.
    EGLSurface Get() const; ///< null once destroyed
    bool IsCreated() const; ///< whether a handle is held

    /// Sets an EGL surface attribute. False, with an ERROR line, when EGL refuses.
    bool SetAttribute(int attribute, int value);

    /// Reads an EGL surface attribute.
    /// @param value receives it; may be null; untouched on failure
    bool QueryAttribute(int attribute, int* value) const;

    bool SwapBuffers() const; ///< Presents the back buffer. False, with an ERROR line, on failure.
    int GetWidth() const;     ///< in pixels; -1, with ERROR lines, on failure
    int GetHeight() const;    ///< in pixels; -1, with ERROR lines, on failure

private:
    EGLSurface m_surface;
};

/// What a render thread keeps its context current on: a window surface while a window is attached,
/// else a pbuffer of one pixel. Make the context current again after every attach and detach.
///
//  state      Create()    AttachToWindow()           DetachFromWindow()  Destroy()
//  empty      offscreen   (not before Create)        .                   .
//  offscreen  .           attached; failed: as was   .                   empty
//  attached   .           attached; failed:          offscreen           empty
//                         offscreen
//
/// Belongs to one render thread, except IsAttachedToWindow(), which any thread may ask.
class NIB_EXPORT HybridSurface
{
public:
    HybridSurface() = default;
    HybridSurface(const HybridSurface&) = delete;
    HybridSurface& operator=(const HybridSurface&) = delete;
    ~HybridSurface(); ///< the steps of Destroy()

    /// Makes the pbuffer. Call it only on an empty object. False, with an ERROR line, on failure.
    bool Create();

    /// Makes a surface for @p window (borrowed), in place of that of an earlier window. On failure
    /// no window is attached.
    bool AttachToWindow(ANativeWindow* window);

    bool DetachFromWindow(); ///< Destroys the window surface, if any. Always true.

    bool IsAttachedToWindow() const;      ///< whether there is a window surface
    EglSurface* GetActiveSurface() const; ///< the window surface, else the pbuffer; not given away

    int GetWidth() const;  ///< of the window surface, -1 when EGL does not tell; 1 without one
    int GetHeight() const; ///< of the window surface, -1 when EGL does not tell; 1 without one

    void Destroy(); ///< Destroys both surfaces.

private:
    EglSurface* m_offscreen = nullptr;          // owned
    std::atomic<EglSurface*> m_window{nullptr}; // owned; only its being set is read elsewhere
};

} // namespace Nib

#endif
