#include "HostileFiles.h"

#include "Recording.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

// Files that are broken or made to do harm: each is read right, or refused in one line that names
// file and line; in less than 512 MiB, with work in proportion to the size of the file. The readers
// of this program count their own steps.

namespace
{

std::uint64_t g_steps = 0; // basic blocks that the readers ran

} // namespace

extern "C" __attribute__((no_sanitize("address", "undefined"))) void __sanitizer_cov_trace_pc()
{
    ++g_steps;
}

namespace
{

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kMemoryIsOurs = false;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
constexpr bool kMemoryIsOurs = false;
#else
constexpr bool kMemoryIsOurs = true;
#endif
#else
constexpr bool kMemoryIsOurs = true;
#endif

std::string TextOf(const std::string& path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

/// A file of this test's own, removed at its end.
class OwnFile
{
public:
    explicit OwnFile(const std::string& text)
        : m_path(std::filesystem::temp_directory_path() /
                 ("nib_hostile_" + std::to_string(getpid())))
    {
        Write(text);
    }
    ~OwnFile() { std::filesystem::remove(m_path); }
    OwnFile(const OwnFile&) = delete;
    OwnFile& operator=(const OwnFile&) = delete;

    void Write(const std::string& text) const
    {
        std::ofstream(m_path, std::ios::binary).write(text.data(), std::ssize(text));
    }
    std::string Path() const { return m_path; }

private:
    std::filesystem::path m_path;
};

/// What becomes of a file: a recording, or the problem behind "FILE:LINE: ".
struct Outcome
{
    std::optional<Ink::Recording> recording;
    std::string problem;
};

Outcome Read(const std::string& path)
{
    try
    {
        return {Ink::ReadRecording(path), ""};
    }
    catch (const Ink::ReadError& error)
    {
        const std::string text = error.what();
        std::size_t end = path.size() + 1;
        EXPECT_EQ(text.substr(0, end), path + ":") << text;
        while (end < text.size() && text[end] >= '0' && text[end] <= '9')
            ++end;
        EXPECT_GT(end, path.size() + 1) << text;
        EXPECT_EQ(text.substr(end, 2), ": ") << text;
        EXPECT_EQ(text.find('\n'), std::string::npos) << text;
        return {std::nullopt, text.substr(std::min(text.size(), end + 2))};
    }
}

bool IsRight(const Ink::Recording& recording)
{
    double time = -INFINITY;
    for (const Ink::Stroke& stroke : recording.strokes)
    {
        if (stroke.empty())
            return false;
        for (const Ink::Sample& sample : stroke)
        {
            if (!std::isfinite(sample.x) || !std::isfinite(sample.y) ||
                !(sample.pressure >= 0 && sample.pressure <= 1) || !(sample.time >= time))
                return false;
            time = sample.time;
        }
    }
    return !recording.strokes.empty();
}

std::vector<Ink::Sample> Written(const Ink::Recording& recording)
{
    std::vector<Ink::Sample> samples;
    for (const Ink::Stroke& stroke : recording.strokes)
        samples.insert(samples.end(), stroke.begin(), stroke.end());
    return samples;
}

/// Whether what was read is how the whole file begins. Where that may end without an end of line,
/// nothing tells that its very last number, a pressure, has lost digits: @p lastIsCut.
bool BeginsAs(const Ink::Recording& cut, const Ink::Recording& whole, bool lastIsCut)
{
    const auto same = [](const Ink::Sample& a, const Ink::Sample& b)
    { return a.x == b.x && a.y == b.y && a.time == b.time && a.pressure == b.pressure; };
    std::vector<Ink::Sample> a = Written(cut), b = Written(whole);
    if (lastIsCut && a.size() == b.size())
        a.back().pressure = b.back().pressure;
    return a.size() <= b.size() && std::equal(a.begin(), a.end(), b.begin(), same);
}

/// Cuts the file at every 97th byte.
void ExpectCutsAreRefusedOrRight(const std::string& path)
{
    const std::string text = TextOf(path);
    const Outcome whole = Read(path);
    ASSERT_TRUE(whole.recording) << path << ": " << whole.problem;
    const OwnFile file("");
    for (std::size_t size = 0; size < text.size(); size += 97)
    {
        file.Write(text.substr(0, size));
        const Outcome cut = Read(file.Path());
        if (cut.recording)
            EXPECT_TRUE(BeginsAs(*cut.recording, *whole.recording, text.back() != '\n'))
                << path << " cut at " << size;
        else
            EXPECT_NE(cut.problem, "") << path << " cut at " << size;
    }
}

bool IsFull()
{
    return std::getenv("NIB_HOSTILE") != nullptr;
}

class Hostile : public testing::TestWithParam<HostileFile>
{
};

std::string NameOf(const testing::TestParamInfo<HostileFile>& info)
{
    return info.param.name;
}

/// The greatest memory, in MiB, of a process that reads the file, and 0 for one that was killed.
long MemoryToRead(const std::string& path)
{
    const pid_t child = fork();
    if (child == 0)
    {
        const Outcome outcome = Read(path);
        _exit(outcome.recording || !outcome.problem.empty() ? 0 : 1);
    }
    int status = -1;
    rusage usage{};
    wait4(child, &status, 0, &usage);
    return WIFEXITED(status) && WEXITSTATUS(status) == 0 ? usage.ru_maxrss / 1024 : 0;
}

} // namespace

// ---- cut files ----------------------------------------------------------------------------------

TEST(CutFiles, OwnSampleIsRefusedWhereverItEnds)
{
    ExpectCutsAreRefusedOrRight(NIB_SAMPLE);
}

TEST(CutFiles, FurtherRecordingsAreRefusedOrRightWhereverTheyEnd)
{
    const char* const folder = std::getenv("NIB_STROKES");
    if (!folder)
        GTEST_SKIP() << "NIB_STROKES does not name the folder of further recordings";
    int count = 0;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(folder))
    {
        const std::string type = entry.path().extension().string();
        const bool isRecording = type == ".dat" || type == ".svc" || type == ".json" ||
                                 (type == ".txt" && entry.path().parent_path() != folder);
        // The two large ones are read thousands of times.
        if (!isRecording || entry.path().filename() == "LICENSE.txt" ||
            (entry.file_size() > 50000 && !IsFull()))
            continue;
        ExpectCutsAreRefusedOrRight(entry.path());
        ++count;
    }
    EXPECT_GE(count, IsFull() ? 69 : 66);
}

