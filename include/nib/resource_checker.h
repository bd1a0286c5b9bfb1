#ifndef NIB_RESOURCE_CHECKER_H
#define NIB_RESOURCE_CHECKER_H

#include <nib/export.h>

#include <map>
#include <memory>
#include <set>
#include <string>

namespace Nib
{

class IGLMsgQueue;

/// A debugging aid for engineering builds: which GL names are alive, and which queue and context
/// made each of them.
///
/// Whoever creates a GL name adds it, whoever deletes it removes it; a render thread asks for the
/// leaks before it destroys its context. A context that shares its objects with another is mapped
/// to the owner of the objects, and its names stand under the owner.
///
/// Threads  Any; a name belongs to the queue and the context that are current on the calling
///          thread.
/// Failure  Misuse is an ERROR line and, where an operation says so, std::logic_error.
/// Off      In a build that is not an engineering build (System::IsBuildTypeEngMode) no operation
///          does or logs anything.
class NIB_EXPORT ResourceChecker
{
public:
    /// A kind of GL name.
    enum class DescriptorType : int
    {
        Texture = 0,
        Sampler = 1,
        FrameBuffer = 2,
        RenderBuffer = 3,
        VertexBuffer = 4,
    };

    /// Optional details of a resource.
    struct NIB_EXPORT BaseInfo
    {
        virtual ~BaseInfo();
    };

    /// The details of a texture; -1 in any field means unknown.
    struct NIB_EXPORT TextureInfo : BaseInfo
    {
        TextureInfo(int width, int height, unsigned internalFormat); ///< the fields, in order
        ~TextureInfo() override;

        int width;               ///< pixels
        int height;              ///< pixels
        unsigned internalFormat; ///< the GL internal format
    };

    /// One GL name that is alive.
    struct NIB_EXPORT CheckerItem
    {
        /// A name without a tag or details.
        CheckerItem(unsigned int id, IGLMsgQueue* queue, void* context);

        /// Takes @p other's details away from it: they have one owner.
        CheckerItem(const CheckerItem& other);
        CheckerItem& operator=(const CheckerItem&) = delete;
        ~CheckerItem();

        /// By context, then by id. The queue does not count: a context holds an id once.
        bool operator<(const CheckerItem& other) const;

        IGLMsgQueue* queue; ///< the queue of the thread that made the name; may be null
        /// The queue's tag, or an empty text. The pointer is kept, not the text, which must outlive
        /// the item.
        const char* queueName;
        void* context;   ///< the EGL context that owns the name
        unsigned int id; ///< the GL name

        // Not part of the order: they may change, and move on, while the item stands in a database.
        mutable std::string tag;                ///< what updateTagLookup said of it
        mutable std::unique_ptr<BaseInfo> info; ///< may be null
    };

    /// The live names of one kind.
    using Database = std::set<CheckerItem>;

    /// Names a database; handed over by value.
    struct NIB_EXPORT dbDescriptor
    {
        /// The name of the database, empty for a type that is none of the five.
        const char* toString() const;

        Database* db;        ///< where the names of the kind are kept
        DescriptorType type; ///< the kind
    };

    /// Records a name that was created. @p info may be null.
    /// @throws std::logic_error when the context has a name @p id of this kind already
    static void addLookup(unsigned int id, dbDescriptor db, std::unique_ptr<BaseInfo> info);

    /// Forgets a name that was deleted.
    /// @throws std::logic_error when it is not recorded
    static void removeLookup(unsigned int id, dbDescriptor db);

    /// Does nothing when the name is recorded.
    /// @throws std::logic_error when it is not
    static void checkLookup(unsigned int id, dbDescriptor db);

    /// Labels a name with a copy of @p tag, null as an empty one. Logs, without throwing, when the
    /// name is not recorded.
    static void updateTagLookup(unsigned int id, const char* tag, dbDescriptor db);

    /// Says that the objects of the context @p shared belong to @p owner. The first call for a
    /// context counts; a null owner is ignored.
    static void addSharedContext(void* shared, void* owner);
    /// Forgets what addSharedContext said of a context.
    static void removeSharedContext(void* shared);

    /// Logs the texture memory of every queue and each name that the calling thread's queue and
    /// context still have, as errors or as warnings. To be called on a GL thread before its context
    /// is destroyed. Nothing is removed.
    static void leakCheckLookup(bool isError);

    // ---- the steps of the above; a caller that other threads may disturb holds the lock ----

    /// The context under which the calling thread's names of a kind are recorded.
    static void* getRealContext(DescriptorType type);
    /// Logs the names of one kind that the calling thread's queue and context still have.
    static void lookForContextResources(dbDescriptor db, bool isError);
    /// Logs the texture memory of every queue.
    static void printInfoTexture();

    /// Writes the items to standard output, a line each. To be called by hand.
    static void printResource(const std::set<CheckerItem>& resources);

    /// Orders by queue.
    static bool compareFunction(const CheckerItem* first, const CheckerItem* second);

    // ---- the databases ----

    static Database textureDb;               ///< live textures
    static Database samplerDb;               ///< live samplers
    static Database frameBufferDb;           ///< live framebuffers
    static Database renderBufferDb;          ///< live renderbuffers
    static Database vertexBufferDb;          ///< live buffers
    static std::map<void*, void*> contextDb; ///< from a context to the one it shares with

    static const dbDescriptor textureDbDescriptor;      ///< of textureDb
    static const dbDescriptor samplerDbDescriptor;      ///< of samplerDb
    static const dbDescriptor frameBufferDbDescriptor;  ///< of frameBufferDb
    static const dbDescriptor renderBufferDbDescriptor; ///< of renderBufferDb
    static const dbDescriptor vertexBufferDbDescriptor; ///< of vertexBufferDb

    static constexpr unsigned char ALL_INFO = 0; ///< everything is told
    static constexpr unsigned BIT_TO_KB = 8192;  ///< bits a KB
    static constexpr unsigned KB_TO_MB = 1024;   ///< KB a MB
};

} // namespace Nib

#endif
