#ifndef NIB_SIM_STATE_H
#define NIB_SIM_STATE_H

#include "SimDriver.h"
#include "SimGlState.h"

#include <condition_variable>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace Sim
{

struct Surface;

struct Context
{
    EGLContext handle = EGL_NO_CONTEXT;
    EGLContext share = EGL_NO_CONTEXT;
    std::shared_ptr<ShareGroup> group;
    int clientVersion = 3;
    int priority = EGL_CONTEXT_PRIORITY_MEDIUM_IMG;
    int config = -1;
    unsigned thread = 0;    // on which it is current
    bool destroyed = false; // goes when it is current nowhere
    bool wasCurrent = false;
    GlState gl;
};

struct NativeWindow
{
    int width = 0;
    int height = 0;
    int format = 0;
    int geometryCalls = 0;
    int presented = 0;
    bool abandoned = false;
    EGLSurface surface = EGL_NO_SURFACE;
    Image front;
    std::vector<long long> lastDamage;
};

struct Surface
{
    EGLSurface handle = EGL_NO_SURFACE;
    int config = -1;
    int width = 0;
    int height = 0;
    ANativeWindow* window = nullptr;             // null for a pbuffer
    unsigned thread = 0;                         // on which it is current
    bool destroyed = false;                      // goes when it is current nowhere
    EGLint renderBuffer = EGL_BACK_BUFFER;       // asked for; in effect from the next swap on
    EGLint activeRenderBuffer = EGL_BACK_BUFFER; // in effect
    EGLint swapBehavior = EGL_BUFFER_DESTROYED;
    EGLint multisampleResolve = EGL_MULTISAMPLE_RESOLVE_DEFAULT;
    bool autoRefresh = false;
    bool timestamps = false;
    bool postSubBuffer = false;
    Image back;
    std::set<std::pair<int, int>> clearedTiles; // of this frame: column, row
    std::vector<Image> frames;                  // presented ones, the newest first
    int frameCount = 0;
    int age = 0;
    bool ageQueried = false;
    bool damageSet = false;
    EGLuint64KHR nextFrameId = 1;
    std::vector<long long> presentationTimes;
};

struct EglSync
{
    bool signalled = false;
};

/// What one thread of the process has to do with EGL.
struct Thread
{
    unsigned number = 0;
    EGLint error = EGL_SUCCESS;
    std::optional<EGLenum> api;
    Context* context = nullptr;
    Surface* draw = nullptr;
    Surface* read = nullptr;
    bool quiet = false; // its calls are the test's own
};

struct Failure
{
    std::string name;
    std::optional<std::pair<std::size_t, SimValue>> when;
    unsigned error = 0;
    int times = 1;
};

/// All that a new SimDriver starts afresh.
struct StateData
{
    SimGpu gpu;
    SimSwapChain swapChain;
    bool driverAlive = false;

    bool recording = true;
    std::vector<SimCall> calls;
    std::size_t callsMade = 0;
    std::vector<SimDraw> draws;
    bool notesPictures = false;
    std::vector<SimPicture> pictures;

    std::vector<Failure> failures;
    std::size_t failAt = 0;
    unsigned failAtEglError = 0;
    unsigned failAtGlError = 0;
    std::size_t loseContextsAt = 0;
    std::map<GLenum, std::optional<std::string>> glStrings;
    int configsCounted = -1;
    int configsGiven = -1;
    EGLenum initialApi = EGL_OPENGL_ES_API;
    std::vector<std::string> compileFailures;
    std::vector<std::string> linkFailures;
    std::map<std::string, std::function<void()>> actions;
    std::set<std::string> held;
    std::map<std::string, int> blocked; // threads in a held call
    SimPace pace = SimPace::Instant;

    std::vector<std::string> misuses;
    std::vector<std::pair<std::string, std::string>> offences; // those not allowed: function, text
    bool allMisuseAllowed = false;
    std::set<std::string> allowedMisuse;
    std::set<std::string> expectedMisuse;

    std::map<std::string, std::string> properties;
    SimLibc libc = SimLibc::Complete;

    bool initialized = false;
    std::map<unsigned, Thread> threads;
    std::map<EGLContext, std::unique_ptr<Context>> contexts;
    std::map<EGLSurface, std::unique_ptr<Surface>> surfaces;
    std::map<EGLSyncKHR, EglSync> eglSyncs;
    std::map<ANativeWindow*, std::unique_ptr<NativeWindow>> windows;
    std::map<EGLint, EGLnsecsANDROID> frameTimes;
    std::map<EGLint, EGLnsecsANDROID> compositorTimes;
    std::set<EGLint> refusedTimings;
    SimCounts lost;
    std::map<std::string, std::string> strings; // texts that were given out as pointers
};

/// The state of the simulated process. Never destroyed: singletons of the code under test still
/// make calls when the process ends.
struct State : StateData
{
    std::mutex mutex;
    std::condition_variable changed; // a hold, the pace, or who is blocked
    std::uintptr_t nextHandle = 0x51000;

    void Reset(SimGpu device);
    /// A handle that was never given out before, so that a stale one is always recognised.
    void* NewHandle();
    Thread& CurrentThread();
    Context* FindContext(EGLContext handle) const; // null for unknown and destroyed ones
    Surface* FindSurface(EGLSurface handle) const;
    /// A text that stays where it is until the driver's end.
    const char* Keep(const std::string& key, const std::string& text);
};

State& GetState();

unsigned ThreadNumber();

/// Calls of the calling thread are neither recorded, nor failed, nor judged while one exists.
class Quiet
{
public:
    Quiet();
    ~Quiet();
    Quiet(const Quiet&) = delete;
    Quiet& operator=(const Quiet&) = delete;
};

} // namespace Sim

#endif
