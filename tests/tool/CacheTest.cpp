#include "RunNib.h"

#include <nib/shader_cache.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>
#include <string>
#include <vector>

#include <unistd.h>
#include <zlib.h>

namespace
{

namespace fs = std::filesystem;
using Json = nlohmann::json;
using Texts = std::vector<std::string>;

std::string Number(std::uint64_t number)
{
    std::string bytes;
    for (int shift = 0; shift < 64; shift += 8)
        bytes += static_cast<char>(number >> shift);
    return bytes;
}

/// A file with the program "PROG" and the attribute "a_pos".
std::string WholeFile()
{
    std::string file = Number(0xACDCACDC) + Number(0x8740) + Number(4) + Number(6) + Number(1);
    file += "PROG";
    file += std::string("a_pos\0", 6);
    const uLong sum =
        crc32(0, reinterpret_cast<const Bytef*>(file.data()), static_cast<uInt>(file.size()));
    return file + Number(sum);
}

/// A cache folder with a whole file, one cut short, one that another process may be writing, and a
/// foreign one.
class Cache : public testing::Test
{
protected:
    Cache()
    {
        m_folder.Write("sh7.dat", WholeFile());
        m_folder.Write("sh8.dat", WholeFile().substr(0, 42));
        m_folder.Write(Leftover(), "x");
        m_folder.Write("notes.txt", "mine");
    }

    std::string Folder() const { return m_folder.Path("."); }
    static std::string Leftover() { return "sh9.dat.999999999.0.tmp"; } // no such process

    NibResult Run(Texts arguments) const
    {
        arguments.insert(arguments.begin(), "cache");
        arguments.push_back(Folder());
        return RunNib(arguments);
    }

    TemporaryFolder m_folder;
};

TEST_F(Cache, ListNamesItsFilesAlone)
{
    const NibResult run = Run({"list"});

    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, Folder() + "\n"
                                  "        58  program        sh7.dat\n"
                                  "        42  program        sh8.dat\n"
                                  "         1  leftover       sh9.dat.999999999.0.tmp\n"
                                  "       101  bytes in 3 files\n");
    EXPECT_EQ(run.err, "");
}

TEST_F(Cache, ListAsJson)
{
    const NibResult run = Run({"list", "--json"});

    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(
        Json::parse(run.out),
        Json({{"folder", Folder()},
              {"files",
               {{{"name", "sh7.dat"}, {"kind", "program"}, {"bytes", 58}, {"key", 7}},
                {{"name", "sh8.dat"}, {"kind", "program"}, {"bytes", 42}, {"key", 8}},
                {{"name", Leftover()}, {"kind", "leftover"}, {"bytes", 1}, {"key", nullptr}}}}}));
}

TEST_F(Cache, VerifyTellsWhatWouldBeRefusedAndWhy)
{
    const NibResult run = Run({"verify"});

    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.out, "whole    sh7.dat               format 0x8740, 4 bytes, 1 attributes\n"
                       "refused  sh8.dat               cut short in the program\n"
                       "2 files, 1 refused\n");
    EXPECT_EQ(run.err, "");
}

TEST_F(Cache, VerifyOfWholeFilesSucceeds)
{
    fs::remove(m_folder.Path("sh8.dat"));

    EXPECT_EQ(Run({"verify"}).status, 0);
}

TEST_F(Cache, VerifyAsJson)
{
    const NibResult run = Run({"verify", "--json"});

    EXPECT_EQ(run.status, 1);
    const Json report = Json::parse(run.out);
    EXPECT_EQ(report["refused"], 1);
    EXPECT_EQ(report["files"][0], Json({{"name", "sh7.dat"},
                                        {"kind", "program"},
                                        {"bytes", 58},
                                        {"key", 7},
                                        {"whole", true},
                                        {"problem", nullptr},
                                        {"format", 0x8740},
                                        {"programBytes", 4},
                                        {"attributes", {"a_pos"}}}));
    EXPECT_EQ(report["files"][1]["whole"], false);
    EXPECT_EQ(report["files"][1]["problem"], "cut short in the program");
}

TEST_F(Cache, ClearRemovesItsFilesAlone)
{
    const NibResult run = Run({"clear"});

    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, "removed 3 files, 101 bytes\n");
    EXPECT_EQ(m_folder.Files(), Texts{"notes.txt"});
}

TEST_F(Cache, ClearLeavesWhatALivingProcessWrites)
{
    const std::string written = "sh5.dat." + std::to_string(getpid()) + ".0.tmp";
    m_folder.Write(written, "x");

    const NibResult run = Run({"clear", "--json"});

    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(Json::parse(run.out)["kept"], Json({written + ": it is being written"}));
    EXPECT_EQ(m_folder.Files(), (Texts{"notes.txt", written}));
}

TEST_F(Cache, ClearKeepsAFolderOfAFilesName)
{
    fs::create_directory(m_folder.Path("sh6.dat"));

    EXPECT_EQ(Run({"clear"}).status, 1);
    EXPECT_EQ(m_folder.Files(), (Texts{"notes.txt", "sh6.dat"}));
}

TEST_F(Cache, TheFolderOfTheEnvironmentIsTheDefault)
{
    fs::create_directory(m_folder.Path("RendererCache"));
    m_folder.Write("RendererCache/sh3.dat", WholeFile());

    const NibResult run = RunNib({"cache", "verify"}, {{"NIB_CACHE_DIR", m_folder.Path("sdk")}});

    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, "whole    sh3.dat               format 0x8740, 4 bytes, 1 attributes\n"
                       "1 files, 0 refused\n");
}

TEST_F(Cache, ADefaultFolderThatIsNotThereIsEmpty)
{
    const NibResult run = RunNib({"cache", "list"}, {{"NIB_CACHE_DIR", m_folder.Path("sdk")}});

    EXPECT_EQ(run.status, 0);
    EXPECT_EQ(run.out, m_folder.Path("RendererCache") + "\n         0  bytes in 0 files\n");
}

TEST_F(Cache, AFolderThatCannotBeReadIsAnError)
{
    const NibResult run = RunNib({"cache", "list", m_folder.Path("none")});

    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err,
              "nib: '" + m_folder.Path("none") + "' cannot be read: No such file or directory\n");
    EXPECT_EQ(run.out, "");
}

TEST_F(Cache, NeedsOneOfItsCommands)
{
    EXPECT_EQ(RunNib({"cache"}).status, 2);
    EXPECT_EQ(RunNib({"cache", "polish"}).status, 2);
    EXPECT_EQ(RunNib({"cache", "list", "--fast"}).status, 2);
    EXPECT_EQ(m_folder.Files().size(), 4u);
}

TEST_F(Cache, HelpNamesTheCommands)
{
    const NibResult run = RunNib({"cache", "--help"});

    EXPECT_EQ(run.status, 0);
    for (const char* word : {"list", "verify", "clear"})
        EXPECT_NE(run.out.find(word), std::string::npos) << word;
}

} // namespace
