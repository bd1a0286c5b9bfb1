#ifndef NIB_BASE_H
#define NIB_BASE_H

/// @file
/// The base library: threads, locks, atomic counters, files, rectangles and what is known about
/// the device. Everything here may be used from any thread; one object is shared between threads
/// only where its class says so.

#include <nib/export.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>

#include <pthread.h>

/// @cond
// Clang's thread-safety attributes: with -Wthread-safety the compiler checks that locks are left
// by whoever entered them. Nothing under other compilers.
#if defined(__clang__)
#define NIB_LOCK_ATTRIBUTE(x) __attribute__((x))
#else
#define NIB_LOCK_ATTRIBUTE(x)
#endif
/// @endcond

namespace Nib
{

// ---- threads and locks --------------------------------------------------------------------------

/// An operating-system thread that runs one procedure.
///
/// Owner    the caller; one thread at a time calls start(), join() and the destructor.
/// Failure  start() returns false; nothing throws.
class NIB_EXPORT Thread
{
public:
    /// The nice value: -20 (most urgent) to 19. The new thread asks for it itself and goes on with
    /// the inherited one where the system refuses (on Linux, below 0 for ordinary users).
    using ThreadPriority = int;

    /// What a thread runs.
    using Procedure = void (*)(void* argument);

    /// As wide as pthread_t; 0 is never the handle of a thread.
    using Handle = std::intptr_t;

    /// Starts nothing. @p name is kept, not copied; the system shows its first 15 bytes. Null
    /// leaves the inherited name.
    Thread(Procedure procedure, void* argument, const char* name, ThreadPriority priority) noexcept;

    /// Joins a thread that was started and not joined.
    ~Thread();

    Thread(const Thread&) = delete;
    Thread& operator=(const Thread&) = delete;

    /// Whether the thread now runs. False when the system refused one more thread, and on an object
    /// whose thread runs already.
    bool start() noexcept;

    /// Waits until the procedure has returned. At once when nothing was started.
    void join() noexcept;

    /// The handle of the calling thread.
    static Handle self() noexcept;

private:
    static void* Run(void* thread);

    Procedure m_procedure;
    void* m_argument;
    const char* m_name;
    ThreadPriority m_priority;
    pthread_t m_thread{};
    bool m_started = false;
};

/// The system's number of the calling thread (what `ps -L` shows); never 0.
NIB_EXPORT std::uint64_t GetNibCurrentThreadId() noexcept;

/// A lock for one thread at a time.
///
/// Static objects are ready before any code runs and stay usable until the process has ended.
class NIB_EXPORT NIB_LOCK_ATTRIBUTE(capability("mutex")) CriticalSection
{
public:
    /// With @p reentrant its owner may enter it again, and leaves it as often. Without, entering it
    /// twice on one thread never returns.
    constexpr explicit CriticalSection(bool reentrant = true) noexcept
        : m_mutex(reentrant ? pthread_mutex_t(PTHREAD_RECURSIVE_MUTEX_INITIALIZER_NP)
                            : pthread_mutex_t(PTHREAD_MUTEX_INITIALIZER))
    {
    }

    CriticalSection(const CriticalSection&) = delete;
    CriticalSection& operator=(const CriticalSection&) = delete;

    /// Waits, without time-out, until the lock is free, and takes it.
    void Enter() noexcept NIB_LOCK_ATTRIBUTE(acquire_capability());

    /// Frees the lock. Only its owner may call.
    void Leave() noexcept NIB_LOCK_ATTRIBUTE(release_capability());

private:
    pthread_mutex_t m_mutex;
};

/// Holds a critical section for as long as it lives.
class NIB_EXPORT NIB_LOCK_ATTRIBUTE(scoped_lockable) AutoCriticalSection
{
public:
    explicit AutoCriticalSection(CriticalSection& section) noexcept
        NIB_LOCK_ATTRIBUTE(acquire_capability(section))
        : AutoCriticalSection(section, nullptr, 0)
    {
    }

