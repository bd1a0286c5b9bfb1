#include <nib/shader_manager.h>

#include "base/Log.h"

#include <nib/msg_queue.h>
#include <nib/renderer_factory.h>

#include <cstring>
#include <functional>

namespace Nib
{

namespace
{

constexpr bool kReentrant = true;

void* CurrentContext()
{
    return RendererFactory::GetContextHolder()->GetCurrentContextId();
}

} // namespace

ShaderManager ShaderManager::m_instance;

ShaderManager::Key::Key(const char* text) : name(text ? text : ""), context(CurrentContext()) {}

bool ShaderManager::Key::operator<(const Key& other) const
{
    const int order = std::strcmp(name.c_str(), other.name.c_str());
    return order != 0 ? order < 0 : std::less<void*>()(context, other.context);
}

ShaderManager* ShaderManager::GetInstance()
{
    return &m_instance;
}

ShaderManager::ShaderManager() : m_criticalSection(!kReentrant), m_mapsLock(!kReentrant) {}

ShaderManager::~ShaderManager()
{
    NIB_FUNCTION("Nib::ShaderManager::~ShaderManager()");
    NIB_LOG_INFO("%s Cleanup.", function);
    for (const auto& [key, entry] : m_shaders)
        NIB_LOG_ERROR("%s RESOURCE LEAK. Shader %s is not destroyed", function, key.name.c_str());
}

// ---- context loss, on the context's render thread -----------------------------------------------

void ShaderManager::OnDestroyContext()
{
    NIB_FUNCTION("void Nib::ShaderManager::OnDestroyContext()");
    NIB_LOG_INFO("%s", function);
    IGLMsgQueue* const queue = GetCurrentMsgQueue();
    void* const context = CurrentContext();
    AutoCriticalSection guard(m_mapsLock);
    m_destroyedContexts[queue] = context;
}

void ShaderManager::OnRestoreContext()
{
    NIB_FUNCTION("void Nib::ShaderManager::OnRestoreContext()");
    NIB_LOG_INFO("%s", function);
    void* const current = Key("").context;
    void* destroyed = nullptr;
    if (!TakeDestroyedContext(GetCurrentMsgQueue(), &destroyed))
        return;
    const Shaders moved = TakeShadersOf(destroyed);
    for (const auto& [key, entry] : moved)
        NIB_LOG_INFO("%s Release(%s, %p)", function, key.name.c_str(), key.context);
    for (const auto& [oldKey, entry] : moved)
    {
        const Key key(oldKey.name.c_str());
        {
            AutoCriticalSection guard(m_mapsLock);
            m_shaders.insert_or_assign(key, entry);
        }
        NIB_LOG_INFO("%s Restore(%s, %p)", function, key.name.c_str(), current);
    }
}

bool ShaderManager::TakeDestroyedContext(IGLMsgQueue* queue, void** context)
{
    AutoCriticalSection guard(m_mapsLock);
    const auto found = m_destroyedContexts.find(queue);
    if (found == m_destroyedContexts.end())
        return false;
    *context = found->second;
    m_destroyedContexts.erase(found);
    return true;
}

ShaderManager::Shaders ShaderManager::TakeShadersOf(void* context)
{
    Shaders taken;
    AutoCriticalSection guard(m_mapsLock);
    for (auto it = m_shaders.begin(); it != m_shaders.end();)
    {
        const auto shader = it++;
        if (shader->first.context == context)
            taken.insert(m_shaders.extract(shader));
    }
    return taken;
}

void ShaderManager::CheckEmpty()
{
    NIB_FUNCTION("void Nib::ShaderManager::CheckEmpty()");
    void* const context = CurrentContext();
    Shaders shaders;
    {
        AutoCriticalSection guard(m_mapsLock);
        shaders = m_shaders;
    }
    if (shaders.empty())
    {
        NIB_LOG_INFO("%s All shaders was cleaned", function);
        return;
    }
    for (const auto& [key, entry] : shaders)
    {
        if (key.context == context)
            NIB_LOG_ERROR("%s RESOURCE LEAK. Shader %s is not destroyed", function,
                          key.name.c_str());
    }
}

// ---- registration, any thread -------------------------------------------------------------------

void ShaderManager::Add(const Key& key, const Entry& entry)
{
    AutoCriticalSection registration(m_criticalSection);
    AutoCriticalSection guard(m_mapsLock);
    m_shaders.insert_or_assign(key, entry);
}

bool ShaderManager::Find(const Key& key, Entry* out)
{
    AutoCriticalSection registration(m_criticalSection);
    AutoCriticalSection guard(m_mapsLock);
    const auto found = m_shaders.find(key);
    if (found == m_shaders.end())
        return false;
    if (out)
        *out = found->second;
    return true;
}

bool ShaderManager::Remove(const Key& key)
{
    AutoCriticalSection registration(m_criticalSection);
    AutoCriticalSection guard(m_mapsLock);
    return m_shaders.erase(key) != 0;
}

size_t ShaderManager::Size()
{
    AutoCriticalSection registration(m_criticalSection);
    AutoCriticalSection guard(m_mapsLock);
    return m_shaders.size();
}

} // namespace Nib
