#ifndef NIB_SIM_DRIVER_H
#define NIB_SIM_DRIVER_H

#include "SimCall.h"
#include "SimGpu.h"
#include "SimObjects.h"
#include "SimSwapChain.h"

#include <android/log.h>
#include <android/native_window.h>
#include <EGL/egl.h>
#include <EGL/eglext.h>
#include <GLES3/gl3.h>

#include <functional>
#include <initializer_list>
#include <optional>
#include <string>
#include <vector>

/// A line that went to the Android log.
struct SimLogLine
{
    int priority = 0; ///< ANDROID_LOG_DEBUG and so on; an assertion has ANDROID_LOG_FATAL
    std::string tag;
    std::string text;
    unsigned thread = 0;
};

std::ostream& operator<<(std::ostream& out, const SimLogLine& line);

/// How far the simulated GPU gets with the commands that it was given.
enum class SimPace
{
    Instant, ///< every command is done when its call returns, so every fence is signalled at once
    OnWait,  ///< a fence is passed by the first wait for it that has a time-out above 0, or by
             ///< glFinish
    Held,    ///< nothing is done until ReleaseGpu(): waits with a time-out expire at once, waits
             ///< without one and glFinish block
};

/// What android_property_get finds behind "libc.so".
enum class SimLibc
{
    Complete,          ///< it opens, and has __system_property_get
    WithoutProperties, ///< it opens, and lacks __system_property_get
    Missing,           ///< it does not open
};

/// The simulated EGL and GL driver: what libEGL, libGLESv2, the log and the system properties are
/// to the code under test. One at a time a process; constructing it starts from nothing, with the
/// given device.
///
/// Threads  any operation may be called from any thread, and calls are recorded from every thread.
/// Misuse   a GL or EGL call that breaks a rule (no current context, a name that was not generated
/// in this
///          share group, an error that a correct program never causes) fails the test when the
///          driver is destroyed, unless the test says AllowMisuse or ExpectMisuse. Injected
///          failures, and refusals of what the device lacks, are no misuse.
class SimDriver
{
public:
    static constexpr int kAlways = -1; ///< as the number of times of a failure

    explicit SimDriver(SimGpu gpu = SimGpu::Default());
    ~SimDriver();
    SimDriver(const SimDriver&) = delete;
    SimDriver& operator=(const SimDriver&) = delete;

    const SimGpu& Gpu() const;

    // ---- recorded calls
    // -------------------------------------------------------------------------------
    /// Forgets the calls so far; the count for FailAt starts again at 1.
    void ForgetCalls();
    /// Switches recording off or on, for loops of many calls.
    void RecordCalls(bool on);
    std::vector<SimCall> Calls() const;
    std::vector<SimCall> Calls(const char* name) const;
    std::vector<SimCall> Calls(std::initializer_list<const char*> names) const;
    std::vector<std::string> CallNames() const;
    /// The calls as text: "glScissor(0, 0, 8, 8)".
    std::vector<std::string> CallTexts() const;
    std::size_t CallCount() const;
    std::size_t CallCount(const char* name) const;
    /// The last call of that name; an empty call, with a test failure, where there is none.
    SimCall LastCall(const char* name) const;
    /// The number of threads that made the recorded calls.
    unsigned CallingThreads() const;
    /// The number of the calling thread, as it stands in SimCall::thread and SimLogLine::thread.
    static unsigned ThisThread();

    // ---- failures
    // -------------------------------------------------------------------------------------
    /// The next @p times calls of @p name do nothing and fail with @p error: an EGL error for EGL
    /// functions, a GL error (GL_NO_ERROR for none) for GL functions, whose glGen* give 0 and
    /// glGetString null. glCheckFramebufferStatus answers @p error itself; a failed log, window or
    /// system call returns -1.
    void FailNext(const char* name, unsigned error, int times = 1);
    /// As FailNext, for calls whose argument @p index is @p value: an attribute of eglQuerySurface,
    /// a name asked of eglGetProcAddress.
    void FailWhen(const char* name, std::size_t index, const SimValue& value, unsigned error,
                  int times = 1);
    /// Refuses the call number @p n (from 1) since ForgetCalls or the start, whatever it is.
    void FailAt(std::size_t n, unsigned eglError = EGL_BAD_ALLOC,
                unsigned glError = GL_OUT_OF_MEMORY);
    /// All contexts that exist at the call number @p n are lost, as after a reset of the GPU: GL
    /// calls do nothing, they cannot become current, their surfaces cannot be presented, and what
    /// shares with them is lost, too.
    void LoseContextsAt(std::size_t n);
    /// Calls since ForgetCalls or the start, counted also while recording is off.
    std::size_t CallsMade() const;
    /// Takes back all failures that have not happened yet.
    void ForgetFailures();
    /// The calling thread's context has these errors pending, the first one first.
    void QueueGlErrors(std::initializer_list<GLenum> errors);
    /// glGetString(name) gives this text; std::nullopt for null.
    void SetGlString(GLenum name, std::optional<std::string> text);
    /// eglChooseConfig without an array counts @p counted, with an array gives at most @p given; -1
    /// as usual.
    void SetConfigCounts(int counted, int given);
    /// eglQueryAPI answers this on threads that bound nothing (EGL_OPENGL_ES_API otherwise).
    void SetInitialApi(EGLenum api);
    /// The driver has this to say, inside a call of the calling thread (GL_KHR_debug).
    /// @return whether the thread's context wanted to know; its callback has then returned
    bool SendDebugMessage(GLenum source, GLenum type, GLuint id, GLenum severity,
                          const std::string& text);
    /// The next compilation or link fails with this info log. Sources that hold "#error text"
    /// always fail.
    void FailCompile(std::string log);
    void FailLink(std::string log);

