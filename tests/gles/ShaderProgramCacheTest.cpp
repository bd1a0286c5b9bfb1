#include "gles/CacheFiles.h"
#include "sim/SimDriver.h"

#include <nib/shader_cache.h>

#include <filesystem>
#include <memory>
#include <type_traits>

#include <unistd.h>

using Nib::ShaderProgramCache;
using BinaryShader = ShaderProgramCache::BinaryShader;
using Texts = std::vector<std::string>;
namespace fs = std::filesystem;

namespace
{

constexpr const char* kReplaced =
    "bool Nib::ShaderProgramCache::SetBinaryShader(const ShaderProgramCache::BinaryShader &) - "
    "Binary shader already in cache. Replace with new version";

class ProgramCache : public testing::Test
{
protected:
    ProgramCache() : cache(ShaderProgramCache::GetInstance()) { driver.ForgetLog(); }
    ~ProgramCache() override { EXPECT_EQ(driver.CallCount(), 0u) << "the cache makes no GL call"; }

    Texts Errors() const { return driver.LogTexts(ANDROID_LOG_ERROR); }
    Texts Warnings() const { return driver.LogTexts(ANDROID_LOG_WARN); }

    SimDriver driver;
    CacheFolder folder;
    ShaderProgramCache* cache;
};

} // namespace

// ---- keys ---------------------------------------------------------------------------------------

TEST(ShaderProgramCacheKey, IsTheCrcOfBothTexts)
{
    EXPECT_EQ(ShaderProgramCache::GetShaderKey("a", "b"), 0x9E83486Du);
    EXPECT_EQ(ShaderProgramCache::GetShaderKey("12345", "6789"), 0xCBF43926u);
}

TEST(ShaderProgramCacheKey, KnowsNoBorderBetweenTheTexts)
{
    EXPECT_EQ(ShaderProgramCache::GetShaderKey("ab", ""), 0x9E83486Du);
    EXPECT_EQ(ShaderProgramCache::GetShaderKey("", "ab"), 0x9E83486Du);
}

TEST(ShaderProgramCacheKey, NullTextsContributeNothing)
{
    EXPECT_EQ(ShaderProgramCache::GetShaderKey(nullptr, "ab"), 0x9E83486Du);
    EXPECT_EQ(ShaderProgramCache::GetShaderKey("ab", nullptr), 0x9E83486Du);
    EXPECT_EQ(ShaderProgramCache::GetShaderKey(nullptr, nullptr), 0u);
    EXPECT_EQ(ShaderProgramCache::GetShaderKey("", ""), 0u);
}

TEST(ShaderProgramCacheKey, AppendContinuesIt)
{
    const auto key = ShaderProgramCache::GetShaderKey("1234", nullptr);
    EXPECT_EQ(ShaderProgramCache::Append(key, "56789"), 0xCBF43926u);
    EXPECT_EQ(ShaderProgramCache::Append(0, "ab"), 0x9E83486Du);
}

TEST(ShaderProgramCacheKey, AppendOfNothingChangesNothing)
{
    EXPECT_EQ(ShaderProgramCache::Append(0x9E83486D, nullptr), 0x9E83486Du);
    EXPECT_EQ(ShaderProgramCache::Append(0x9E83486D, ""), 0x9E83486Du);
}

TEST(ShaderProgramCacheKey, HasSixtyFourBits)
{
    static_assert(std::is_same_v<ShaderProgramCache::BinaryShaderKey, std::uint64_t>);
    static_assert(std::is_same_v<decltype(BinaryShader::length), std::int32_t>);
    static_assert(std::is_same_v<decltype(BinaryShader::format), std::uint32_t>);
}

// ---- records ------------------------------------------------------------------------------------

TEST(BinaryShaderRecord, IsEmptyAtFirst)
{
    const BinaryShader record;
    EXPECT_EQ(record.key, 0u);
    EXPECT_EQ(record.length, 0);
    EXPECT_EQ(record.format, 0u);
    EXPECT_EQ(record.bytes, nullptr);
    EXPECT_TRUE(record.attributes.empty());
}

