#include "base/Log.h"
#include "debug/CheckerLock.h"

#include <nib/base.h>
#include <nib/resource_checker.h>

#include <GLES3/gl3.h>

#include <algorithm>
#include <cstdint>
#include <optional>
#include <vector>

// How much texture memory each queue has: ResourceChecker::printInfoTexture.

namespace Nib
{

namespace
{

constexpr unsigned kUnknownFormat = static_cast<unsigned>(-1);

// Internal format -> bits a texel; a format that is not listed counts as 0.
unsigned BitsPerTexel(unsigned format)
{
    switch (format)
    {
    case GL_RGB: return 24;
    case GL_RGBA: return 32;
    case GL_R8: return 8;
    case GL_R16F: return 16;
    case GL_R32F: return 32;
    case GL_RGBA32F: return 128;
    case GL_RGB32F: return 96;
    case GL_RGBA16F: return 64;
    case GL_RGB16F: return 48;
    default: return 0;
    }
}

std::uint64_t SizeInKB(const ResourceChecker::TextureInfo& info)
{
    if (info.width == -1 || info.height == -1 || info.internalFormat == kUnknownFormat)
        return 0;
    const std::uint64_t texels =
        static_cast<std::uint64_t>(info.width) * static_cast<std::uint64_t>(info.height);
    return texels * BitsPerTexel(info.internalFormat) / ResourceChecker::BIT_TO_KB;
}

/// The queue whose textures are being counted.
class Group
{
public:
    explicit Group(const ResourceChecker::CheckerItem& first) { Restart(first); }

    bool IsOf(const IGLMsgQueue* queue) const { return m_queue == queue; }

    void Count(std::uint64_t sizeInKB)
    {
        ++m_counter;
        m_totalKB += sizeInKB;
    }

    void Log() const
    {
        NIB_LOG_INFO("Dump queue : IGLMsgQueue(Queue: %p[%s] textureCounter=%d textureSize=%lluMB)",
                     static_cast<void*>(m_queue), m_name, m_counter,
                     static_cast<unsigned long long>(m_totalKB / ResourceChecker::KB_TO_MB));
    }

    void Restart(const ResourceChecker::CheckerItem& item)
    {
        m_queue = item.queue;
        m_name = item.queueName;
        m_counter = 0;
        m_totalKB = 0;
    }

private:
    IGLMsgQueue* m_queue = nullptr;
    const char* m_name = "";
    int m_counter = 0;
    std::uint64_t m_totalKB = 0;
};

std::vector<const ResourceChecker::CheckerItem*> TexturesByQueue()
{
    std::vector<const ResourceChecker::CheckerItem*> items;
    items.reserve(ResourceChecker::textureDb.size());
    for (const ResourceChecker::CheckerItem& item : ResourceChecker::textureDb)
        items.push_back(&item);
    std::stable_sort(items.begin(), items.end(), &ResourceChecker::compareFunction);
    return items;
}

void LogTextureWithoutQueue(const ResourceChecker::CheckerItem& item,
                            const ResourceChecker::TextureInfo& info)
{
    NIB_LOG_ERROR("Dump queue : Error, Queue: NULL. Texture(context=%p id=%d tag=\"%s\" w=%d h=%d "
                  "size=%lluKB)",
                  item.context, item.id, item.tag.c_str(), info.width, info.height,
                  static_cast<unsigned long long>(SizeInKB(info)));
}

} // namespace

bool ResourceChecker::compareFunction(const CheckerItem* first, const CheckerItem* second)
{
    return reinterpret_cast<std::uintptr_t>(first->queue) <
           reinterpret_cast<std::uintptr_t>(second->queue);
}

void ResourceChecker::printInfoTexture()
{
    if (!System::IsBuildTypeEngMode())
        return;
    AutoCriticalSection lock(cs, __func__, __LINE__);
    const std::vector<const CheckerItem*> items = TexturesByQueue();
    std::optional<Group> group;
    for (const CheckerItem* item : items)
    {
        const auto* info = dynamic_cast<const TextureInfo*>(item->info.get());
        if (info == nullptr)
            continue;
        if (!group)
            group.emplace(*item);
        if (item->queue == nullptr)
        {
            LogTextureWithoutQueue(*item, *info);
            continue;
        }
        // The first texture of a queue still counts for the queue before it, whose line it ends.
        group->Count(SizeInKB(*info));
        if (item == items.back() || !group->IsOf(item->queue))
        {
            group->Log();
            group->Restart(*item);
        }
    }
}

} // namespace Nib
