// The binary shader cache between processes: this program runs itself with a folder of its own and
// looks at what each run wrote and logged.

#include "drivers/Driver.h"
#include "drivers/RenderThreadSupport.h"

#include <nib/egl.h>
#include <nib/render_thread.h>
#include <nib/renderer_factory.h>
#include <nib/shader_cache.h>

#include <GLES3/gl3.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

using namespace Nib;
namespace fs = std::filesystem;

namespace
{

// Two programs; the colour comes through the second attribute, and through a uniform.
const char* const kVertex = "attribute vec2 a_position;\n"
                            "attribute vec4 a_color;\n"
                            "varying vec4 v_color;\n"
                            "void main()\n"
                            "{\n"
                            "    v_color = a_color;\n"
                            "    gl_Position = vec4(a_position, 0.0, 1.0);\n"
                            "}\n";
const char* const kFragment = "precision mediump float;\n"
                              "varying vec4 v_color;\n"
                              "void main() { gl_FragColor = v_color; }\n";
const char* const kTintingFragment = "precision mediump float;\n"
                                     "varying vec4 v_color;\n"
                                     "uniform vec4 u_tint;\n"
                                     "void main() { gl_FragColor = v_color * u_tint; }\n";

constexpr const char* kKeepsNoPrograms = "this driver has no program binaries\n";

// One pixel, drawn with the program that is active.
Rgba DrawnPixel()
{
    GLuint texture = 0;
    glGenTextures(1, &texture);
    glBindTexture(GL_TEXTURE_2D, texture);
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, 1, 1, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr);
    GLuint framebuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    glViewport(0, 0, 1, 1);
    const float positions[] = {-1, -1, 3, -1, -1, 3};
    glVertexAttribPointer(0, 2, GL_FLOAT, GL_FALSE, 0, positions);
    glEnableVertexAttribArray(0);
    glVertexAttrib4f(1, 1.0f, 0.0f, 1.0f, 1.0f);
    glDrawArrays(GL_TRIANGLES, 0, 3);
    Rgba pixel{};
    glReadPixels(0, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel.data());
    glDisableVertexAttribArray(0);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glDeleteFramebuffers(1, &framebuffer);
    glDeleteTextures(1, &texture);
    return pixel;
}

void ExpectBothProgramsDraw()
{
    IShaderProgram* const plain = RendererFactory::CreateShaderProgram(kVertex, kFragment, nullptr);
    plain->Activate();
    EXPECT_EQ(DrawnPixel(), (Rgba{255, 0, 255, 255}));

    IShaderProgram* const tinting =
        RendererFactory::CreateShaderProgram(kVertex, kTintingFragment, nullptr);
    tinting->Activate();
    IParameterBinding* const tint = tinting->GetBindingIntf("u_tint");
    const float red[] = {1, 0, 0, 1};
    tint->SetValue(red);
    EXPECT_EQ(DrawnPixel(), (Rgba{255, 0, 0, 255}));

    tint->Release();
    tinting->Release();
    plain->Release();
}

// For a driver without binary formats, the attempt to keep a program is an error.
void ExpectNoErrorButThatOfKeepingPrograms()
{
    GLint formats = 0;
    glGetIntegerv(GL_NUM_PROGRAM_BINARY_FORMATS, &formats);
    if (formats == 0)
        std::fputs(kKeepsNoPrograms, stderr);
    EXPECT_EQ(glGetError(), formats == 0 ? GLenum{GL_INVALID_OPERATION} : GLenum{GL_NO_ERROR});
}

struct ChildRun
{
    int status = -1;
    std::string log;

    int Count(const std::string& text) const
    {
        int count = 0;
        for (size_t at = log.find(text); at != std::string::npos; at = log.find(text, at + 1))
            ++count;
        return count;
    }
};

