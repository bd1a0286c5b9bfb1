#ifndef NIB_SHADER_CACHE_H
#define NIB_SHADER_CACHE_H

/// @file
/// The binaries of shader programs, kept between runs of the application.

#include <nib/base.h>
#include <nib/export.h>

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace Nib
{

class FolderHandle;

/// Program binaries by a key made from the source texts, in memory and in one file a key.
///
/// The files stand in the folder RendererCache beside System::GetSDKCacheDirectoryPath(), named
/// sh<key>.dat. A file that is damaged, cut short, too large or of another format counts as absent
/// and is replaced by the next store. A reader sees a file whole or not at all.
///
/// Owner    the library; the one instance lives to the exit of the process.
/// Threads  any; the cache guards itself. No operation makes a GL call.
/// Failure  null or false, and a log line. Nothing throws.
class NIB_EXPORT ShaderProgramCache
{
public:
    using BinaryShaderKey = uint64_t; ///< a CRC-32, so below 2^32

    /// One program binary. Owns its bytes; copied by Clone alone.
    struct NIB_EXPORT BinaryShader
    {
        BinaryShader() = default;
        BinaryShader(BinaryShader&& other) noexcept;            ///< takes the bytes over
        BinaryShader& operator=(BinaryShader&& other) noexcept; ///< takes the bytes over
        ~BinaryShader();

        BinaryShader* Clone() const; ///< a new record with its own copy of everything

        BinaryShaderKey key = 0;             ///< under which it is kept
        int32_t length = 0;                  ///< of the binary, in bytes
        uint32_t format = 0;                 ///< as glGetProgramBinary gave it
        unsigned char* bytes = nullptr;      ///< `length` bytes from new[], owned
        std::vector<std::string> attributes; ///< name i belongs to attribute location i
    };

    /// The one cache; the first call makes it and its folder. Without a folder it stays
    /// uninitialised: nothing is ever found, stores are kept in memory only.
    static ShaderProgramCache* GetInstance();

    ShaderProgramCache(const ShaderProgramCache&) = delete;
    ShaderProgramCache& operator=(const ShaderProgramCache&) = delete;
    ~ShaderProgramCache();

    /// Prepares the cache folder; GetInstance has done so. False without an SDK cache path or when
    /// the folder cannot be made.
    bool Init();

    /// The CRC-32 of @p vs followed by @p fs. A null text counts as an empty one.
    static BinaryShaderKey GetShaderKey(const char* vs, const char* fs);
    /// Extends @p key by one more text: Append(GetShaderKey(a, nullptr), b) is GetShaderKey(a, b).
    static BinaryShaderKey Append(BinaryShaderKey key, const char* text);

    /// The record of @p key from memory, else from its file, else null. The cache owns it; it is
    /// valid until the next SetBinaryShader of that key. Where several threads store, use
    /// HoldBinaryShader.
    const BinaryShader* GetBinaryShader(BinaryShaderKey key);

    /// The same record, alive until the last holder lets it go, also when it is replaced meanwhile.
    std::shared_ptr<const BinaryShader> HoldBinaryShader(BinaryShaderKey key);

    /// Whether @p record is the one that the cache now has under its key, that is, not replaced.
    bool IsCurrent(const BinaryShader* record);

    /// Keeps a copy of @p shader in memory and writes its file, replacing what was there; @p shader
    /// may be the very record that is replaced. False when the file could not be written; the copy
    /// in memory is kept.
    bool SetBinaryShader(const BinaryShader& shader);

    /// Appends to @p out the names in @p data, a run of strings that each end with a NUL. False
    /// when the last one does not. No data is no names.
    static bool ParseShaderAttributes(const unsigned char* data, unsigned int size,
                                      std::vector<std::string>& out);

    /// What a name in a cache folder stands for.
    enum class FileKind
    {
        Foreign,      ///< nothing of the cache's
        Program,      ///< a binary shader file
        BeingWritten, ///< a binary shader file that a living process writes under another name
        Leftover,     ///< the same of a process that has ended; the next start removes it
    };

    /// For tools. @p name without the folder.
    static FileKind GetFileKind(const char* name);

    /// For tools: reads a file as a look-up would, past the cache and without a log line.
    /// @param out  receives the record, without its key, when the file is whole; may be null
    /// @return what keeps the file from being loaded, in words; empty when it is whole
    static std::string CheckFile(const char* path, BinaryShader* out);

private:
    ShaderProgramCache();

    std::shared_ptr<const BinaryShader> FindOrLoad(BinaryShaderKey key);
    BinaryShader* LoadFromFile(BinaryShaderKey key);
    bool SaveToFile(const BinaryShader* shader);
    bool OpenToRead(File& file, BinaryShaderKey key);
    std::string GetFileName(BinaryShaderKey key) const;
    bool HasOwnFolder() const;
    void RemoveFile(BinaryShaderKey key) const;

    static std::unique_ptr<ShaderProgramCache> m_instance;
    static std::atomic<ShaderProgramCache*> m_published; // m_instance, when it is ready for use
    static CriticalSection m_instanceGuard;

    bool m_initialized;
    std::string m_cacheDirectory;
    std::map<BinaryShaderKey, std::shared_ptr<const BinaryShader>> m_binaries;
    std::unique_ptr<FolderHandle> m_folder; // the cache directory, for reading
    CriticalSection m_lock;                 // guards all of the above, file operations included
};

} // namespace Nib

#endif
