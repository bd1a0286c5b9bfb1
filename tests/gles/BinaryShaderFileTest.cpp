#include "gles/CacheFiles.h"
#include "sim/SimDriver.h"

#include <nib/shader_cache.h>

#include <csignal>
#include <filesystem>

#include <sys/resource.h>

using Nib::ShaderProgramCache;
using Texts = std::vector<std::string>;
namespace fs = std::filesystem;

namespace
{

const std::string kSave = "bool Nib::ShaderProgramCache::SaveToFile(const "
                          "ShaderProgramCache::BinaryShader *) ";
const std::string kSet = "bool Nib::ShaderProgramCache::SetBinaryShader(const "
                         "ShaderProgramCache::BinaryShader &) - ";
const std::string kLoad = "ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
                          "ShaderProgramCache::BinaryShaderKey) ";

class BinaryShaderFile : public testing::Test
{
protected:
    BinaryShaderFile() : cache(ShaderProgramCache::GetInstance()) { driver.ForgetLog(); }

    Texts Errors() const { return driver.LogTexts(ANDROID_LOG_ERROR); }
    std::string Path() const { return folder.File("sh5.dat"); }

    /// What the cache has for key 5 when its file holds @p bytes.
    const ShaderProgramCache::BinaryShader* Loaded(const Bytes& bytes)
    {
        WriteBytes(Path(), bytes);
        driver.ForgetLog();
        return cache->GetBinaryShader(5);
    }
    const ShaderProgramCache::BinaryShader* Loaded(const FileFields& fields)
    {
        return Loaded(fields.File());
    }

    /// Whether the file is refused with this one line, stays, and is read again the next time.
    testing::AssertionResult IsRefused(const Bytes& bytes, const std::string& line)
    {
        if (Loaded(bytes))
            return testing::AssertionFailure() << "loaded";
        if (Errors() != Texts{line} || driver.Log().size() != 1)
            return testing::AssertionFailure() << testing::PrintToString(driver.Log());
        if (ReadBytes(Path()) != bytes)
            return testing::AssertionFailure() << "the file has changed";
        driver.ForgetLog();
        if (cache->GetBinaryShader(5) || Errors() != Texts{line})
            return testing::AssertionFailure() << "something was kept in memory";
        return testing::AssertionSuccess();
    }
    testing::AssertionResult IsRefused(const FileFields& fields, const std::string& line)
    {
        return IsRefused(fields.File(), line);
    }

    std::string HeaderError(int error = 0) const
    {
        return kLoad + "File header read error Err=" + std::to_string(error) + ", File = " + Path();
    }

    SimDriver driver;
    CacheFolder folder;
    ShaderProgramCache* cache;
};

Bytes Cut(const FileFields& fields, std::size_t size)
{
    Bytes bytes = fields.File();
    bytes.resize(size);
    return bytes;
}

/// While it lives, no file of the process grows beyond @p size bytes, and going there is an error.
class FileSizeLimit
{
public:
    explicit FileSizeLimit(rlim_t size) : m_handler(std::signal(SIGXFSZ, SIG_IGN))
    {
        getrlimit(RLIMIT_FSIZE, &m_before);
        const rlimit limit{size, m_before.rlim_max};
        setrlimit(RLIMIT_FSIZE, &limit);
    }
    ~FileSizeLimit()
    {
        setrlimit(RLIMIT_FSIZE, &m_before);
        std::signal(SIGXFSZ, m_handler);
    }
    FileSizeLimit(const FileSizeLimit&) = delete;
    FileSizeLimit& operator=(const FileSizeLimit&) = delete;

private:
    void (*m_handler)(int);
    rlimit m_before = {};
};

} // namespace

// ---- writing ------------------------------------------------------------------------------------

TEST_F(BinaryShaderFile, HasItsFieldsInOrder)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "\x01\x02\xff", {"a_p", "b_c"})));
    EXPECT_EQ(ReadBytes(Path()),
              (Bytes{0xDC, 0xAC, 0xDC, 0xAC, 0,   0,   0,   0,    // magic
                     0x40, 0x87, 0,    0,    0,   0,   0,   0,    // format
                     3,    0,    0,    0,    0,   0,   0,   0,    // program length
                     8,    0,    0,    0,    0,   0,   0,   0,    // attribute block size
                     2,    0,    0,    0,    0,   0,   0,   0,    // attribute count
                     1,    2,    0xFF,                            // program
                     'a',  '_',  'p',  0,    'b', '_', 'c', 0,    // attributes
                     0x4A, 0x0B, 0x99, 0x31, 0,   0,   0,   0})); // CRC-32
}

