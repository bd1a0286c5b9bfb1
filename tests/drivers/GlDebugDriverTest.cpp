// GL_KHR_debug of a real driver: its messages in the log, and nothing left wrong by groups and
// labels.

#include "drivers/RenderThreadSupport.h"

#include <nib/device.h>
#include <nib/gl_debug.h>
#include <nib/log.h>
#include <nib/render_thread.h>
#include <nib/renderer_factory.h>
#include <nib/texture.h>

#include <GLES3/gl3.h>
#include <gtest/gtest.h>

#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

using namespace Nib;

namespace
{

struct Line
{
    int priority;
    std::string text;
    std::thread::id thread;
};

/// The driver's lines of the log.
class DriverLines
{
public:
    DriverLines() { SetLogSink(&Take, this, 3); }
    ~DriverLines() { SetLogSink(nullptr, nullptr); }

    std::vector<Line> All() const
    {
        const std::lock_guard lock(m_lock);
        return m_lines;
    }

private:
    static void Take(void* context, int priority, const char* message)
    {
        const std::string text = message;
        if (text.rfind("GL API", 0) != 0)
            return;
        auto* const self = static_cast<DriverLines*>(context);
        const std::lock_guard lock(self->m_lock);
        self->m_lines.push_back({priority, text, std::this_thread::get_id()});
    }

    mutable std::mutex m_lock;
    std::vector<Line> m_lines;
};

class GlDebugOnDriver : public testing::Test
{
protected:
    void Start()
    {
        m_thread.reset(GLES::CreateSurfaceRenderer("debugged", RenderThreadGL::Medium));
        ASSERT_TRUE(m_thread->Start());
        bool has = false;
        Run([&] { has = IsGLExtensionSupported("GL_KHR_debug"); });
        if (!has)
            GTEST_SKIP() << "the driver has no GL_KHR_debug";
    }

    void Run(const std::function<void()>& function) { RunOn(m_thread->GetMsgQueue(), function); }

    DriverLines m_lines;
    std::unique_ptr<RenderThreadGL> m_thread;
};

constexpr GLenum kNoCapability = 0x1234;

TEST_F(GlDebugOnDriver, AnErrorIsALineInTheCallThatCausesIt)
{
    GlDebug::SetEnabled(true);
    Start();
    if (IsSkipped())
        return;
    std::thread::id renderThread;
    std::size_t before = 0;
    std::size_t after = 0;
    Run(
        [&]
        {
            renderThread = std::this_thread::get_id();
            before = m_lines.All().size();
            glEnable(kNoCapability);
            after = m_lines.All().size();
            EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
        });
    ASSERT_EQ(after, before + 1);
    const Line line = m_lines.All().at(before);
    EXPECT_EQ(line.priority, 6);
    EXPECT_EQ(line.text.rfind("GL API, error 0x", 0), 0u) << line.text;
    EXPECT_EQ(line.thread, renderThread);
}

TEST_F(GlDebugOnDriver, GroupsAndLabelsCauseNoError)
{
    GlDebug::SetEnabled(true);
    Start();
    if (IsSkipped())
        return;
    Run(
        []
        {
            TextureDescriptor descriptor;
            descriptor.width = descriptor.height = 4;
            ITextureObject* texture =
                RendererFactory::CreateTextureObject(descriptor, nullptr, nullptr, 0, nullptr);
            texture->SetTag("paper");
            texture->Release();
            EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
        });
    m_thread.reset();
    for (const Line& line : m_lines.All())
        EXPECT_NE(line.priority, 6) << line.text;
}

TEST_F(GlDebugOnDriver, ItIsSilentUnlessAskedFor)
{
    GlDebug::SetEnabled(false);
    Start();
    if (IsSkipped())
        return;
    Run(
        []
        {
            glEnable(kNoCapability);
            EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
        });
    EXPECT_TRUE(m_lines.All().empty());
}

} // namespace