TEST(BinaryShaderRecord, CloneHasItsOwnCopyOfEverything)
{
    auto record = std::make_unique<BinaryShader>(Record(9, "PROGRAM", {"a", ""}, 0x9130));
    const std::unique_ptr<BinaryShader> clone(record->Clone());
    EXPECT_NE(clone->bytes, record->bytes);
    record->bytes[0] = 'X';
    record.reset();

    EXPECT_EQ(clone->key, 9u);
    EXPECT_EQ(clone->length, 7);
    EXPECT_EQ(clone->format, 0x9130u);
    EXPECT_EQ(ProgramText(*clone), "PROGRAM");
    EXPECT_EQ(clone->attributes, (Texts{"a", ""}));
}

TEST(BinaryShaderRecord, CloneOfAnEmptyOneHasAnArrayOfLengthZero)
{
    const BinaryShader record;
    const std::unique_ptr<BinaryShader> clone(record.Clone());
    EXPECT_EQ(clone->length, 0);
    EXPECT_NE(clone->bytes, nullptr);
}

TEST(BinaryShaderRecord, MovesAndDoesNotCopy)
{
    static_assert(!std::is_copy_constructible_v<BinaryShader>);
    static_assert(!std::is_copy_assignable_v<BinaryShader>);
    BinaryShader first = Record(9, "PROGRAM", {"a"});
    const unsigned char* const bytes = first.bytes;

    BinaryShader second(std::move(first));
    EXPECT_EQ(second.bytes, bytes);
    EXPECT_EQ(second.length, 7);
    EXPECT_EQ(first.bytes, nullptr);
    EXPECT_EQ(first.length, 0);

    BinaryShader third = Record(3, "OLD", {"b", "c"});
    third = std::move(second);
    EXPECT_EQ(third.bytes, bytes);
    EXPECT_EQ(third.key, 9u);
    EXPECT_EQ(third.format, 0x8740u);
    EXPECT_EQ(third.attributes, Texts{"a"});
}

// ---- memory -------------------------------------------------------------------------------------

TEST_F(ProgramCache, IsOne)
{
    EXPECT_NE(cache, nullptr);
    EXPECT_EQ(ShaderProgramCache::GetInstance(), cache);
}

TEST_F(ProgramCache, KeepsACopy)
{
    {
        BinaryShader record = Record(5, "PROGRAM", {"a_pos", "a_color"});
        EXPECT_TRUE(cache->SetBinaryShader(record));
        record.bytes[0] = 'X';
    }
    const BinaryShader* const kept = cache->GetBinaryShader(5);
    ASSERT_NE(kept, nullptr);
    EXPECT_EQ(kept->key, 5u);
    EXPECT_EQ(kept->format, 0x8740u);
    EXPECT_EQ(ProgramText(*kept), "PROGRAM");
    EXPECT_EQ(kept->attributes, (Texts{"a_pos", "a_color"}));
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ProgramCache, AnswersFromMemoryWithoutTheFile)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "PROGRAM")));
    const BinaryShader* const first = cache->GetBinaryShader(5);
    ASSERT_TRUE(fs::remove(folder.File("sh5.dat")));
    EXPECT_EQ(cache->GetBinaryShader(5), first);
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ProgramCache, LoadsAFileOnce)
{
    WriteBytes(folder.File("sh77.dat"), FileFields::Of("BINARY", {"a"}).File());
    const BinaryShader* const loaded = cache->GetBinaryShader(77);
    ASSERT_NE(loaded, nullptr);
    EXPECT_EQ(loaded->key, 77u);
    EXPECT_EQ(loaded->length, 6);
    EXPECT_EQ(ProgramText(*loaded), "BINARY");
    EXPECT_EQ(loaded->attributes, Texts{"a"});

    ASSERT_TRUE(fs::remove(folder.File("sh77.dat")));
    EXPECT_EQ(cache->GetBinaryShader(77), loaded);
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ProgramCache, AMissingFileIsAnErrorLineEachTime)
{
    const std::string line =
        "ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
        "ShaderProgramCache::BinaryShaderKey) Failed to create shader binary file. Err=2. File=" +
        folder.File("sh42.dat");
    EXPECT_EQ(cache->GetBinaryShader(42), nullptr);
    EXPECT_EQ(Errors(), Texts{line});
    EXPECT_EQ(cache->GetBinaryShader(42), nullptr);
    EXPECT_EQ(Errors(), (Texts{line, line}));
}

