#include "base/Log.h"
#include "debug/CheckerLock.h"
#include "device/GlDebugOutput.h"

#include <nib/base.h>
#include <nib/msg_queue.h>
#include <nib/resource_checker.h>

#include <EGL/egl.h>

#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <utility>

namespace Nib
{

CriticalSection cs{true};

ResourceChecker::Database ResourceChecker::textureDb;
ResourceChecker::Database ResourceChecker::samplerDb;
ResourceChecker::Database ResourceChecker::frameBufferDb;
ResourceChecker::Database ResourceChecker::renderBufferDb;
ResourceChecker::Database ResourceChecker::vertexBufferDb;
std::map<void*, void*> ResourceChecker::contextDb;

const ResourceChecker::dbDescriptor ResourceChecker::textureDbDescriptor = {
    &textureDb, DescriptorType::Texture};
const ResourceChecker::dbDescriptor ResourceChecker::samplerDbDescriptor = {
    &samplerDb, DescriptorType::Sampler};
const ResourceChecker::dbDescriptor ResourceChecker::frameBufferDbDescriptor = {
    &frameBufferDb, DescriptorType::FrameBuffer};
const ResourceChecker::dbDescriptor ResourceChecker::renderBufferDbDescriptor = {
    &renderBufferDb, DescriptorType::RenderBuffer};
const ResourceChecker::dbDescriptor ResourceChecker::vertexBufferDbDescriptor = {
    &vertexBufferDb, DescriptorType::VertexBuffer};

namespace
{

/// Who calls: the queue and the context under which a name is looked up.
struct Caller
{
    explicit Caller(ResourceChecker::DescriptorType type)
        : queue(GetCurrentMsgQueue()), context(ResourceChecker::getRealContext(type))
    {
    }

    IGLMsgQueue* queue;
    void* context;
};

/// What a GL debugger calls such a name; 0 for a type that is none of the five.
GLenum LabelledKind(ResourceChecker::DescriptorType type)
{
    switch (type)
    {
    case ResourceChecker::DescriptorType::Texture: return GL_TEXTURE;
    case ResourceChecker::DescriptorType::Sampler: return GL_SAMPLER_KHR;
    case ResourceChecker::DescriptorType::FrameBuffer: return GL_FRAMEBUFFER;
    case ResourceChecker::DescriptorType::RenderBuffer: return GL_RENDERBUFFER;
    case ResourceChecker::DescriptorType::VertexBuffer: return GL_BUFFER_KHR;
    }
    return 0;
}

/// A pointer as a stream writes it: 0 where it is null.
struct PointerText
{
    explicit PointerText(const void* pointer)
    {
        if (pointer)
            std::snprintf(text, sizeof text, "%p", pointer);
    }

