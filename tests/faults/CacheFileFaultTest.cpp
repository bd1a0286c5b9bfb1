#include "faults/FileFaults.h"
#include "faults/ForkedRun.h"
#include "faults/Stride.h"
#include "gles/BoundQueue.h"
#include "gles/CacheFiles.h"
#include "gles/GlesFixture.h"

#include <nib/renderer_factory.h>

#include <gtest/gtest.h>

#include <iostream>
#include <sstream>

// Two programs are built and drawn with, again and again, each time with another system call on the
// files of the program cache going wrong.

using namespace Nib;

namespace
{

constexpr const char* kVertex[] = {
    "attribute vec2 a_pos;\nvoid main() { gl_Position = vec4(a_pos, 0, 1); }\n",
    "attribute vec2 a_pos;\nattribute vec4 a_tint;\nvarying vec4 v_tint;\n"
    "void main() { v_tint = a_tint; gl_Position = vec4(a_pos, 0, 1); }\n"};
constexpr const char* kFragment[] = {
    "precision mediump float;\nvoid main() { gl_FragColor = vec4(1); }\n",
    "precision mediump float;\nvarying vec4 v_tint;\nvoid main() { gl_FragColor = v_tint; }\n"};

SimGpu Driver(bool isNewer = false)
{
    const SimGpu gpu = SimGpu::Default();
    return isNewer ? gpu.WithVersion(gpu.version + " newer") : gpu;
}

/// The open descriptors of the process: those of @p folder, and the others.
struct OpenFiles
{
    explicit OpenFiles(const std::string& folder)
    {
        for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd"))
        {
            std::error_code gone; // the iterator's own
            const std::string path = read_symlink(entry.path(), gone);
            ++(path.rfind(folder, 0) == 0 && path.find(".dat") == path.npos ? folders : others);
        }
    }

    std::size_t folders = 0;
    std::size_t others = 0;
};

/// What one process did with the programs and the folder.
struct Build
{
    RunResult run;
    std::vector<std::string> fileCalls;
    std::string pictures;
    std::string exceptions;
    int errors = 0;
    int compilations = 0;
    int filesLeftOpen = 0;
    int foldersLeftOpen = 0;
};

void DrawEach(SimDriver& driver, std::ostream& report)
{
    for (std::size_t i = 0; i < std::size(kVertex); ++i)
    {
        const std::unique_ptr<IShaderProgram, Releaser> program(
            RendererFactory::CreateShaderProgram(kVertex[i], kFragment[i], nullptr));
        unsigned char pixel[4] = {};
        glClear(GL_COLOR_BUFFER_BIT);
        program->Activate();
        glDrawArrays(GL_POINTS, 0, 1);
        program->Deactivate();
        glReadPixels(0, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel);
    }
    report << "pictures";
    for (const SimPicture& picture : driver.Pictures())
        report << "/" << picture.digest;
    report << "\n";
}

std::string DoBuild(const std::string& folder, const SimGpu& gpu, const FileFault& fault)
{
    std::ostringstream report;
    const std::string cacheFolder = folder + "/RendererCache";
    const OpenFiles before(cacheFolder);
    WatchFiles(cacheFolder, fault);
    System::SetSDKCacheDirectoryPath((folder + "/sdk").c_str());
    {
        SimDriver driver(gpu);
        const SimContext context(driver);
        const BoundQueue queue;
        driver.NotePictures(true);
        try
        {
            DrawEach(driver, report);
        }
        catch (const std::exception& failure)
        {
            report << "exception " << failure.what() << "\n";
        }
        report << "errors " << driver.LogTexts(ANDROID_LOG_ERROR).size() << "\n";
        report << "compilations " << driver.CallCount("glCompileShader") << "\n";
    }
    for (const std::string& call : FileCalls())
        report << "call " << call << "\n";
    const OpenFiles after(cacheFolder);
    report << "open " << after.others - before.others << "\n";
    report << "folders " << after.folders - before.folders << "\n";
    return report.str();
}

Build BuildOnce(const std::string& folder, const SimGpu& gpu, const FileFault& fault = {})
{
    Build build;
    build.run = RunInChild([&] { return DoBuild(folder, gpu, fault); });
    std::istringstream lines(build.run.report);
    for (std::string word; lines >> word;)
    {
        if (word == "call")
            lines >> build.fileCalls.emplace_back();
        else if (word == "errors")
            lines >> build.errors;
        else if (word == "compilations")
            lines >> build.compilations;
        else if (word == "open")
            lines >> build.filesLeftOpen;
        else if (word == "folders")
            lines >> build.foldersLeftOpen;
        else if (word == "exception")
            std::getline(lines, build.exceptions);
        else
            build.pictures = word;
    }
    return build;
}

/// What can go wrong with a call of @p name.
std::vector<FileFault> FaultsOf(const std::string& name)
{
    std::vector<FileFault> faults{{0, FileFault::Vanish, 0}};
    const auto fail = [&](std::initializer_list<int> errors)
    {
        for (const int error : errors)
            faults.push_back({0, FileFault::Error, error});
    };
    if (name == "open")
        fail({EACCES, EINTR, EMFILE, ENOSPC, EROFS});
    else if (name == "read" || name == "write")
        fail({EINTR, EIO, ENOSPC});
    else if (name == "close")
        fail({EIO});
    else
        fail({EACCES, EROFS});
    if (name == "read" || name == "write")
    {
        faults.push_back({0, FileFault::Short, 0});
        faults.push_back({0, FileFault::ShortOnce, name == "read" ? EIO : ENOSPC});
    }
    if (name == "read")
        faults.push_back({0, FileFault::NoMore, 0});
    return faults;
}

class CacheFileFault : public testing::Test
{
protected:
    /// How the folder is before each run.
    using Prepare = std::function<void(const std::string& folder)>;