TEST_F(ProgramCache, AFileThatComesLaterIsFound)
{
    EXPECT_EQ(cache->GetBinaryShader(42), nullptr);
    WriteBytes(folder.File("sh42.dat"), FileFields().File());
    EXPECT_NE(cache->GetBinaryShader(42), nullptr);
}

TEST_F(ProgramCache, AGoodFileUnderAWrongNameLoads)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(1, "PROGRAM")));
    fs::rename(folder.File("sh1.dat"), folder.File("sh2.dat"));
    ASSERT_NE(cache->GetBinaryShader(2), nullptr);
    EXPECT_EQ(cache->GetBinaryShader(2)->key, 2u);
}

// ---- replacing ----------------------------------------------------------------------------------

TEST_F(ProgramCache, AStoreOfAKnownKeyReplacesRecordAndFile)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "OLD PROGRAM", {"a", "b"})));
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "NEW", {"c"}, 0x9130)));

    EXPECT_EQ(Warnings(), Texts{kReplaced});
    EXPECT_EQ(driver.Log().size(), 1u);
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "NEW");
    EXPECT_EQ(cache->GetBinaryShader(5)->format, 0x9130u);
    EXPECT_EQ(cache->GetBinaryShader(5)->attributes, Texts{"c"});
    FileFields fields = FileFields::Of("NEW", {"c"});
    fields.format = 0x9130;
    EXPECT_EQ(ReadBytes(folder.File("sh5.dat")), fields.File());
    EXPECT_EQ(folder.Names(), Texts{"sh5.dat"});
}

TEST_F(ProgramCache, AStoreOfALoadedKeyReplacesIt)
{
    WriteBytes(folder.File("sh5.dat"), FileFields().File());
    ASSERT_NE(cache->GetBinaryShader(5), nullptr);
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_EQ(Warnings(), Texts{kReplaced});
    EXPECT_EQ(ReadBytes(folder.File("sh5.dat")), FileFields::Of("NEW", {}).File());
}

TEST_F(ProgramCache, AStoreOverARefusedFileIsAFirstStore)
{
    WriteBytes(folder.File("sh5.dat"), Bytes(4000, 'x'));
    EXPECT_EQ(cache->GetBinaryShader(5), nullptr);
    EXPECT_TRUE(fs::exists(folder.File("sh5.dat"))) << "a refused file stays";
    driver.ForgetLog();

    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_EQ(driver.Log().size(), 0u);
    EXPECT_EQ(ReadBytes(folder.File("sh5.dat")), FileFields::Of("NEW", {}).File());
}

TEST_F(ProgramCache, ARecordMayReplaceItself)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "PROGRAM", {"a_pos"})));
    EXPECT_TRUE(cache->SetBinaryShader(*cache->GetBinaryShader(5)));
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "PROGRAM");
    EXPECT_EQ(cache->GetBinaryShader(5)->attributes, Texts{"a_pos"});
}

TEST_F(ProgramCache, AReplacedRecordLivesWhileItIsHeld)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "OLD")));
    const std::shared_ptr<const BinaryShader> held = cache->HoldBinaryShader(5);
    EXPECT_EQ(held.get(), cache->GetBinaryShader(5));
    EXPECT_TRUE(cache->IsCurrent(held.get()));

    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_EQ(ProgramText(*held), "OLD");
    EXPECT_FALSE(cache->IsCurrent(held.get()));
    EXPECT_TRUE(cache->IsCurrent(cache->GetBinaryShader(5)));
}

TEST_F(ProgramCache, ARecordOfAnUnknownKeyIsNotCurrent)
{
    const BinaryShader foreign = Record(6, "P");
    EXPECT_FALSE(cache->IsCurrent(&foreign));
}

