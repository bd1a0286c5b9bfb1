#include "gles/BoundQueue.h"
#include "gles/CacheFiles.h"
#include "gles/OpenGLShaderProgram.h"
#include "sim/SimDriver.h"

#include <nib/shader_cache.h>

#include <array>
#include <atomic>
#include <barrier>
#include <memory>
#include <thread>

using Nib::ShaderProgramCache;
using Nib::GLES::OpenGLShaderProgram;
using Texts = std::vector<std::string>;

namespace
{

constexpr int kThreads = 4;
constexpr int kRounds = 40;

constexpr const char* kVertex = "attribute vec2 a_pos;\nattribute vec4 a_color;\n"
                                "void main() { gl_Position = a_color; }\n";
constexpr const char* kFragments[] = {
    "void main() { gl_FragColor = vec4(0); }\n",
    "void main() { gl_FragColor = vec4(1); }\n",
    "precision mediump float; uniform vec4 u_tint; void main() { gl_FragColor = u_tint; }\n",
};

// Several render threads on one cache. The thread sanitizer looks on.
class ShaderThreads : public testing::Test
{
protected:
    ShaderThreads() { driver.RecordCalls(false); }

    /// Runs @p work on all threads, which begin at the same moment.
    template <typename Work>
    static void Run(Work work)
    {
        std::barrier together(kThreads);
        std::array<std::thread, kThreads> threads;
        for (int i = 0; i < kThreads; ++i)
        {
            threads[static_cast<std::size_t>(i)] = std::thread(
                [&, i]
                {
                    together.arrive_and_wait();
                    work(i);
                });
        }
        for (std::thread& thread : threads)
            thread.join();
    }

    SimDriver driver;
    CacheFolder folder;
};

struct Releaser
{
    void operator()(OpenGLShaderProgram* program) const { program->Release(); }
};

} // namespace

TEST_F(ShaderThreads, GetOneCacheThatWasMadeOnce)
{
    std::array<ShaderProgramCache*, kThreads> caches = {};
    Run([&](int thread)
        { caches[static_cast<std::size_t>(thread)] = ShaderProgramCache::GetInstance(); });
    for (ShaderProgramCache* cache : caches)
        EXPECT_EQ(cache, caches[0]);
    EXPECT_EQ(
        driver.LogTexts(ANDROID_LOG_INFO),
        (Texts{"bool Nib::ShaderProgramCache::Init() - Make cache directory: " + folder.Path()}));
    EXPECT_EQ(driver.Log().size(), 1u);
}

TEST_F(ShaderThreads, StoreAndHoldRecordsThatAreAlwaysWhole)
{
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    std::atomic<int> broken{0};
    Run(
        [&](int thread)
        {
            const std::string program(static_cast<std::size_t>(100 + thread),
                                      static_cast<char>('a' + thread));
            for (int round = 0; round < kRounds; ++round)
            {
                const auto key = static_cast<std::uint64_t>(round % 3);
                cache->SetBinaryShader(Record(key, program, {program}));
                const auto held = cache->HoldBinaryShader(key);
                const std::string text = ProgramText(*held);
                if (held->attributes != Texts{text} || text.find_first_not_of(text[0]) != text.npos)
                    broken.fetch_add(1, std::memory_order_relaxed);
            }
        });
    EXPECT_EQ(broken.load(std::memory_order_relaxed), 0);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR), Texts{});
    EXPECT_EQ(folder.Names(), (Texts{"sh0.dat", "sh1.dat", "sh2.dat"}));
    for (const std::string& name : folder.Names())
    {
        const Bytes bytes = ReadBytes(folder.File(name));
        EXPECT_EQ(Number(bytes, bytes.size() - 8), Crc(bytes, bytes.size() - 8)) << name;
    }
}

TEST_F(ShaderThreads, BuildAndRestoreTheSameProgramsAtOnce)
{
    // Given a driver that refuses a binary now and then, so that records are replaced in use
    std::atomic<int> notLinked{0};
    Run(
        [&](int thread)
        {
            SimContext context(driver);
            BoundQueue queue;
            std::vector<std::unique_ptr<OpenGLShaderProgram, Releaser>> programs;
            for (const char* const fragment : kFragments)
                programs.emplace_back(new OpenGLShaderProgram(kVertex, fragment));
            for (int round = 0; round < kRounds; ++round)
            {
                if ((round + thread) % 5 == 0)
                    driver.FailNext("glProgramBinary", GL_NO_ERROR);
                queue.observer.DispatchRelease();
                queue.observer.DispatchRestore();
                for (const auto& program : programs)
                {
                    if (!driver.Program(program->GetShaderId()).linked)
                        notLinked.fetch_add(1, std::memory_order_relaxed);
                    program->Activate();
                }
                programs.back()->Deactivate();
            }
        });
    driver.ForgetFailures();
    EXPECT_EQ(notLinked.load(std::memory_order_relaxed), 0);
    EXPECT_GT(driver.CountLogContaining("cached binary shader is not valid"), 0u);
    EXPECT_EQ(driver.CountLogContaining("Invalid CRC"), 0u);
}

TEST_F(ShaderThreads, BuildFirstProgramsAtOnce)
{
    // All threads find nothing and store what they built, each time under a new key.
    std::atomic<int> notLinked{0};
    std::barrier together(kThreads);
    Run(
        [&](int)
        {
            SimContext context(driver);
            BoundQueue queue;
            for (int round = 0; round < kRounds; ++round)
            {
                const std::string vertex =
                    "attribute vec2 a_" + std::to_string(round) + ";\nvoid main() {}\n";
                together.arrive_and_wait();
                const std::unique_ptr<OpenGLShaderProgram, Releaser> program(
                    new OpenGLShaderProgram(vertex.c_str(), kFragments[0]));
                const SimProgramState state = driver.Program(program->GetShaderId());
                if (!state.linked || state.attributes.at("a_" + std::to_string(round)) != 0)
                    notLinked.fetch_add(1, std::memory_order_relaxed);
            }
        });
    EXPECT_EQ(notLinked.load(std::memory_order_relaxed), 0);
    EXPECT_EQ(folder.Names().size(), 40u);
}