    void Sweep(const Prepare& prepare, const std::string& what)
    {
        const Build whole = Prepared(prepare, {});
        ASSERT_EQ(whole.run.end, "") << whole.run.messages;
        ASSERT_GE(whole.fileCalls.size(), 8u);
        std::size_t run = 0;
        for (std::size_t n = 1; n <= whole.fileCalls.size(); ++n)
        {
            for (FileFault fault : FaultsOf(whole.fileCalls[n - 1]))
            {
                fault.call = n;
                if (run++ % Stride() == 0)
                    Try(prepare, whole, fault);
            }
        }
        std::cout << "RELIABILITY | each file operation of the program cache gone wrong, " << what
                  << StrideText() << " | " << m_runs << " | " << m_lost << "\n";
    }

    static void WithGoodFiles(const std::string& folder) { BuildOnce(folder, Driver()); }

private:
    Build Prepared(const Prepare& prepare, const FileFault& fault)
    {
        m_folder = std::make_unique<TemporaryFolder>();
        prepare(m_folder->Path());
        return BuildOnce(m_folder->Path(), Driver(), fault);
    }

    void Try(const Prepare& prepare, const Build& whole, const FileFault& fault)
    {
        const std::string at =
            "call " + std::to_string(fault.call) + " " + whole.fileCalls[fault.call - 1] +
            ", fault " + std::to_string(fault.kind) + ", errno " + std::to_string(fault.error);
        const int before =
            testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count();
        SCOPED_TRACE(at);
        const Build build = Prepared(prepare, fault);
        Check(build, whole);
        CheckFolder(build, whole);
        CheckNextStart(whole);
        ++m_runs;
        m_lost +=
            testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count() >
                    before
                ? 1
                : 0;
    }

    static void Check(const Build& build, const Build& whole)
    {
        EXPECT_EQ(build.run.end, "") << build.run.messages << build.run.stuck;
        EXPECT_EQ(build.exceptions, "");
        EXPECT_EQ(build.pictures, whole.pictures);
        EXPECT_EQ(build.filesLeftOpen, whole.filesLeftOpen);
        EXPECT_LE(build.foldersLeftOpen, 1) << "the handle of the cache folder, at most";
    }

    /// Files that are there are whole or will be refused; one that should be there and is not was
    /// told of.
    void CheckFolder(const Build& build, const Build& whole) const
    {
        std::size_t good = 0;
        std::error_code absent;
        const std::string folder = *m_folder / "RendererCache";
        for (const auto& entry : std::filesystem::directory_iterator(folder, absent))
            good += ShaderProgramCache::CheckFile(entry.path().c_str(), nullptr).empty() ? 1 : 0;
        const bool isVanished = absent || good == 0;
        if (good < std::size(kVertex) && !isVanished)
        {
            EXPECT_GT(build.errors, whole.errors);
        }
    }

    /// The next process finds nothing that misleads it, and puts all in order.
    void CheckNextStart(const Build& whole) const
    {
        const Build next = BuildOnce(m_folder->Path(), Driver());
        EXPECT_EQ(next.run.end, "") << next.run.messages << next.run.stuck;
        EXPECT_EQ(next.pictures, whole.pictures);
        const Build last = BuildOnce(m_folder->Path(), Driver());
        EXPECT_EQ(last.pictures, whole.pictures);
        EXPECT_EQ(last.compilations, 0);
        std::size_t files = 0;
        for (const auto& entry : std::filesystem::directory_iterator(*m_folder / "RendererCache"))
        {
            ++files;
            EXPECT_EQ(ShaderProgramCache::CheckFile(entry.path().c_str(), nullptr), "")
                << entry.path();
        }
        EXPECT_EQ(files, std::size(kVertex));
    }

    std::unique_ptr<TemporaryFolder> m_folder;
    int m_runs = 0;
    int m_lost = 0;
};

} // namespace

TEST_F(CacheFileFault, AtTheFirstStart)
{
    Sweep([](const std::string&) {}, "first start");
}

TEST_F(CacheFileFault, AtALaterStart)
{
    Sweep(&WithGoodFiles, "later start");
}

TEST_F(CacheFileFault, WhenAnotherDriversFilesAreReplaced)
{
    Sweep([](const std::string& folder) { BuildOnce(folder, Driver(true)); },
          "files of another driver");
}

TEST_F(CacheFileFault, WhenDamagedFilesAreReplaced)
{
    const auto damage = [](const std::string& folder)
    {
        WithGoodFiles(folder);
        for (const auto& entry : std::filesystem::directory_iterator(folder + "/RendererCache"))
            std::filesystem::resize_file(entry.path(), 50);
    };
    Sweep(damage, "damaged files");
}

TEST_F(CacheFileFault, InAFolderWithAnEndedWritersFile)
{
    const auto leave = [](const std::string& folder)
    {
        WithGoodFiles(folder);
        WriteBytes(folder + "/RendererCache/sh5.dat.999999999.0.tmp", Bytes{'x'});
    };
    Sweep(leave, "a leftover beside the files");
}
