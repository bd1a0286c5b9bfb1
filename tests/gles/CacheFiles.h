#ifndef NIB_TESTS_GLES_CACHE_FILES_H
#define NIB_TESTS_GLES_CACHE_FILES_H

#include <nib/base.h>
#include <nib/shader_cache.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <initializer_list>
#include <iterator>
#include <string>
#include <vector>

#include <sys/stat.h>

using Bytes = std::vector<unsigned char>;

/// A folder that is gone with its contents when the object ends.
class TemporaryFolder
{
public:
    TemporaryFolder()
    {
        std::string name = (std::filesystem::temp_directory_path() / "nib-XXXXXX").string();
        if (mkdtemp(name.data()))
            m_path = name;
    }
    ~TemporaryFolder()
    {
        std::error_code ignored;
        if (!m_path.empty())
            std::filesystem::remove_all(m_path, ignored);
    }
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::string& Path() const { return m_path; }
    std::string operator/(const std::string& name) const { return m_path + "/" + name; }

private:
    std::string m_path;
};

/// The toolkit's cache directory is CACHE/sdk, so program binaries belong into
/// CACHE/RendererCache. Made before the cache of the process is used for the first time.
class CacheFolder
{
public:
    CacheFolder() { Nib::System::SetSDKCacheDirectoryPath((m_folder / "sdk").c_str()); }

    std::string Path() const { return m_folder / "RendererCache"; }
    std::string File(const std::string& name) const { return Path() + "/" + name; }

    /// The names in the folder, sorted.
    std::vector<std::string> Names() const
    {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(Path()))
            names.push_back(entry.path().filename().string());
        std::sort(names.begin(), names.end());
        return names;
    }

private:
    TemporaryFolder m_folder;
};

inline Bytes ReadBytes(const std::string& path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

inline void WriteBytes(const std::string& path, const Bytes& bytes)
{
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    file.write(reinterpret_cast<const char*>(bytes.data()),
               static_cast<std::streamsize>(bytes.size()));
}

/// The permission bits of a file or folder; of a symbolic link itself.
inline unsigned Permissions(const std::string& path)
{
    struct stat status = {};
    return lstat(path.c_str(), &status) == 0 ? status.st_mode & 07777u : 0u;
}

inline void Append(Bytes& bytes, std::uint64_t number)
{
    for (int shift = 0; shift < 64; shift += 8)
        bytes.push_back(static_cast<unsigned char>(number >> shift));
}

inline void Append(Bytes& bytes, const std::string& text)
{
    bytes.insert(bytes.end(), text.begin(), text.end());
}

inline std::uint64_t Number(const Bytes& bytes, std::size_t offset)
{
    std::uint64_t number = 0;
    for (std::size_t i = 0; i < 8; ++i)
        number |= std::uint64_t{bytes.at(offset + i)} << (8 * i);
    return number;
}

/// CRC-32 bit by bit, as its definition has it.
inline std::uint64_t Crc(const Bytes& bytes, std::size_t size)
{
    std::uint32_t crc = 0xFFFFFFFF;
    for (std::size_t i = 0; i < size; ++i)
    {
        crc ^= bytes[i];
        for (int bit = 0; bit < 8; ++bit)
            crc = (crc >> 1) ^ (crc & 1 ? 0xEDB88320u : 0u);
    }
    return crc ^ 0xFFFFFFFFu;
}

/// The bytes of a binary shader file, field after field; every field may be wrong.
struct FileFields
{
    std::uint64_t magic = 0xACDCACDC;
    std::uint64_t format = 0x8740;
    std::uint64_t length = 4;
    std::uint64_t attributeSize = 14;
    std::uint64_t attributeCount = 2;
    std::string program = "PROG";
    std::string attributes = std::string("a_pos\0a_color\0", 14);

    /// Lengths and count follow from the contents.
    static FileFields Of(std::string program, std::vector<std::string> names)
    {
        FileFields fields;
        fields.attributes.clear();
        for (const std::string& name : names)
            fields.attributes += name + '\0';
        fields.length = program.size();
        fields.attributeSize = fields.attributes.size();
        fields.attributeCount = names.size();
        fields.program = std::move(program);
        return fields;
    }

    Bytes WithoutCrc() const
    {
        Bytes bytes;
        for (const std::uint64_t number : {magic, format, length, attributeSize, attributeCount})
            Append(bytes, number);
        Append(bytes, program);
        Append(bytes, attributes);
        return bytes;
    }

    Bytes File() const
    {
        Bytes bytes = WithoutCrc();
        Append(bytes, Crc(bytes, bytes.size()));
        return bytes;
    }
};

inline Nib::ShaderProgramCache::BinaryShader Record(std::uint64_t key, const std::string& program,
                                                    std::vector<std::string> attributes = {},
                                                    std::uint32_t format = 0x8740)
{
    Nib::ShaderProgramCache::BinaryShader record;
    record.key = key;
    record.length = static_cast<std::int32_t>(program.size());
    record.format = format;
    record.bytes = new unsigned char[program.size()];
    std::copy(program.begin(), program.end(), record.bytes);
    record.attributes = std::move(attributes);
    return record;
}

/// The program's bytes as text.
inline std::string ProgramText(const Nib::ShaderProgramCache::BinaryShader& record)
{
    return {reinterpret_cast<const char*>(record.bytes), static_cast<std::size_t>(record.length)};
}

#endif