    /// Runs @p action on the calling thread before each call of @p name is carried out; an empty
    /// one ends it.
    void OnCall(const char* name, std::function<void()> action);
    /// Calls of @p name block from now on, until Release(@p name) or the end of the driver.
    void Hold(const char* name);
    void Release(const char* name);
    /// Waits until a thread is blocked in a call of @p name, held or waiting for the GPU.
    void WaitUntilHeld(const char* name);

    void SetPace(SimPace pace);
    /// All work given to the GPU so far is done, and its pace is SimPace::Instant again.
    void ReleaseGpu();

    // ---- misuse
    // ---------------------------------------------------------------------------------------
    /// Breaches of rules in calls of @p name (of any function when null) are no failure from now
    /// on.
    void AllowMisuse(const char* name = nullptr);
    /// As AllowMisuse, and the test fails when there was none.
    void ExpectMisuse(const char* name);
    /// The breaches so far, allowed ones included: "glBindTexture: name 7 was not generated here".
    std::vector<std::string> Misuses() const;
    void ForgetMisuses();

    // ---- the log
    // --------------------------------------------------------------------------------------
    std::vector<SimLogLine> Log() const;
    /// The texts of all lines of @p priority, in order.
    std::vector<std::string> LogTexts(int priority) const;
    bool HasLog(int priority, const std::string& text) const;
    std::size_t CountLog(int priority, const std::string& text) const;
    /// Lines of any priority whose text contains @p part.
    std::size_t CountLogContaining(const std::string& part) const;
    void ForgetLog();
    /// Log lines are written to standard error too, for looking at a failing test.
    void PrintLog(bool on);

    // ---- the system
    // -----------------------------------------------------------------------------------
    void SetProperty(const std::string& name, const std::string& value);
    void RemoveProperty(const std::string& name);
    void SetLibc(SimLibc libc);

    // ---- windows
    // --------------------------------------------------------------------------------------
    /// A new window of this size. It lives as long as the driver.
    ANativeWindow* Window(int width, int height);
    /// How the buffers behave of surfaces that are made from now on.
    void SetSwapChain(const SimSwapChain& chain);
    void ResizeWindow(ANativeWindow* window, int width, int height);
    /// From now on no surface can be made for this window, and swaps to it fail with
    /// EGL_BAD_NATIVE_WINDOW.
    void AbandonWindow(ANativeWindow* window);
    SimWindowState WindowState(ANativeWindow* window) const;
    /// The pixel that the user sees at (x, y) of the window, y counted from the bottom as in GL.
    SimPixel FrontPixel(ANativeWindow* window, int x, int y) const;
    /// All pixels that the user sees, row by row, the bottom row first.
    std::vector<SimPixel> FrontPixels(ANativeWindow* window) const;
    /// The pixel of the buffer that is drawn to.
    SimPixel BackPixel(ANativeWindow* window, int x, int y) const;
    /// The times that EGL_ANDROID_get_frame_timestamps reports; a name without a value is pending.
    void SetFrameTime(EGLint name, EGLnsecsANDROID value);
    void SetCompositorTime(EGLint name, EGLnsecsANDROID value);
    /// The windows do not report this timestamp or compositor time.
    void RefuseTiming(EGLint name);

    // ---- objects
    // --------------------------------------------------------------------------------------
    /// What lives now, in all share groups.
    SimCounts Live() const;
    /// What was still alive when the last context of its share group, or its own context, was
    /// destroyed.
    SimCounts LostWithContext() const;
    /// Objects of the calling thread's share group (of the only one that has the name, without a
    /// context). A name that is not known gives an object with `exists` false.
    SimTextureState Texture(GLuint name) const;
    SimBufferState Buffer(GLuint name) const;
    SimSamplerState Sampler(GLuint name) const;
    SimRenderbufferState Renderbuffer(GLuint name) const;
    SimFramebufferState Framebuffer(GLuint name) const;
    SimProgramState Program(GLuint name) const;
    SimContextState Context(EGLContext context) const;
    SimSurfaceState Surface(EGLSurface surface) const;
    /// Contexts that were created and not destroyed, oldest first.
    std::vector<EGLContext> Contexts() const;
    std::vector<EGLSurface> Surfaces() const;
    /// Draw calls with their attributes, since the start or ForgetCalls.
    std::vector<SimDraw> Draws() const;

    // ---- pictures
    // -----------------------------------------------------------------------------------
    /// Switches off or on that images keep account of the draws into them.
    void NotePictures(bool on);
    /// What was presented and read back since, in order.
    std::vector<SimPicture> Pictures() const;
};

/// A context that a test makes for itself, current on the calling thread on a 1 x 1 pbuffer. Its
/// making and ending are not recorded. Ended on the thread on which it is current.
class SimContext
{
public:
    explicit SimContext(SimDriver& driver, int clientVersion = 3);
    /// Shares objects with @p other. Becomes current on the calling thread, in place of the one
    /// that was.
    SimContext(SimDriver& driver, const SimContext& other, int clientVersion = 3);
    ~SimContext();
    SimContext(const SimContext&) = delete;
    SimContext& operator=(const SimContext&) = delete;

    void MakeCurrent();
    /// Nothing is current on the calling thread afterwards.
    void Release();
    EGLContext Handle() const { return m_context; }

private:
    SimContext(EGLContext share, int clientVersion);

    EGLContext m_context = EGL_NO_CONTEXT;
    EGLSurface m_surface = EGL_NO_SURFACE;
};

#endif