// ---- what is said, and how much work it is ------------------------------------------------------

TEST_P(Hostile, IsReadRightOrRefused)
{
    const OwnFile file(GetParam().make(1000));

    const Outcome outcome = Read(file.Path());

    if (GetParam().problem)
        EXPECT_EQ(outcome.problem.substr(0, std::string(GetParam().problem).size()),
                  GetParam().problem);
    else
        EXPECT_TRUE(outcome.recording && IsRight(*outcome.recording)) << outcome.problem;
}

TEST_P(Hostile, TakesWorkInProportionToItsSize)
{
    const auto stepsOf = [](std::size_t count)
    {
        const OwnFile file(GetParam().make(count));
        g_steps = 0;
        Read(file.Path());
        return static_cast<double>(g_steps);
    };

    const double few = stepsOf(2000);
    const double many = stepsOf(16000);

    EXPECT_GT(few, 0);
    EXPECT_LT(many, 8.8 * few) << few << " steps, then " << many;
}

TEST_P(Hostile, NeedsLessMemoryThanItMay)
{
    if (!kMemoryIsOurs)
        GTEST_SKIP() << "the sanitizer's own memory counts, too";
    // 128 MiB, or a part of that: what is refused for its size is refused early.
    const std::size_t one = GetParam().make(1001).size() - GetParam().make(1).size();
    const std::size_t most = (std::size_t{128} << 20) / (one / 1000 + 1);
    const OwnFile file(GetParam().make(IsFull() ? most : most / 64));

    const long memory = MemoryToRead(file.Path());

    RecordProperty("MiB", static_cast<int>(memory));
    EXPECT_GT(memory, 0) << "did not end by itself";
    EXPECT_LT(memory, IsFull() ? 512 : 64);
}

INSTANTIATE_TEST_SUITE_P(Files, Hostile, testing::ValuesIn(HostileFiles()), NameOf);

TEST(Steps, AreCounted)
{
    const auto stepsOf = [](const std::string& text)
    {
        const OwnFile file(text);
        g_steps = 0;
        Read(file.Path());
        return g_steps;
    };

    const std::uint64_t one = stepsOf("1 1 1 1\n");

    EXPECT_GT(one, 10u);
    EXPECT_GT(stepsOf(Repeated(1000, "1 1 1 1\n")), 500 * (one / 10));
}

// ---- all limits of a format at once -------------------------------------------------------------

TEST(HostileMemory, InkMlMayHaveAllThatItMayHave)
{
    if (!kMemoryIsOurs)
        GTEST_SKIP() << "the sanitizer's own memory counts, too";
    const std::size_t part = IsFull() ? 1 : 32;
    std::string text = "<ink><a" + Repeated(499000 / part, " a=''") + "/>" +
                       Repeated(498000 / part, "<a/>x") + "<trace>" +
                       Repeated(3999999 / part, "1 1,") + "1 1</trace>";
    const std::string end = "</ink>";
    text += std::string((std::size_t{64} << 20) / part - text.size() - end.size(), ' ') + end;
    const OwnFile file(text);
    text.clear();
    text.shrink_to_fit();

    const long memory = MemoryToRead(file.Path());

    RecordProperty("MiB", static_cast<int>(memory));
    EXPECT_TRUE(Read(file.Path()).recording) << Read(file.Path()).problem;
    EXPECT_GT(memory, 0);
    EXPECT_LT(memory, IsFull() ? 512 : 64);
}

TEST(HostileMemory, TenMillionSamplesAreRefused)
{
    if (!IsFull())
        GTEST_SKIP() << "NIB_HOSTILE is not set: ten million samples take a while to write";
    const OwnFile file(Repeated(10000000, "1 1 1 1\n"));

    EXPECT_EQ(Read(file.Path()).problem, "more than 4000000 samples");
    const long memory = MemoryToRead(file.Path());
    EXPECT_GT(memory, 0);
    EXPECT_TRUE(memory < 512 || !kMemoryIsOurs) << memory;
}
