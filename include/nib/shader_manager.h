#ifndef NIB_SHADER_MANAGER_H
#define NIB_SHADER_MANAGER_H

/// @file
/// The process-wide registry of named shader programs.

#include <nib/base.h>
#include <nib/export.h>

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>

namespace Nib
{

class IGLMsgQueue;

/// Shader programs by name and context, so that one name may stand for one program in each context.
///
/// The drawing code adds its programs on their render thread and removes them when done. Render
/// threads tell the registry when a context goes and when the next one has come: entries of the
/// dead context then move to the new one, so that look-ups by name go on working.
///
/// Owner    the library; the one instance lives from its load to the exit of the process.
/// Threads  registration from any thread; the three context operations from the render thread that
///          the context belongs to.
/// Failure  nothing throws. Entries left behind are reported in the log.
class NIB_EXPORT ShaderManager
{
public:
    /// A program's name and the context that it belongs to.
    struct NIB_EXPORT Key
    {
        /// Copies @p name and takes the context that is current on the calling thread.
        Key(const char* name);

        /// By name, byte for byte, then by the context's address.
        bool operator<(const Key& other) const;

        std::string name; ///< of the program
        void* context;    ///< as IContextHolder::GetCurrentContextId gives it
    };

    /// What is registered under a key; the registry never looks inside.
    struct Entry
    {
        void* program = nullptr; ///< not owned
        uint32_t useCount = 0;   ///< of its users
    };

    /// The one registry; made by the first call.
    static ShaderManager* GetInstance();

    ShaderManager(const ShaderManager&) = delete;
    ShaderManager& operator=(const ShaderManager&) = delete;
    ~ShaderManager(); ///< reports every entry that is left

    /// Just before the calling thread's context is destroyed: remembers it for the thread's queue.
    void OnDestroyContext();
    /// Just after a new context was made current: moves the entries of the queue's dead context.
    void OnRestoreContext();
    /// As the calling thread ends: reports the entries of the context that is then current.
    void CheckEmpty();

    void Add(const Key& key, const Entry& entry); ///< replaces an entry of the same key
    /// Whether @p key is registered; if so and @p out is not null, copies its entry there.
    bool Find(const Key& key, Entry* out);
    bool Remove(const Key& key); ///< false: there was no such entry
    /// The number of entries.
    size_t Size();

private:
    using Shaders = std::map<Key, Entry>;

    ShaderManager();

    static ShaderManager m_instance;

    bool TakeDestroyedContext(IGLMsgQueue* queue, void** context);
    Shaders TakeShadersOf(void* context);

    // Registration is serialised by the first lock. The context operations must not wait for
    // registering code, so what is really shared, the maps, has a lock of its own, held for no more
    // than a step on a map. Order: m_criticalSection, m_mapsLock.
    CriticalSection m_criticalSection;
    Shaders m_shaders;
    std::map<IGLMsgQueue*, void*> m_destroyedContexts;
    CriticalSection m_mapsLock;
};

} // namespace Nib

#endif
