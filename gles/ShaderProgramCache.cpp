#include "base/Log.h"
#include "gles/BinaryShaderFile.h"
#include "gles/BinaryShaderReader.h"
#include "gles/CacheFileNames.h"
#include "gles/Crc32.h"
#include "gles/FolderHandle.h"
#include "gles/SymbolicLink.h"

#include <nib/shader_cache.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstring>
#include <utility>

namespace Nib
{

namespace
{

constexpr int kMostTemporaryNames = 16; ///< tried for one file

/// Opens a new file beside @p path, for this user alone, and gives its name in @p name. What an
/// earlier process left under such a name, or somebody planted there, is passed over.
bool OpenTemporary(File& file, const std::string& path, String& name)
{
    for (int i = 0; i < kMostTemporaryNames; ++i)
    {
        name.Construct(TemporaryName(path).c_str());
        if (file.Construct(&name, "wbxnp", false))
            return true;
        if (errno != EEXIST)
            break;
    }
    return false;
}

std::uint64_t CrcOfText(std::uint64_t crc, const char* text)
{
    return text == nullptr ? crc : ContinueCrc(crc, text, std::strlen(text));
}

} // namespace

// ---- one record ---------------------------------------------------------------------------------

ShaderProgramCache::BinaryShader::BinaryShader(BinaryShader&& other) noexcept
    : key(other.key), length(std::exchange(other.length, 0)), format(other.format),
      bytes(std::exchange(other.bytes, nullptr)), attributes(std::move(other.attributes))
{
}

ShaderProgramCache::BinaryShader&
ShaderProgramCache::BinaryShader::operator=(BinaryShader&& other) noexcept
{
    std::swap(key, other.key);
    std::swap(length, other.length);
    std::swap(format, other.format);
    std::swap(bytes, other.bytes);
    std::swap(attributes, other.attributes);
    return *this;
}

ShaderProgramCache::BinaryShader::~BinaryShader()
{
    delete[] bytes;
}

ShaderProgramCache::BinaryShader* ShaderProgramCache::BinaryShader::Clone() const
{
    auto clone = std::make_unique<BinaryShader>();
    clone->key = key;
    clone->length = length;
    clone->format = format;
    clone->attributes = attributes;
    const auto size = static_cast<std::size_t>(std::max(length, 0));
    clone->bytes = new unsigned char[size];
    std::copy_n(bytes, size, clone->bytes);
    return clone.release();
}

// ---- the one cache ------------------------------------------------------------------------------

std::unique_ptr<ShaderProgramCache> ShaderProgramCache::m_instance;
std::atomic<ShaderProgramCache*> ShaderProgramCache::m_published{nullptr};
CriticalSection ShaderProgramCache::m_instanceGuard{true};

ShaderProgramCache* ShaderProgramCache::GetInstance()
{
    // Acquire, paired with the release below: who sees the pointer sees the cache ready.
    if (ShaderProgramCache* instance = m_published.load(std::memory_order_acquire))
        return instance;
    AutoCriticalSection lock(m_instanceGuard);
    if (!m_instance)
    {
        m_instance.reset(new ShaderProgramCache);
        m_instance->Init(); // an instance without a folder is kept, too
        m_published.store(m_instance.get(), std::memory_order_release);
    }
    return m_instance.get();
}

ShaderProgramCache::ShaderProgramCache()
    : m_initialized(false), m_folder(std::make_unique<FolderHandle>()), m_lock(false)
{
}

ShaderProgramCache::~ShaderProgramCache() = default;

bool ShaderProgramCache::Init()
{
    NIB_FUNCTION("bool Nib::ShaderProgramCache::Init()");
    AutoCriticalSection lock(m_lock);
    if (m_initialized)
    {
        NIB_LOG_WARN("%s - Already initialized.", function);
        return true;
    }
    const char* const path = System::GetSDKCacheDirectoryPath();
    if (path == nullptr || *path == '\0')
    {
        NIB_LOG_ERROR("%s - SDK cache path is NULL or empty", function);
        return false;
    }
    m_cacheDirectory = path;
    const std::size_t delimiter = m_cacheDirectory.find_last_of("/\\");
    if (delimiter == std::string::npos)
        NIB_LOG_ERROR("%s Path delimiter not found in given Cache path", function);
    else
        m_cacheDirectory = m_cacheDirectory.substr(0, delimiter) + "/RendererCache";

    const char* const directory = m_cacheDirectory.c_str();
    if (File::IsAccessible(directory, 0) != 0)
    {
        NIB_LOG_INFO("%s - Make cache directory: %s", function, directory);
        if (Directory::MakeDirectory(directory) != 0)
        {
            NIB_LOG_ERROR("%s : Fail to make the shader cache directory. errno = %d", function,
                          errno);
            return false;
        }
    }
    else
    {
        RemoveStaleTemporaries(m_cacheDirectory); // of processes that were ended while they wrote
    }
    m_folder->Hold(m_cacheDirectory);
    m_initialized = true;
    return true;
}

// ---- keys ---------------------------------------------------------------------------------------

ShaderProgramCache::BinaryShaderKey ShaderProgramCache::GetShaderKey(const char* vs, const char* fs)
{
    return CrcOfText(CrcOfText(0, vs), fs);
}

ShaderProgramCache::BinaryShaderKey ShaderProgramCache::Append(BinaryShaderKey key,
                                                               const char* text)
{
    return CrcOfText(key, text);
}

// ---- finding and storing ------------------------------------------------------------------------

const ShaderProgramCache::BinaryShader* ShaderProgramCache::GetBinaryShader(BinaryShaderKey key)
{
    return HoldBinaryShader(key).get(); // the map holds it, too
}

std::shared_ptr<const ShaderProgramCache::BinaryShader>
ShaderProgramCache::HoldBinaryShader(BinaryShaderKey key)
{
    AutoCriticalSection lock(m_lock);
    return m_initialized ? FindOrLoad(key) : nullptr;
}

std::shared_ptr<const ShaderProgramCache::BinaryShader>
ShaderProgramCache::FindOrLoad(BinaryShaderKey key)
{
    const auto place = m_binaries.lower_bound(key);
    if (place != m_binaries.end() && place->first == key)
        return place->second;
    std::shared_ptr<const BinaryShader> loaded(LoadFromFile(key));
    if (loaded)
        m_binaries.emplace_hint(place, key, loaded);
    return loaded;
}

bool ShaderProgramCache::IsCurrent(const BinaryShader* record)
{
    AutoCriticalSection lock(m_lock);
    const auto known = m_binaries.find(record->key);
    return known != m_binaries.end() && known->second.get() == record;
}

bool ShaderProgramCache::SetBinaryShader(const BinaryShader& shader)
{
    NIB_FUNCTION("bool Nib::ShaderProgramCache::SetBinaryShader(const "
                 "ShaderProgramCache::BinaryShader &)");
    AutoCriticalSection lock(m_lock);
    const BinaryShaderKey key = shader.key;
    const bool replaces = m_binaries.count(key) != 0;
    if (replaces)
    {
        NIB_LOG_WARN("%s - Binary shader already in cache. Replace with new version", function);
        RemoveFile(key);
    }
    // Cloned before the old record goes: it may be the argument.
    const std::shared_ptr<const BinaryShader> clone(shader.Clone());
    m_binaries[key] = clone;
    if (SaveToFile(clone.get()))
        return true;
    if (replaces)
        NIB_LOG_ERROR("%s - Failed to save binary shader", function);
    else
        NIB_LOG_ERROR("%s - Failed to save cloned binary shader", function);
    return false;
}

// ---- files --------------------------------------------------------------------------------------

std::string ShaderProgramCache::GetFileName(BinaryShaderKey key) const
{
    return m_cacheDirectory + "/" + ShaderFileName(key);
}

/// False, with an errno, without a folder, where names would be the root's, and when somebody has
/// put a link in its place, where they would be in a folder of his choice.
bool ShaderProgramCache::HasOwnFolder() const
{
    if (m_cacheDirectory.empty())
        errno = ENOENT;
    else if (IsSymbolicLink(m_cacheDirectory.c_str()))
        errno = ELOOP;
    else
        return true;
    return false;
}

void ShaderProgramCache::RemoveFile(BinaryShaderKey key) const
{
    if (HasOwnFolder())
        File::Unlink(GetFileName(key).c_str());
}

bool ShaderProgramCache::SaveToFile(const BinaryShader* shader)
{
    NIB_FUNCTION("bool Nib::ShaderProgramCache::SaveToFile(const "
                 "ShaderProgramCache::BinaryShader *)");
    const std::string path = GetFileName(shader->key);
    String temporary; // so that no reader sees half a file
    File file;
    if (!HasOwnFolder() || !OpenTemporary(file, path, temporary))
    {
        NIB_LOG_ERROR("%s Failed to create shader binary file. Err=%d. File=%s", function, errno,
                      path.c_str());
        return false;
    }
    const bool isWritten = WriteBinaryShader(file, *shader);
    const bool isClosed = file.Close() == 0;
    if (!isWritten || !isClosed)
    {
        NIB_LOG_ERROR("%s filed to save file %s", function, path.c_str());
        File::Unlink(&temporary);
        RemoveFile(shader->key); // what stands there is out of date
        return false;
    }
    if (std::rename(temporary.Get(), path.c_str()) != 0)
    {
        NIB_LOG_ERROR("%s Failed to create shader binary file. Err=%d. File=%s", function, errno,
                      path.c_str());
        File::Unlink(&temporary);
        return false;
    }
    return true;
}

ShaderProgramCache::BinaryShader* ShaderProgramCache::LoadFromFile(BinaryShaderKey key)
{
    NIB_FUNCTION("ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
                 "ShaderProgramCache::BinaryShaderKey)");
    File file;
    if (!OpenToRead(file, key))
    {
        const int error = errno;
        NIB_LOG_ERROR("%s Failed to create shader binary file. Err=%d. File=%s", function, error,
                      GetFileName(key).c_str());
        return nullptr;
    }
    BinaryShaderReader reader(file);
    std::unique_ptr<BinaryShader> shader = reader.Read();
    if (shader)
        shader->key = key;
    else
        reader.LogFault(GetFileName(key).c_str(), function);
    return shader.release();
}

/// Through the handle, which spares asking whether the folder is a link; else by its path, where the
/// folder may be another one since.
bool ShaderProgramCache::OpenToRead(File& file, BinaryShaderKey key)
{
    if (m_folder->OpenToRead(file, ShaderFileName(key)))
        return true;
    String path;
    path.Construct(GetFileName(key).c_str());
    if (!HasOwnFolder() || !file.Construct(&path, "rbn", false))
        return false;
    m_folder->Hold(m_cacheDirectory);
    return true;
}

// ---- files, as tools see them -------------------------------------------------------------------

namespace
{

const char* TextOf(ShaderFileFault fault)
{
    switch (fault)
    {
    case ShaderFileFault::None: break;
    case ShaderFileFault::Header: return "no header of a shader file";
    case ShaderFileFault::Size: return "sizes beyond what is read";
    case ShaderFileFault::Program: return "cut short in the program";
    case ShaderFileFault::Attributes: return "cut short in the attribute names";
    case ShaderFileFault::Names: return "attribute names that do not match their number";
    case ShaderFileFault::NoSum: return "cut short before the checksum";
    case ShaderFileFault::Sum: return "a wrong checksum";
    }
    return "";
}

} // namespace

ShaderProgramCache::FileKind ShaderProgramCache::GetFileKind(const char* name)
{
    if (KeyInFileName(name))
        return FileKind::Program;
    if (!IsTemporaryName(name))
        return FileKind::Foreign;
    return IsStaleTemporary(name) ? FileKind::Leftover : FileKind::BeingWritten;
}

std::string ShaderProgramCache::CheckFile(const char* path, BinaryShader* out)
{
    String filePath;
    filePath.Construct(path);
    File file;
    if (!file.Construct(&filePath, "rbn", false))
        return std::string("cannot be opened: ") + std::strerror(errno);
    BinaryShaderReader reader(file);
    std::unique_ptr<BinaryShader> shader = reader.Read();
    if (!shader)
        return TextOf(reader.Fault());
    if (out != nullptr)
        *out = std::move(*shader);
    return "";
}

bool ShaderProgramCache::ParseShaderAttributes(const unsigned char* data, unsigned int size,
                                               std::vector<std::string>& out)
{
    const unsigned char* const end = data + size;
    while (data != end)
    {
        const unsigned char* const nul = std::find(data, end, '\0');
        if (nul == end)
            return false;
        out.emplace_back(data, nul);
        data = nul + 1;
    }
    return true;
}

} // namespace Nib