// Folders that this process has made for a cache, and for the driver's own, which would otherwise
// offer no program binaries where it cannot keep any.
class ShaderCacheProcess : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!HasPbuffers())
            GTEST_SKIP() << kNoPbuffers;
        std::string path = (fs::temp_directory_path() / "nib-cache-XXXXXX").string();
        ASSERT_NE(mkdtemp(path.data()), nullptr);
        m_folder = path;
    }

    void TearDown() override { fs::remove_all(m_folder); }

    fs::path CacheFolder() const { return m_folder / "RendererCache"; }

    // Builds and draws in a process of its own.
    ChildRun RunOnce() const
    {
        const fs::path log = m_folder / "log";
        const pid_t child = fork();
        if (child == 0)
        {
            setenv("NIB_CACHE_DIR", (m_folder / "sdk").c_str(), 1);
            setenv("MESA_SHADER_CACHE_DIR", (m_folder / "driver").c_str(), 1);
            setenv("NIB_LOG", "info", 1);
            if (!freopen(log.c_str(), "w", stderr))
                _exit(126);
            execl("/proc/self/exe", "nib_driver_tests",
                  "--gtest_filter=ShaderCacheBuild.TwoProgramsDraw", nullptr);
            _exit(127);
        }
        ChildRun run;
        waitpid(child, &run.status, 0);
        std::ifstream stream(log);
        run.log.assign(std::istreambuf_iterator<char>(stream), {});
        return run;
    }

    using Files = std::map<std::string, std::string>;
    Files CacheFiles() const
    {
        Files files;
        for (const fs::directory_entry& entry : fs::directory_iterator(CacheFolder()))
        {
            std::ifstream stream(entry.path(), std::ios::binary);
            files[entry.path().filename()].assign(std::istreambuf_iterator<char>(stream), {});
        }
        return files;
    }

    fs::path m_folder;
};

constexpr const char* kExists = "createShader() - Binary shader exists in cache";
constexpr const char* kRefused =
    "createShader() - cached binary shader is not valid. Need to recreate it in cache";
constexpr const char* kCompiled = "attribute = a_color"; // the scan that goes with every compile

} // namespace

// What the tests below run in a process of its own; with a cache folder of its own when it is run
// by itself.
TEST(ShaderCacheBuild, TwoProgramsDraw)
{
    if (!HasPbuffers())
        GTEST_SKIP() << kNoPbuffers;
    std::string folder = (fs::temp_directory_path() / "nib-cache-XXXXXX").string();
    ASSERT_NE(mkdtemp(folder.data()), nullptr);
    if (!std::getenv("NIB_CACHE_DIR"))
        System::SetSDKCacheDirectoryPath((folder + "/sdk").c_str());

    ASSERT_EQ(Egl::GetEglStatus(), 0) << "the driver does not start";
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("shaders", RenderThreadGL::Medium));
    ASSERT_TRUE(thread->Start());
    RunOn(thread->GetMsgQueue(), ExpectBothProgramsDraw);
    RunOn(thread->GetMsgQueue(), ExpectNoErrorButThatOfKeepingPrograms);
    thread.reset();
    fs::remove_all(folder);
}

TEST_F(ShaderCacheProcess, TheSecondProcessCompilesNothing)
{
    const ChildRun first = RunOnce();
    ASSERT_EQ(first.status, 0) << first.log;
    EXPECT_EQ(first.Count(kCompiled), 2);
    if (first.Count(kKeepsNoPrograms) != 0)
        GTEST_SKIP() << kKeepsNoPrograms;
    EXPECT_EQ(first.Count(kExists), 0);
    const Files written = CacheFiles();
    EXPECT_EQ(written.size(), 2u);

    const ChildRun second = RunOnce();
    ASSERT_EQ(second.status, 0) << second.log;
    EXPECT_EQ(second.Count(kCompiled), 0) << second.log;
    EXPECT_EQ(second.Count(kExists), 2);
    EXPECT_EQ(CacheFiles(), written);
}

TEST_F(ShaderCacheProcess, ABinaryThatTheDriverRefusesIsMadeAnew)
{
    const ChildRun first = RunOnce();
    ASSERT_EQ(first.status, 0) << first.log;
    if (first.Count(kKeepsNoPrograms) != 0)
        GTEST_SKIP() << kKeepsNoPrograms;
    System::SetSDKCacheDirectoryPath((m_folder / "sdk").c_str());
    ShaderProgramCache* const cache = ShaderProgramCache::GetInstance();
    const auto key = ShaderProgramCache::GetShaderKey(kVertex, kFragment);
    const ShaderProgramCache::BinaryShader* const good = cache->GetBinaryShader(key);
    ASSERT_NE(good, nullptr);
    std::unique_ptr<ShaderProgramCache::BinaryShader> damaged(good->Clone());
    std::fill_n(damaged->bytes, damaged->length, static_cast<unsigned char>(0x5A));
    ASSERT_TRUE(cache->SetBinaryShader(*damaged));

    const ChildRun refusing = RunOnce();
    ASSERT_EQ(refusing.status, 0) << refusing.log;
    EXPECT_EQ(refusing.Count(kRefused), 1);
    EXPECT_EQ(refusing.Count(kCompiled), 1);

    const ChildRun third = RunOnce();
    ASSERT_EQ(third.status, 0) << third.log;
    EXPECT_EQ(third.Count(kRefused), 0);
    EXPECT_EQ(third.Count(kCompiled), 0);
}