TEST_F(BinaryShaderFile, WithoutAttributesHasFortyEightBytesBesideTheProgram)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "\x01\x02\xff")));
    const Bytes bytes = ReadBytes(Path());
    ASSERT_EQ(bytes.size(), 51u);
    EXPECT_EQ(Number(bytes, 24), 0u);
    EXPECT_EQ(Number(bytes, 32), 0u);
    EXPECT_EQ(Number(bytes, 43), 0x736687A9u);
}

TEST_F(BinaryShaderFile, EmptyNamesAreOneByteEach)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "P", {"", "x", ""})));
    const Bytes bytes = ReadBytes(Path());
    ASSERT_EQ(bytes.size(), 53u);
    EXPECT_EQ(Number(bytes, 24), 4u);
    EXPECT_EQ(Number(bytes, 32), 3u);
    EXPECT_EQ(Bytes(bytes.begin() + 41, bytes.begin() + 45), (Bytes{0, 'x', 0, 0}));
}

TEST_F(BinaryShaderFile, FormatIsZeroExtended)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "P", {}, 0xFFFFFFFE)));
    EXPECT_EQ(Number(ReadBytes(Path()), 8), 0xFFFFFFFEu);
}

TEST_F(BinaryShaderFile, IsTheUsersAloneAndTheOnlyOneLeft)
{
    const mode_t mask = umask(0);
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "P")));
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "Q")));
    umask(mask);
    EXPECT_EQ(Permissions(Path()), 0600u);
    EXPECT_EQ(folder.Names(), Texts{"sh5.dat"});
}

TEST_F(BinaryShaderFile, OfAnEmptyProgramIsWrittenAndThenRefused)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(6, "")));
    const Bytes bytes = ReadBytes(folder.File("sh6.dat"));
    EXPECT_EQ(bytes.size(), 48u);
    EXPECT_TRUE(IsRefused(bytes, HeaderError()));
}

TEST_F(BinaryShaderFile, OfANegativeLengthIsNotLeft)
{
    Nib::ShaderProgramCache::BinaryShader record = Record(5, "");
    record.length = -1;
    EXPECT_FALSE(cache->SetBinaryShader(record));
    EXPECT_EQ(Errors(), (Texts{kSave + "filed to save file " + Path(),
                               kSet + "Failed to save cloned binary shader"}));
    EXPECT_EQ(folder.Names(), Texts{});
}

TEST_F(BinaryShaderFile, ThatTheDiskDoesNotTakeIsRemoved)
{
    {
        const FileSizeLimit limit(44);
        EXPECT_FALSE(cache->SetBinaryShader(Record(5, "PROGRAM", {"a"})));
    }
    EXPECT_EQ(Errors(), (Texts{kSave + "filed to save file " + Path(),
                               kSet + "Failed to save cloned binary shader"}));
    EXPECT_EQ(folder.Names(), Texts{});
    ASSERT_NE(cache->GetBinaryShader(5), nullptr) << "memory keeps it";
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "PROGRAM");
}

TEST_F(BinaryShaderFile, ThatLacksOnlyItsLastByteIsRemovedToo)
{
    {
        const FileSizeLimit limit(56);
        EXPECT_FALSE(cache->SetBinaryShader(Record(5, "PROGRAM", {"a"}))); // 57 bytes
    }
    EXPECT_EQ(folder.Names(), Texts{});
    {
        const FileSizeLimit limit(57);
        EXPECT_TRUE(cache->SetBinaryShader(Record(5, "PROGRAM", {"a"})));
    }
    EXPECT_EQ(folder.Names(), Texts{"sh5.dat"});
}

TEST_F(BinaryShaderFile, ThatCannotReplaceIsReportedAsAReplacement)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "OLD")));
    {
        const FileSizeLimit limit(44);
        EXPECT_FALSE(cache->SetBinaryShader(Record(5, "NEW PROGRAM")));
    }
    EXPECT_EQ(Errors(), (Texts{kSave + "filed to save file " + Path(),
                               kSet + "Failed to save binary shader"}));
    EXPECT_EQ(folder.Names(), Texts{}) << "the old file is gone: it is out of date";
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "NEW PROGRAM");
}

TEST_F(BinaryShaderFile, ThatCannotBeCreatedIsReportedWithErrno)
{
    fs::remove_all(folder.Path());
    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "P")));
    EXPECT_EQ(Errors(), (Texts{kSave + "Failed to create shader binary file. Err=2. File=" + Path(),
                               kSet + "Failed to save cloned binary shader"}));
    EXPECT_NE(cache->GetBinaryShader(5), nullptr);
}

TEST_F(BinaryShaderFile, InWhosePlaceIsAFolderIsReportedWithErrno)
{
    fs::create_directory(Path());
    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "P")));
    EXPECT_EQ(Errors(),
              (Texts{kSave + "Failed to create shader binary file. Err=21. File=" + Path(),
                     kSet + "Failed to save cloned binary shader"}));
    EXPECT_EQ(folder.Names(), Texts{"sh5.dat"});
}