    explicit AutoCriticalSection(CriticalSection* section) noexcept
        NIB_LOCK_ATTRIBUTE(acquire_capability(section))
        : AutoCriticalSection(*section, nullptr, 0)
    {
    }

    /// @p function and @p line say in a debugger who holds the lock; @p function is kept, not
    /// copied.
    AutoCriticalSection(CriticalSection& section, const char* function, int line) noexcept
        NIB_LOCK_ATTRIBUTE(acquire_capability(section))
        : m_section(section), m_function(function), m_line(line)
    {
        m_section.Enter();
    }

    ~AutoCriticalSection() NIB_LOCK_ATTRIBUTE(release_capability()) { m_section.Leave(); }

    AutoCriticalSection(const AutoCriticalSection&) = delete;
    AutoCriticalSection& operator=(const AutoCriticalSection&) = delete;

    /// The label, or null.
    const char* GetFunction() const noexcept { return m_function; }

    /// The label's line, or 0.
    int GetLine() const noexcept { return m_line; }

private:
    CriticalSection& m_section;
    const char* m_function;
    int m_line;
};

/// A condition that threads wait for, in the order in which they came.
///
/// A wait ends only by a signal that came after it began, or at its time-out: never for no reason.
/// A caller that enters its wait before the other side can signal therefore needs no loop. Signals
/// that find nobody waiting are lost.
class NIB_EXPORT ConditionalVariable
{
public:
    constexpr ConditionalVariable() noexcept = default;

    ConditionalVariable(const ConditionalVariable&) = delete;
    ConditionalVariable& operator=(const ConditionalVariable&) = delete;

    /// Leaves @p section, waits, enters it again. The caller has entered it exactly once.
    /// @p milliseconds below 0 waits without time-out, 0 only looks. False at the time-out.
    bool Wait(CriticalSection* section, int milliseconds) noexcept
        NIB_LOCK_ATTRIBUTE(requires_capability(section));

    /// Ends the oldest wait. May be called with or without the waiters' critical section.
    void Signal() noexcept;

    /// Ends all waits that have begun.
    void SignalAll() noexcept;

private:
    struct Waiter;

    void Append(Waiter* waiter) noexcept;
    bool GiveUp(Waiter* waiter) noexcept;
    void Unlink(Waiter* waiter) noexcept;

    pthread_mutex_t m_guard = PTHREAD_MUTEX_INITIALIZER;
    Waiter* m_first = nullptr;
    Waiter* m_last = nullptr;
};

// ---- atomic counters and pointers ---------------------------------------------------------------
// All of them are ordered both ways: what a thread wrote before one is visible to every thread that
// reads its result.

/// Adds one and returns the new value.
inline std::int32_t InterlockedIncrement(volatile std::int32_t* value) noexcept
{
    return __atomic_add_fetch(value, 1, __ATOMIC_SEQ_CST);
}

/// Subtracts one and returns the new value.
inline std::int32_t InterlockedDecrement(volatile std::int32_t* value) noexcept
{
    return __atomic_sub_fetch(value, 1, __ATOMIC_SEQ_CST);
}

/// Stores @p value and returns the old one.
inline void* InterlockedExchangePointer(void* volatile* target, void* value) noexcept
{
    return __atomic_exchange_n(target, value, __ATOMIC_SEQ_CST);
}

/// Adds one and returns the new value.
inline std::int32_t InterlockedIncrement(std::atomic<std::int32_t>* value) noexcept
{
    return value->fetch_add(1, std::memory_order_seq_cst) + 1;
}

/// Subtracts one and returns the new value.
inline std::int32_t InterlockedDecrement(std::atomic<std::int32_t>* value) noexcept
{
    return value->fetch_sub(1, std::memory_order_seq_cst) - 1;
}

/// Stores @p value and returns the old one.
template <typename T>
T* InterlockedExchangePointer(std::atomic<T*>* target, T* value) noexcept
{
    return target->exchange(value, std::memory_order_seq_cst);
}

// ---- text, files, folders -----------------------------------------------------------------------

/// A text that owns its bytes.
class NIB_EXPORT String
{
public:
    String() = default;
    explicit String(const char* text) { Construct(text); } ///< as Construct

