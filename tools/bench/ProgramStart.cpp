#include "bench/ProgramStart.h"

#include "PostTask.h"
#include "UserError.h"

#include <nib/nib.h>

#include <cstdlib>
#include <filesystem>
#include <memory>
#include <system_error>

namespace fs = std::filesystem;

namespace
{

using Clock = Stopwatch::Clock;
using Nib::ShaderProgramCache;

const std::string kVertex = "attribute vec2 a_position;\n"
                            "attribute vec4 a_color;\n"
                            "uniform mat4 u_transform;\n"
                            "varying vec4 v_color;\n"
                            "void main()\n"
                            "{\n"
                            "    v_color = a_color;\n"
                            "    gl_Position = u_transform * vec4(a_position, 0.0, 1.0);\n"
                            "}\n";
const char* const kFragment =
    "precision mediump float;\n"
    "varying vec4 v_color;\n"
    "uniform sampler2D u_tip;\n"
    "uniform vec4 u_tint;\n"
    "void main()\n"
    "{\n"
    "    gl_FragColor = v_color * u_tint * texture2D(u_tip, v_color.xy);\n"
    "}\n";

/// A source that neither the cache nor the driver has seen.
std::string NewSource()
{
    static int number = 0;
    return kVertex + "// " + std::to_string(++number) + "\n";
}

float TimeToBuild(const std::string& vertex)
{
    const Clock::time_point start = Clock::now();
    const Ink::Owned<Nib::IShaderProgram> program(
        Nib::RendererFactory::CreateShaderProgram(vertex.c_str(), kFragment, nullptr));
    return Stopwatch::Since(start);
}

/// On the render thread.
void Measure(const BenchCache& cache, Stopwatch& stopwatch, ProgramStart& times)
{
    const std::string known = NewSource();
    TimeToBuild(known); // whatever the driver does at its first program
    const fs::path knownFile =
        cache.FileOf(ShaderProgramCache::GetShaderKey(known.c_str(), kFragment));
    std::error_code missing;
    const bool isKept = fs::exists(knownFile, missing);

    for (stopwatch.Begin(0.25); times.fromSource.empty() || stopwatch.GoesOn();)
    {
        times.fromSource.push_back(TimeToBuild(NewSource()));
        if (!isKept)
            continue;
        const std::string copied = NewSource();
        fs::copy_file(knownFile,
                      cache.FileOf(ShaderProgramCache::GetShaderKey(copied.c_str(), kFragment)));
        times.fromFile.push_back(TimeToBuild(copied));
        times.fromMemory.push_back(TimeToBuild(known));
    }
}

} // namespace

BenchCache::BenchCache()
{
    std::error_code missing;
    m_folder = (fs::temp_directory_path(missing) / "nib-bench-XXXXXX").string();
    if (missing || !mkdtemp(m_folder.data()))
        throw UserError("no temporary folder can be made; set TMPDIR to where one can");
    m_sdkFolder = m_folder + "/sdk";
    Nib::System::SetSDKCacheDirectoryPath(m_sdkFolder.c_str());
    setenv("MESA_SHADER_CACHE_DIR", (m_folder + "/driver").c_str(), 1);
}

BenchCache::~BenchCache()
{
    std::error_code ignored;
    fs::remove_all(m_folder, ignored);
}

std::string BenchCache::FileOf(unsigned long long key) const
{
    return m_folder + "/RendererCache/sh" + std::to_string(key) + ".dat";
}

ProgramStart MeasureProgramStart(Nib::RenderThreadGL& thread, const BenchCache& cache,
                                 Stopwatch& stopwatch)
{
    ProgramStart times;
    std::string failure;
    Ink::Post(*thread.GetMsgQueue(),
              [&]
              {
                  try
                  {
                      Measure(cache, stopwatch, times);
                  }
                  catch (const std::exception& problem)
                  {
                      failure = problem.what();
                  }
              });
    thread.GetMsgQueue()->waitForCompleting();
    if (!failure.empty())
        throw UserError("no program can be built: " + failure);
    return times;
}