TEST_F(ProgramCache, KeysDoNotInterfere)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(1, "ONE")));
    EXPECT_TRUE(cache->SetBinaryShader(Record(2, "TWO")));
    EXPECT_TRUE(cache->SetBinaryShader(Record(0, "ZERO")));
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(1)), "ONE");
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(2)), "TWO");
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(0)), "ZERO");
    EXPECT_EQ(folder.Names(), (Texts{"sh0.dat", "sh1.dat", "sh2.dat"}));
}

TEST_F(ProgramCache, FileNamesHoldTheWholeKey)
{
    EXPECT_TRUE(cache->SetBinaryShader(Record(0xFFFFFFFF, "P")));
    EXPECT_TRUE(cache->SetBinaryShader(Record(18446744073709551615u, "P")));
    EXPECT_EQ(folder.Names(), (Texts{"sh18446744073709551615.dat", "sh4294967295.dat"}));
}

// ---- what somebody planted ----------------------------------------------------------------------

TEST_F(ProgramCache, ALinkInPlaceOfAFileIsNotRead)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "good.dat", FileFields().File());
    fs::create_symlink(elsewhere / "good.dat", folder.File("sh5.dat"));

    EXPECT_EQ(cache->GetBinaryShader(5), nullptr);
    EXPECT_EQ(Errors(),
              (Texts{"ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
                     "ShaderProgramCache::BinaryShaderKey) Failed to create shader binary file. "
                     "Err=40. File=" +
                     folder.File("sh5.dat")}));
}

TEST_F(ProgramCache, ALinkInPlaceOfAFileIsReplacedNotWrittenThrough)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "victim", Bytes{'v'});
    fs::create_symlink(elsewhere / "victim", folder.File("sh5.dat"));

    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_EQ(ReadBytes(elsewhere / "victim"), Bytes{'v'});
    EXPECT_TRUE(fs::is_regular_file(fs::symlink_status(folder.File("sh5.dat"))));
    EXPECT_EQ(ReadBytes(folder.File("sh5.dat")), FileFields::Of("NEW", {}).File());
}

TEST_F(ProgramCache, ALinkUnderATemporaryNameIsPassedOver)
{
    const TemporaryFolder elsewhere;
    const std::string temporary = "sh5.dat." + std::to_string(getpid()) + ".0.tmp";
    fs::create_symlink(elsewhere / "victim", folder.File(temporary));

    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_FALSE(fs::exists(elsewhere / "victim"));
    EXPECT_EQ(folder.Names(), (Texts{"sh5.dat", temporary}));
    EXPECT_EQ(driver.Log().size(), 0u);
}

TEST_F(ProgramCache, APipeInPlaceOfAFileIsRefusedWithoutWaitingForItsOtherEnd)
{
    ASSERT_EQ(mkfifo(folder.File("sh5.dat").c_str(), 0600), 0);

    EXPECT_EQ(cache->GetBinaryShader(5), nullptr);
    EXPECT_EQ(Errors(),
              (Texts{"ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
                     "ShaderProgramCache::BinaryShaderKey) File header read error Err=0, File = " +
                     folder.File("sh5.dat")}));
}

TEST_F(ProgramCache, ALinkInPlaceOfTheFolderIsNotReadThrough)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "sh5.dat", FileFields().File());
    fs::remove(folder.Path());
    fs::create_symlink(elsewhere.Path(), folder.Path());

    EXPECT_EQ(cache->GetBinaryShader(5), nullptr);
    EXPECT_EQ(Errors(),
              (Texts{"ShaderProgramCache::BinaryShader *Nib::ShaderProgramCache::LoadFromFile("
                     "ShaderProgramCache::BinaryShaderKey) Failed to create shader binary file. "
                     "Err=40. File=" +
                     folder.File("sh5.dat")}));
}

TEST_F(ProgramCache, ALinkInPlaceOfTheFolderIsNotReadThroughWhileTheFolderLivesOn)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "sh5.dat", FileFields::Of("PLANTED", {}).File());
    WriteBytes(folder.File("sh5.dat"), FileFields::Of("OWN", {}).File());
    fs::rename(folder.Path(), folder.Path() + "-moved");
    fs::create_symlink(elsewhere.Path(), folder.Path());

    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "OWN");
}