    /// Takes a copy of @p text. False for null, which leaves an empty text.
    bool Construct(const char* text);

    /// Ends with NUL; never null; lives until the text changes.
    const char* Get() const noexcept { return m_text.c_str(); }

    /// In bytes.
    std::size_t GetLength() const noexcept { return m_text.size(); }

    bool IsEmpty() const noexcept { return m_text.empty(); } ///< whether it has no characters

    friend bool operator==(const String& a, const String& b)
    {
        return a.m_text == b.m_text;
    } ///< by their characters
    friend bool operator!=(const String& a, const String& b)
    {
        return a.m_text != b.m_text;
    } ///< by their characters

private:
    std::string m_text;
};

/// An open file, without a buffer of its own: what Write() counts, the system has taken.
///
/// Threads  one at a time.
/// Failure  a short count, false or -1, and errno.
class NIB_EXPORT File
{
public:
    File() noexcept = default;

    /// Closes.
    ~File();

    File(const File&) = delete;
    File& operator=(const File&) = delete;

    /// Opens @p path as fopen() does for @p mode: "r", "w" or "a", with "+", "b", "x" or "e" behind
    /// it, and two letters of its own: "n" refuses (ELOOP) a path whose last part is a symbolic
    /// link and does not wait for the other end of a pipe, "p" makes a new file for this user alone (0600). The file is never inherited by a
    /// program that the process starts. A file that this object had open is closed. @p
    /// createParents makes the missing folders of the path first.
    bool Construct(const String* path, const char* mode, bool createParents);

    /// As above, for the file @p name of the open folder whose descriptor is @p folder.
    bool ConstructIn(int folder, const char* name, const char* mode);

    /// Reads up to @p count items of @p size bytes and returns how many came complete.
    std::size_t Read(void* buffer, std::size_t size, std::size_t count);

    /// Reads up to @p size bytes in one system call, which may bring fewer before the end of the file
    /// too. Returns how many; 0 at the end, and on a failure.
    std::size_t ReadSome(void* buffer, std::size_t size);

    /// Writes @p count items of @p size bytes and returns how many the system took complete.
    std::size_t Write(const void* buffer, std::size_t size, std::size_t count);

    /// 0, or -1 where the system reports a late failure; closed in either case. 0 when not open.
    int Close();

    /// 0 when the process may use @p path in the way of @p mode, as access() takes it (0: exists).
    static int IsAccessible(const char* path, int mode);

    /// Removes a file; 0, or -1 on failure.
    static int Unlink(const String* path);
    /// As above, for a path.
    static int Unlink(const char* path);

private:
    int m_descriptor = -1;
};

/// Folders.
class NIB_EXPORT Directory
{
public:
    /// Makes one folder, for this user alone; its parent must exist. 0, or -1 on failure (also when
    /// it exists already) and errno.
    static int MakeDirectory(const char* path);
};

// ---- rectangles ---------------------------------------------------------------------------------

struct Rect;

/// A rectangle in pixels, not necessarily whole ones. y grows downward unless said otherwise; right
/// and bottom are outside.
struct NIB_EXPORT RectF
{
    float left = 0;   ///< the smaller x
    float top = 0;    ///< the smaller y
    float right = 0;  ///< the larger x, not within
    float bottom = 0; ///< the larger y, not within

    constexpr RectF() noexcept = default;
    /// The four edges: left, top, right, bottom.
    constexpr RectF(float l, float t, float r, float b) noexcept
        : left(l), top(t), right(r), bottom(b)
    {
    }

    constexpr float Width() const noexcept
    {
        return right - left;
    } ///< negative where the edges are swapped
    constexpr float Height() const noexcept
    {
        return bottom - top;
    } ///< negative where the edges are swapped
    constexpr bool IsEmpty() const noexcept
    {
        return left >= right || top >= bottom;
    } ///< without area

