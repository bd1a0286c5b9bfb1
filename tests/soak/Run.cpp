#include "Run.h"

#include "Batch.h"
#include "Failure.h"
#include "Round.h"
#include "Watch.h"

#include "drivers/Holdings.h"
#include "drivers/ResidentMemory.h"

#include <GLES3/gl3.h>

#include <algorithm>
#include <cinttypes>
#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <thread>

#include <malloc.h>

namespace Soak
{

namespace
{

namespace fs = std::filesystem;

constexpr unsigned kHighestName = 4000; ///< drivers give the lowest that is free
constexpr std::chrono::seconds kSettling{10};

/// With a heap for every thread, what threads that have ended leave free in theirs comes and goes by
/// a tenth of all memory, while what is in use stays the same to the KiB.
void UseOneHeap()
{
    mallopt(M_ARENA_MAX, 1);
}

fs::path MakeFolder()
{
    std::string path = (fs::temp_directory_path() / "nib-soak-XXXXXX").string();
    Require(mkdtemp(path.data()) != nullptr, "there is no temporary folder");
    return path;
}

/// Runs @p work on a render thread of its own, with nothing else alive.
template <typename Work>
void OnAThread(Work work)
{
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("soak look", Nib::RenderThreadGL::Medium));
    Require(thread->Start(), "a render thread does not start");
    Batch batch;
    batch.Post(*thread, std::move(work));
    batch.Finish();
}

} // namespace

/// What a round may not add to.
struct Run::Held
{
    Holdings system;
    int names = 0; ///< of GL objects
    bool namesCount = true;

    bool IsWithin(const Held& other) const
    {
        return system.contexts <= other.system.contexts &&
               system.surfaces <= other.system.surfaces && system.threads <= other.system.threads &&
               system.files <= other.system.files && names <= other.names;
    }

    /// The driver's own threads open a file now and then.
    void LowerTo(const Held& other)
    {
        system.contexts = std::min(system.contexts, other.system.contexts);
        system.surfaces = std::min(system.surfaces, other.system.surfaces);
        system.threads = std::min(system.threads, other.system.threads);
        system.files = std::min(system.files, other.system.files);
        names = std::min(names, other.names);
    }

    std::string Text() const
    {
        std::ostringstream text;
        text << system << ", " << names << " GL names";
        return text.str();
    }

    static Held Now()
    {
        Held now;
        OnAThread(
            [&now]
            {
                GLint formats = 0;
                glGetIntegerv(GL_NUM_PROGRAM_BINARY_FORMATS, &formats);
                // Without program binaries a program that comes back leaves its old name behind.
                now.names = formats == 0 ? 0 : GlNamesInUse(kHighestName);
                now.namesCount = formats != 0;
            });
        now.system = Holdings();
        return now;
    }
};

Run::Run(const Options& options) : m_options(options), m_folder(MakeFolder())
{
    UseOneHeap();
    m_world.cacheFolder = m_folder / "RendererCache";
    Nib::System::SetSDKCacheDirectoryPath((m_folder / "sdk").c_str());
    setenv("MESA_SHADER_CACHE_DIR", (m_folder / "driver").c_str(), 1);
    setenv("NIB_LOG", "silent", 0);
    Require(Nib::Egl::GetEglStatus() == 0, "the driver does not start");
    const std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("soak start", Nib::RenderThreadGL::Medium));
    Require(thread->Start(), "a render thread does not start");
    m_world.pages.MakeReferences(*thread);
    Batch batch;
    batch.Post(*thread,
               [this] { m_driver = reinterpret_cast<const char*>(glGetString(GL_RENDERER)); });
    batch.Finish();
}

Run::~Run()
{
    fs::remove_all(m_folder);
}

bool Run::ToTheEnd()
{
    std::printf("soak: %s, seed %" PRIu64 "\n", m_driver.c_str(), m_options.seed);
    std::string lost;
    const Watch watch(m_progress);
    while (lost.empty() && !IsOver())
        lost = DoRound();
    if (!lost.empty())
        std::printf("soak: replay it with --seed %" PRIu64 " --rounds 1\n",
                    m_options.seed + static_cast<std::uint64_t>(m_rounds - 1));
    else if (m_memory.CanBeJudged() && !m_memory.IsFlat())
        lost = "memory grew by more than 1 %";
    std::printf("soak: choices %016" PRIx64 "\n", m_digest);
    PrintRow(lost);
    return lost.empty();
}

bool Run::IsOver() const
{
    if (m_options.rounds != 0)
        return m_rounds == m_options.rounds;
    return Clock::now() - m_start >= m_options.time;
}

std::string Run::DoRound()
{
    const std::uint64_t seed = m_options.seed + static_cast<std::uint64_t>(m_rounds++);
    Round round(m_world, m_progress, seed);
    const std::string failure = round.Run(m_options.families);
    m_digest += round.Digest() * static_cast<std::uint64_t>(m_rounds);
    if (!failure.empty())
        return failure;
    OnAThread([this] { m_options.leak.LeaveSomething(); });
    const std::string left = CompareHoldings();
    malloc_trim(0); // so that what is resident is what is used
    m_memory.Add(ResidentKiB());
    if (m_rounds % 50 == 0)
    {
        std::printf("soak: %d rounds, %ld KiB\n", m_rounds, ResidentKiB());
        std::fflush(stdout);
    }
    return left;
}

/// A thread that has been joined may still be listed for a moment.
std::string Run::CompareHoldings()
{
    if (!m_atStart)
    {
        m_atStart = std::make_unique<Held>(Held::Now());
        return {};
    }
    const Clock::time_point deadline = Clock::now() + kSettling;
    Held now = Held::Now();
    while (!now.IsWithin(*m_atStart) && Clock::now() < deadline)
        now = Held::Now();
    if (!now.IsWithin(*m_atStart))
        return "left behind: " + now.Text() + "; before " + m_atStart->Text();
    m_atStart->LowerTo(now);
    return {};
}

void Run::PrintRow(const std::string& lost) const
{
    const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - m_start);
    const char* const platform = std::getenv("EGL_PLATFORM");
    std::printf(
        "RELIABILITY | random life on %s, %s: %d threads with up to 3 render threads each, "
        "seed %" PRIu64 ", %lld s | %d rounds, %d actions, %d pages compared; %s; %s | %s\n",
        m_driver.c_str(), platform ? platform : "the default platform", m_options.families,
        m_options.seed, static_cast<long long>(seconds.count()), m_rounds, m_world.actions.load(),
        m_world.pages.Drawn(), m_memory.Text().c_str(), m_atStart ? m_atStart->Text().c_str() : "",
        lost.empty() ? "nothing" : lost.c_str());
}

} // namespace Soak
