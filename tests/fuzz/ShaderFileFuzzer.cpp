#include "Expect.h"

#include <nib/shader_cache.h>

#include <zlib.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>

namespace
{

namespace fs = std::filesystem;
using Nib::ShaderProgramCache;
using Bytes = std::vector<uint8_t>;

constexpr size_t kHeaderSize = 40;
constexpr size_t kMagicAt = 0;
constexpr size_t kFormatAt = 8;
constexpr size_t kProgramSizeAt = 16;
constexpr size_t kNamesSizeAt = 24;
constexpr size_t kNameCountAt = 32;

uint64_t Integer(const uint8_t* data, size_t at)
{
    uint64_t value = 0;
    for (size_t i = 8; i-- > 0;)
        value = value << 8 | data[at + i];
    return value;
}

void SetInteger(uint8_t* data, size_t at, uint64_t value)
{
    for (size_t i = 0; i < 8; ++i)
        data[at + i] = static_cast<uint8_t>(value >> (8 * i));
}

uint64_t Crc(const uint8_t* data, size_t size)
{
    return crc32(0, data, static_cast<uInt>(size));
}

uint64_t CountNames(const uint8_t* block, size_t size)
{
    return static_cast<uint64_t>(std::count(block, block + size, 0));
}

// Whether the bytes are a file that the cache takes, read in terms of bytes.
bool IsGood(const uint8_t* data, size_t size)
{
    if (size < kHeaderSize || Integer(data, kMagicAt) != 0xACDCACDC)
        return false;
    const uint64_t program = Integer(data, kProgramSizeAt);
    const uint64_t names = Integer(data, kNamesSizeAt);
    if (program == 0 || program > 1000000 || names >= 100001)
        return false;
    const size_t crcAt = kHeaderSize + program + names;
    if (size < crcAt + 8 || Integer(data, crcAt) != Crc(data, crcAt))
        return false;
    const uint64_t count = CountNames(data + crcAt - names, names);
    return names == 0 || (data[crcAt - 1] == 0 && count == Integer(data, kNameCountAt));
}

// The cache with a folder of its own, which goes with the process.
class CacheFolder
{
public:
    CacheFolder()
    {
        std::string path = (fs::temp_directory_path() / "nib-fuzz-XXXXXX").string();
        Nib::Expect(mkdtemp(path.data()) != nullptr, "a temporary folder");
        m_path = path;
        Nib::System::SetSDKCacheDirectoryPath((m_path / "sdk").c_str());
    }
    ~CacheFolder() { fs::remove_all(m_path); }

    fs::path FileOf(uint64_t key) const
    {
        return m_path / "RendererCache" / ("sh" + std::to_string(key) + ".dat");
    }

private:
    fs::path m_path;
};

Bytes Contents(const fs::path& file)
{
    std::ifstream stream(file, std::ios::binary);
    return Bytes(std::istreambuf_iterator<char>(stream), {});
}

// What was loaded is stored once more, under another key: the same bytes, as far as the record
// holds them.
void ExpectStoredAlike(const CacheFolder& folder, const ShaderProgramCache::BinaryShader& loaded,
                       const uint8_t* data)
{
    std::unique_ptr<ShaderProgramCache::BinaryShader> copy(loaded.Clone());
    ++copy->key;
    Nib::Expect(ShaderProgramCache::GetInstance()->SetBinaryShader(*copy), "storing");
    const uint64_t names = Integer(data, kNamesSizeAt);
    const size_t crcAt = kHeaderSize + Integer(data, kProgramSizeAt) + names;
    Bytes expected(data, data + crcAt + 8);
    SetInteger(expected.data(), kFormatAt, Integer(data, kFormatAt) & 0xFFFFFFFF);
    if (names == 0)
        SetInteger(expected.data(), kNameCountAt, 0);
    SetInteger(expected.data(), crcAt, Crc(expected.data(), crcAt));
    Nib::Expect(Contents(folder.FileOf(copy->key)) == expected, "the bytes of a stored file");
    fs::remove(folder.FileOf(copy->key));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    static const CacheFolder folder;
    static ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    static uint64_t key = 0;
    key += 2; // a new one each time, since the cache keeps what it has loaded

    std::ofstream(folder.FileOf(key), std::ios::binary)
        .write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    const auto loaded = cache->HoldBinaryShader(key);
    Nib::Expect((loaded != nullptr) == IsGood(data, size), "whether the file is good");
    if (loaded)
        ExpectStoredAlike(folder, *loaded, data);
    fs::remove(folder.FileOf(key));
    return 0;
}

// Most changes only break the sum at the end; half of the time it, and what guards it, are put
// right.
extern "C" size_t LLVMFuzzerMutate(uint8_t* data, size_t size, size_t limit);
extern "C" size_t LLVMFuzzerCustomMutator(uint8_t* data, size_t size, size_t limit,
                                          unsigned int seed)
{
    size = LLVMFuzzerMutate(data, size, limit);
    if (seed % 2 == 0 || size <= kHeaderSize + 8)
        return size;
    const size_t content = size - kHeaderSize - 8;
    const size_t names = std::min<uint64_t>(Integer(data, kNamesSizeAt), content - 1);
    SetInteger(data, kMagicAt, 0xACDCACDC);
    SetInteger(data, kProgramSizeAt, content - names);
    SetInteger(data, kNamesSizeAt, names);
    if (seed % 4 == 1)
        SetInteger(data, kNameCountAt, CountNames(data + size - 8 - names, names));
    SetInteger(data, size - 8, Crc(data, size - 8));
    return size;
}