// ---- what is read -------------------------------------------------------------------------------

// ---- what is read -------------------------------------------------------------------------------

TEST_F(BinaryShaderFile, IsReadFieldByField)
{
    const auto* const record = Loaded(FileFields());
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->key, 5u);
    EXPECT_EQ(record->length, 4);
    EXPECT_EQ(record->format, 0x8740u);
    EXPECT_EQ(ProgramText(*record), "PROG");
    EXPECT_EQ(record->attributes, (Texts{"a_pos", "a_color"}));
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(BinaryShaderFile, WithoutAttributesLoadsWithoutNames)
{
    const auto* const record = Loaded(FileFields::Of("PROG", {}));
    ASSERT_NE(record, nullptr);
    EXPECT_TRUE(record->attributes.empty());
}

TEST_F(BinaryShaderFile, WithoutAttributesIsNotAskedForTheirNumber)
{
    FileFields fields = FileFields::Of("PROG", {});
    fields.attributeCount = 7;
    const auto* const record = Loaded(fields);
    ASSERT_NE(record, nullptr);
    EXPECT_TRUE(record->attributes.empty());
}

TEST_F(BinaryShaderFile, FormatIsReadAsThirtyTwoBits)
{
    FileFields fields;
    fields.format = 0x123456789ABCDEF0;
    const auto* const record = Loaded(fields);
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->format, 0x9ABCDEF0u);
}

TEST_F(BinaryShaderFile, MayHaveMoreBehindItsCrc)
{
    Bytes bytes = FileFields().File();
    bytes.push_back('x');
    EXPECT_NE(Loaded(bytes), nullptr);
}

TEST_F(BinaryShaderFile, OfTheLargestProgramLoads)
{
    const auto* const record = Loaded(FileFields::Of(std::string(1000000, 'p'), {"a"}));
    ASSERT_NE(record, nullptr);
    EXPECT_EQ(record->length, 1000000);
    EXPECT_EQ(record->bytes[999999], 'p');
}

TEST_F(BinaryShaderFile, WithTheLargestAttributesLoads)
{
    const auto* const record = Loaded(FileFields::Of("PROG", {std::string(99999, 'a')}));
    ASSERT_NE(record, nullptr);
    ASSERT_EQ(record->attributes.size(), 1u);
    EXPECT_EQ(record->attributes[0].size(), 99999u);
}

// ---- headers that are refused -------------------------------------------------------------------

TEST_F(BinaryShaderFile, ThatIsEmptyIsRefused)
{
    EXPECT_TRUE(IsRefused(Bytes{}, HeaderError()));
}

TEST_F(BinaryShaderFile, ThatEndsInItsHeaderIsRefused)
{
    EXPECT_TRUE(IsRefused(Cut({}, 39), HeaderError()));
    EXPECT_TRUE(IsRefused(Cut({}, 1), HeaderError()));
}

TEST_F(BinaryShaderFile, OfAnotherMagicIsRefused)
{
    for (const std::uint64_t magic :
         {0xACDCACDDull, 0ull, 0xACDCACDC00000000ull, 0x1ACDCACDCull, 0xDCACDCACull})
    {
        FileFields fields;
        fields.magic = magic;
        EXPECT_TRUE(IsRefused(fields, HeaderError())) << std::hex << magic;
    }
}

TEST_F(BinaryShaderFile, OfProgramLengthZeroIsRefused)
{
    EXPECT_TRUE(IsRefused(FileFields::Of("", {"a"}), HeaderError()));
}

TEST_F(BinaryShaderFile, ThatIsAFolderIsRefusedWithErrno)
{
    fs::create_directory(Path());
    EXPECT_EQ(cache->GetBinaryShader(5), nullptr);
    EXPECT_EQ(Errors(), Texts{HeaderError(21)});
}

TEST_F(BinaryShaderFile, OfATooLargeProgramIsRefused)
{
    EXPECT_TRUE(IsRefused(FileFields::Of(std::string(1000001, 'p'), {"a"}),
                          kLoad +
                              "Program size (1000001) OR Attribute size (2) is too big to "
                              "allocate memory. File = " +
                              Path()));
}

TEST_F(BinaryShaderFile, OfTooLargeAttributesIsRefused)
{
    EXPECT_TRUE(IsRefused(FileFields::Of("PROG", {std::string(100000, 'a')}),
                          kLoad +
                              "Program size (4) OR Attribute size (100001) is too big to "
                              "allocate memory. File = " +
                              Path()));
}