    void Set(float l, float t, float r, float b) noexcept; ///< left, top, right, bottom

    /// Clips this to @p other and returns true, or returns false and changes nothing when they have
    /// no area in common.
    bool Intersect(const RectF& other) noexcept;

    /// Grows this to the bounding box of both. An empty @p other changes nothing; an empty receiver
    /// becomes @p other.
    void Union(const RectF& other) noexcept;

    /// Extends the rectangle so far that it includes the point; also a rectangle without area.
    void MakeRect(float x, float y) noexcept;

    /// Rounds outward to whole pixels.
    void ExtendRect() noexcept;
};

/// Equal in all four edges.
constexpr bool operator==(const RectF& a, const RectF& b) noexcept
{
    return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
}

/// Different in an edge.
constexpr bool operator!=(const RectF& a, const RectF& b) noexcept
{
    return !(a == b);
}

/// A rectangle in whole pixels; right and bottom are outside.
struct NIB_EXPORT Rect
{
    int left = 0;   ///< the smaller x
    int top = 0;    ///< the smaller y
    int right = 0;  ///< the larger x, not within
    int bottom = 0; ///< the larger y, not within

    constexpr Rect() noexcept = default;
    constexpr Rect(int l, int t, int r, int b) noexcept
        : left(l), top(t), right(r), bottom(b) {} ///< left, top, right, bottom

    constexpr int Width() const noexcept
    {
        return right - left;
    } ///< negative where the edges are swapped
    constexpr int Height() const noexcept
    {
        return bottom - top;
    } ///< negative where the edges are swapped
    constexpr bool IsEmpty() const noexcept
    {
        return left >= right || top >= bottom;
    } ///< without area

    void Set(int l, int t, int r, int b) noexcept; ///< left, top, right, bottom

    /// Truncates towards zero. What no int can hold becomes the nearest one that can, and what is
    /// not a number becomes 0.
    Rect& operator=(const RectF& other) noexcept;
};

/// Equal in all four edges.
constexpr bool operator==(const Rect& a, const Rect& b) noexcept
{
    return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
}

/// Different in an edge.
constexpr bool operator!=(const Rect& a, const Rect& b) noexcept
{
    return !(a == b);
}

// ---- the device ---------------------------------------------------------------------------------

/// What the library goes by. An application may set each value, before the library first asks for
/// it; the defaults are read once, at the first use of any operation here.
///
/// On Android they are the device's. On Linux the environment gives them:
///     NIB_SDK_VERSION   a number; 34 when unset
///     NIB_BUILD_TYPE    "eng" turns engineering mode on
///     NIB_CACHE_DIR     else $XDG_CACHE_HOME/nib/sdk, else $HOME/.cache/nib/sdk, else none
///     NIB_DESKTOP       "0" turns the desktop fallbacks off; on when unset
class NIB_EXPORT System
{
public:
    /// The Android API level. Behaviour differs below 29 and from 29 on.
    static int GetSDKVersion();
    /// Sets what GetSDKVersion answers from now on.
    static void SetSDKVersion(int version);

    /// Whether debugging aids are on.
    static bool IsBuildTypeEngMode();
    /// Sets what IsBuildTypeEngMode answers from now on.
    static void SetBuildTypeEngMode(bool on);

    /// The folder beside which the binary shader cache is kept, or null: no cache on disk. The text
    /// lives until the process ends. The missing parents of a default one are made by this call.
    static const char* GetSDKCacheDirectoryPath();

    /// Takes a copy of @p path; null for none.
    static void SetSDKCacheDirectoryPath(const char* path);

    /// Whether configurations that desktop drivers lack are replaced by the nearest they have.
    /// Asked for when the EGL display is first used.
    static bool GetDesktopFallbacks();
    /// Sets what GetDesktopFallbacks answers; before the first use of Egl.
    static void SetDesktopFallbacks(bool on);
};

} // namespace Nib

#undef NIB_LOCK_ATTRIBUTE

#endif