TEST_F(ProgramCache, AFolderMadeAnewIsReadFrom)
{
    fs::remove(folder.Path());
    fs::create_directory(folder.Path());
    WriteBytes(folder.File("sh5.dat"), FileFields::Of("FIRST", {}).File());
    WriteBytes(folder.File("sh6.dat"), FileFields::Of("SECOND", {}).File());

    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(5)), "FIRST");
    EXPECT_EQ(ProgramText(*cache->GetBinaryShader(6)), "SECOND");
    EXPECT_EQ(Errors(), Texts());
}

TEST_F(ProgramCache, ALinkInPlaceOfTheFolderIsNotWrittenThrough)
{
    const TemporaryFolder elsewhere;
    fs::remove(folder.Path());
    fs::create_symlink(elsewhere.Path(), folder.Path());

    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_TRUE(fs::is_empty(elsewhere.Path()));
    EXPECT_EQ(Errors(),
              (Texts{"bool Nib::ShaderProgramCache::SaveToFile(const "
                     "ShaderProgramCache::BinaryShader *) Failed to create shader binary file. "
                     "Err=40. File=" +
                         folder.File("sh5.dat"),
                     "bool Nib::ShaderProgramCache::SetBinaryShader(const "
                     "ShaderProgramCache::BinaryShader &) - Failed to save cloned binary shader"}));
}

TEST_F(ProgramCache, AReplacementRemovesNothingBehindALinkInPlaceOfTheFolder)
{
    const TemporaryFolder elsewhere;
    WriteBytes(elsewhere / "sh5.dat", Bytes{'v'});
    EXPECT_TRUE(cache->SetBinaryShader(Record(5, "OLD")));
    fs::remove_all(folder.Path());
    fs::create_symlink(elsewhere.Path(), folder.Path());

    EXPECT_FALSE(cache->SetBinaryShader(Record(5, "NEW")));
    EXPECT_EQ(ReadBytes(elsewhere / "sh5.dat"), Bytes{'v'});
}

// ---- attribute blocks ---------------------------------------------------------------------------

namespace
{

struct Parsed
{
    bool ok;
    Texts names;
    bool operator==(const Parsed&) const = default;
};

std::ostream& operator<<(std::ostream& out, const Parsed& parsed)
{
    return out << parsed.ok << testing::PrintToString(parsed.names);
}

template <std::size_t N>
Parsed Parse(const char (&text)[N])
{
    const Bytes bytes(text, text + N - 1); // on the heap, and without the literal's own NUL
    Parsed parsed = {};
    parsed.ok = ShaderProgramCache::ParseShaderAttributes(
        bytes.data(), static_cast<unsigned int>(bytes.size()), parsed.names);
    return parsed;
}

} // namespace

TEST(ParseShaderAttributes, NoDataIsNoNames)
{
    Texts names;
    EXPECT_TRUE(ShaderProgramCache::ParseShaderAttributes(nullptr, 0, names));
    EXPECT_TRUE(names.empty());
}

TEST(ParseShaderAttributes, NamesEndWithNul)
{
    EXPECT_EQ(Parse("a_pos\0"), (Parsed{true, {"a_pos"}}));
    EXPECT_EQ(Parse("a_pos\0a_color\0"), (Parsed{true, {"a_pos", "a_color"}}));
}

TEST(ParseShaderAttributes, EmptyNamesCount)
{
    EXPECT_EQ(Parse("\0"), (Parsed{true, {""}}));
    EXPECT_EQ(Parse("\0a\0\0"), (Parsed{true, {"", "a", ""}}));
}

TEST(ParseShaderAttributes, ABlockThatDoesNotEndWithNulIsRefused)
{
    EXPECT_EQ(Parse("a_pos"), (Parsed{false, {}}));
    EXPECT_EQ(Parse("a_pos\0a_color"), (Parsed{false, {"a_pos"}}));
}

TEST(ParseShaderAttributes, NamesAreAppended)
{
    Texts names{"first"};
    const unsigned char block[] = {'b', 0};
    EXPECT_TRUE(ShaderProgramCache::ParseShaderAttributes(block, 2, names));
    EXPECT_EQ(names, (Texts{"first", "b"}));
}