TEST_F(BinaryShaderFile, OfSizesThatAreNegativeWhenSignedIsRefused)
{
    FileFields fields;
    fields.length = 0xFFFFFFFFFFFFFFFF;
    EXPECT_TRUE(IsRefused(fields, kLoad +
                                      "Program size (18446744073709551615) OR Attribute size "
                                      "(14) is too big to allocate memory. File = " +
                                      Path()));
    fields = {};
    fields.attributeSize = 0x8000000000000000;
    EXPECT_TRUE(IsRefused(fields, kLoad +
                                      "Program size (4) OR Attribute size "
                                      "(9223372036854775808) is too big to allocate memory. "
                                      "File = " +
                                      Path()));
}

TEST_F(BinaryShaderFile, OfSizesThatAreSmallInThirtyTwoBitsIsRefused)
{
    FileFields fields;
    fields.length = 0x100000004;
    EXPECT_TRUE(IsRefused(fields, kLoad +
                                      "Program size (4294967300) OR Attribute size (14) is too "
                                      "big to allocate memory. File = " +
                                      Path()));
}

// ---- contents that are refused ------------------------------------------------------------------

TEST_F(BinaryShaderFile, ThatEndsInItsProgramIsRefused)
{
    const std::string line = kLoad + "File shader bin read error Err=0, File = " + Path();
    EXPECT_TRUE(IsRefused(Cut({}, 43), line));
    EXPECT_TRUE(IsRefused(Cut({}, 40), line));
}

TEST_F(BinaryShaderFile, ThatEndsInItsAttributesIsRefused)
{
    const std::string line = kLoad + "File attribs read error Err=0, File = " + Path();
    EXPECT_TRUE(IsRefused(Cut({}, 57), line));
    EXPECT_TRUE(IsRefused(Cut({}, 44), line));
}

TEST_F(BinaryShaderFile, WhoseAttributesDoNotEndWithNulIsRefused)
{
    FileFields fields;
    fields.attributes.back() = 'x';
    EXPECT_TRUE(IsRefused(fields, kLoad + "Filed to parse shader attributes. Expected=2. Found = "
                                          "1"));
}

TEST_F(BinaryShaderFile, WhoseAttributesAreOthersInNumberIsRefused)
{
    FileFields fields;
    fields.attributeCount = 3;
    EXPECT_TRUE(IsRefused(fields, kLoad + "Filed to parse shader attributes. Expected=3. Found = "
                                          "2"));
    fields.attributeCount = 0;
    EXPECT_TRUE(IsRefused(fields, kLoad + "Filed to parse shader attributes. Expected=0. Found = "
                                          "2"));
    fields.attributeCount = 0x100000002;
    EXPECT_TRUE(
        IsRefused(fields, kLoad + "Filed to parse shader attributes. Expected=4294967298. Found = "
                                  "2"));
}

TEST_F(BinaryShaderFile, WithoutItsWholeCrcIsRefused)
{
    const std::string line = kLoad + "Filed to read CRC from file. Err=0, File = " + Path();
    EXPECT_TRUE(IsRefused(FileFields().WithoutCrc(), line));
    EXPECT_TRUE(IsRefused(Cut({}, 65), line));
}

TEST_F(BinaryShaderFile, OfAnotherCrcIsRefused)
{
    Bytes bytes = FileFields().File();
    ASSERT_EQ(Number(bytes, 58), 3877497089u);
    bytes[58] ^= 1;
    EXPECT_TRUE(
        IsRefused(bytes, kLoad + "Invalid CRC, From file: 3877497088, Calculated: = 3877497089"));
}

TEST_F(BinaryShaderFile, OfACrcWithMoreThanThirtyTwoBitsIsRefused)
{
    Bytes bytes = FileFields().File();
    bytes[62] = 1;
    EXPECT_TRUE(
        IsRefused(bytes, kLoad + "Invalid CRC, From file: 8172464385, Calculated: = 3877497089"));
}

TEST_F(BinaryShaderFile, WithAnyBitChangedIsRefused)
{
    const Bytes good = FileFields().File();
    for (std::size_t bit = 0; bit < good.size() * 8; ++bit)
    {
        Bytes bytes = good;
        bytes[bit / 8] ^= static_cast<unsigned char>(1u << bit % 8);
        EXPECT_EQ(Loaded(bytes), nullptr) << "bit " << bit;
    }
    EXPECT_NE(Loaded(good), nullptr);
}

TEST_F(BinaryShaderFile, CutAnywhereIsRefused)
{
    const Bytes good = FileFields().File();
    for (std::size_t size = 0; size < good.size(); ++size)
        EXPECT_EQ(Loaded(Bytes(good.begin(), good.begin() + static_cast<long>(size))), nullptr)
            << "size " << size;
}