    char text[2 + 2 * sizeof(void*) + 1] = "0";
};

const char* QueueName(IGLMsgQueue* queue)
{
    const char* tag = queue != nullptr ? queue->getTag() : nullptr;
    return tag != nullptr ? tag : "";
}

ResourceChecker::Database::iterator Find(unsigned int id, const Caller& caller,
                                         ResourceChecker::dbDescriptor db)
{
    return db.db->find(ResourceChecker::CheckerItem(id, caller.queue, caller.context));
}

} // namespace

// ---- records ------------------------------------------------------------------------------------

ResourceChecker::BaseInfo::~BaseInfo() = default;

ResourceChecker::TextureInfo::TextureInfo(int w, int h, unsigned format)
    : width(w), height(h), internalFormat(format)
{
}

ResourceChecker::TextureInfo::~TextureInfo() = default;

ResourceChecker::CheckerItem::CheckerItem(unsigned int itemId, IGLMsgQueue* itemQueue,
                                          void* itemContext)
    : queue(itemQueue), queueName(QueueName(itemQueue)), context(itemContext), id(itemId)
{
}

ResourceChecker::CheckerItem::CheckerItem(const CheckerItem& other)
    : queue(other.queue), queueName(other.queueName), context(other.context), id(other.id),
      tag(other.tag), info(std::move(other.info))
{
}

ResourceChecker::CheckerItem::~CheckerItem() = default;

bool ResourceChecker::CheckerItem::operator<(const CheckerItem& other) const
{
    const auto address = reinterpret_cast<std::uintptr_t>(context);
    const auto otherAddress = reinterpret_cast<std::uintptr_t>(other.context);
    return address != otherAddress ? address < otherAddress : id < other.id;
}

const char* ResourceChecker::dbDescriptor::toString() const
{
    switch (type)
    {
    case DescriptorType::Texture: return "textureDb";
    case DescriptorType::Sampler: return "samplerDb";
    case DescriptorType::FrameBuffer: return "frameBufferDb";
    case DescriptorType::RenderBuffer: return "renderBufferDb";
    case DescriptorType::VertexBuffer: return "vertexBufferDb";
    }
    return "";
}

// ---- lookups ------------------------------------------------------------------------------------

void ResourceChecker::addLookup(unsigned int id, dbDescriptor db, std::unique_ptr<BaseInfo> info)
{
    if (!System::IsBuildTypeEngMode())
        return;
    if (id == 0)
    {
        NIB_LOG_INFO("Warning! Resource addLookup with ID = 0, %s ", db.toString());
        return;
    }
    AutoCriticalSection lock(cs, __func__, __LINE__);
    const Caller caller(db.type);
    CheckerItem item(id, caller.queue, caller.context);
    item.info = std::move(info);
    if (!db.db->insert(item).second)
    {
        NIB_LOG_ERROR("Error add %s lookup: Context: %p, Queue: %p[%s], Id %d", db.toString(),
                      caller.context, static_cast<void*>(caller.queue), QueueName(caller.queue),
                      id);
        throw std::logic_error("Add resource lookup: Resource already exists in database");
    }
}

void ResourceChecker::removeLookup(unsigned int id, dbDescriptor db)
{
    if (!System::IsBuildTypeEngMode())
        return;
    if (id == 0)
    {
        NIB_LOG_INFO("Warning! Resource removeLookup with ID = 0, %s ", db.toString());
        return;
    }
    AutoCriticalSection lock(cs, __func__, __LINE__);
    const Caller caller(db.type);
    const auto item = Find(id, caller, db);
    if (item == db.db->end())
    {
        NIB_LOG_ERROR("Error remove %s lookup: Context: %p, Queue: %p[%s], Id %d", db.toString(),
                      caller.context, static_cast<void*>(caller.queue), QueueName(caller.queue),
                      id);
        throw std::logic_error("Remove resource lookup: Trying to delete resource, that is not "
                               "listed in database");
    }
    db.db->erase(item);
}

void ResourceChecker::checkLookup(unsigned int id, dbDescriptor db)
{
    if (!System::IsBuildTypeEngMode())
        return;
    if (id == 0)
    {
        NIB_LOG_INFO("Warning! Resource checkLookup with ID = 0, %s ", db.toString());
        return;
    }
    AutoCriticalSection lock(cs, __func__, __LINE__);
    const Caller caller(db.type);
    if (Find(id, caller, db) == db.db->end())
    {
        NIB_LOG_ERROR("Error check %s lookup: Context: %p, Queue: %p[%s], Id %d", db.toString(),
                      caller.context, static_cast<void*>(caller.queue), QueueName(caller.queue),
                      id);
        throw std::logic_error("Check resource lookup: Trying to access resource, that is not "
                               "listed in database");
    }
}

void ResourceChecker::updateTagLookup(unsigned int id, const char* tag, dbDescriptor db)
{
    if (!System::IsBuildTypeEngMode())
        return;
    if (id == 0)
    {
        NIB_LOG_INFO("Warning! Resource updateTagLookup with ID = 0, %s ", db.toString());
        return;
    }
    AutoCriticalSection lock(cs, __func__, __LINE__);
    const Caller caller(db.type);
    const auto item = Find(id, caller, db);
    if (item == db.db->end())
    {
        NIB_LOG_ERROR("Error update %s lookup: Context: %p, Queue: %p[%s], Id %d", db.toString(),
                      caller.context, static_cast<void*>(caller.queue), QueueName(caller.queue),
                      id);
        return;
    }
    item->tag = tag != nullptr ? tag : "";
    if (const GLenum kind = LabelledKind(db.type))
        GlDebugOutput::Label(kind, id, tag);
}

// ---- contexts -----------------------------------------------------------------------------------

void ResourceChecker::addSharedContext(void* shared, void* owner)
{
    if (!System::IsBuildTypeEngMode())
        return;
    AutoCriticalSection lock(cs, __func__, __LINE__);
    if (owner != nullptr)
        contextDb.emplace(shared, owner); // an earlier mapping stays
}

void ResourceChecker::removeSharedContext(void* shared)
{
    if (!System::IsBuildTypeEngMode())
        return;
    AutoCriticalSection lock(cs, __func__, __LINE__);
    contextDb.erase(shared);
}

void* ResourceChecker::getRealContext(DescriptorType type)
{
    void* context = eglGetCurrentContext();
    if (type == DescriptorType::FrameBuffer)
        return context; // contexts never share framebuffers
    AutoCriticalSection lock(cs, __func__, __LINE__);
    // Mappings that form a ring have no owner: as many steps as there are mappings are enough for
    // every chain.
    for (std::size_t steps = contextDb.size(); steps > 0; --steps)
    {
        const auto owner = contextDb.find(context);
        if (owner == contextDb.end())
            break;
        context = owner->second;
    }
    return context;
}

// ---- leaks --------------------------------------------------------------------------------------

void ResourceChecker::leakCheckLookup(bool isError)
{
    if (!System::IsBuildTypeEngMode())
        return;
    AutoCriticalSection lock(cs, __func__, __LINE__);
    printInfoTexture();
    lookForContextResources(textureDbDescriptor, isError);
    lookForContextResources(samplerDbDescriptor, isError);
    lookForContextResources(frameBufferDbDescriptor, isError);
    lookForContextResources(renderBufferDbDescriptor, isError);
    lookForContextResources(vertexBufferDbDescriptor, isError);
}

void ResourceChecker::lookForContextResources(dbDescriptor db, bool isError)
{
    if (!System::IsBuildTypeEngMode())
        return;
    AutoCriticalSection lock(cs, __func__, __LINE__);
    const Caller caller(db.type);
    for (const CheckerItem& item : *db.db)
    {
        if (item.queue != caller.queue || item.context != caller.context)
            continue;
        if (isError)
            NIB_LOG_ERROR("Error, GL resource leak detected in %s: Context: %p,  Queue: %p[%s], "
                          "Id: %d, Tag: %s",
                          db.toString(), item.context, static_cast<void*>(item.queue),
                          item.queueName, item.id, item.tag.c_str());
        else
            NIB_LOG_WARN("Possible resource leak detected in %s: Context: %p,  Queue: %p[%s], "
                         "Id: %d, Tag: %s",
                         db.toString(), item.context, static_cast<void*>(item.queue),
                         item.queueName, item.id, item.tag.c_str());
    }
}

void ResourceChecker::printResource(const std::set<CheckerItem>& resources)
{
    if (!System::IsBuildTypeEngMode())
        return;
    AutoCriticalSection lock(cs, __func__, __LINE__);
    // Not by std::cout, for which every program that loads the library would set up all streams.
    for (const CheckerItem& item : resources)
        std::printf("context=%s, queue=%s, id=%u\n", PointerText(item.context).text,
                    PointerText(item.queue).text, item.id);
    std::fflush(stdout);
}

} // namespace Nib
