// What a render thread asks of GL_KHR_debug, and what becomes of it.

#include "render/ChildThreadSupport.h"

#include <nib/gl_debug.h>

#include <GLES3/gl3.h>
// After gl3.h, which it needs.
#include <GLES2/gl2ext.h>
#include <gtest/gtest.h>

#include <cstdlib>

using namespace Nib;

namespace
{

using Texts = std::vector<std::string>;

SimGpu WithDebug()
{
    return ChildGpu().WithGlExtension("GL_KHR_debug").WithEglExtension("EGL_KHR_create_context");
}

/// The names of the calls that the aids make.
Texts DebugCalls(const SimDriver& driver)
{
    Texts names;
    for (const SimCall& call :
         driver.Calls({"glDebugMessageCallbackKHR", "glDebugMessageControlKHR",
                       "glPushDebugGroupKHR", "glPopDebugGroupKHR", "glObjectLabelKHR"}))
        names.push_back(call.name);
    return names;
}

/// The attributes of the contexts that were made.
std::vector<std::vector<long long>> ContextAttributes(const SimDriver& driver)
{
    std::vector<std::vector<long long>> lists;
    for (const SimCall& call : driver.Calls("eglCreateContext"))
        lists.push_back(call.list);
    return lists;
}

class GlDebugTest : public testing::Test
{
protected:
    ThreadPtr Started()
    {
        ThreadPtr thread = StartedParent();
        m_driver.ForgetCalls();
        return thread;
    }

    SimDriver m_driver{WithDebug()};
};

// ---- off ----------------------------------------------------------------------------------------

TEST_F(GlDebugTest, IsOffAndMakesNoCallUnlessAskedFor)
{
    unsetenv("NIB_GL_DEBUG");
    EXPECT_FALSE(GlDebug::IsEnabled());
    const ThreadPtr thread = StartedParent();
    RunOn(thread->GetMsgQueue(), [] { GlDebug::Label(GL_TEXTURE, 1, "nothing"); });
    EXPECT_EQ(DebugCalls(m_driver), Texts());
    for (const SimCall& call : m_driver.Calls("eglGetProcAddress"))
        EXPECT_EQ(call.args.at(0).Text().find("Debug"), std::string::npos) << call;
    for (const SimCall& call : m_driver.Calls("glEnable"))
        EXPECT_NE(call.Arg(0), GL_DEBUG_OUTPUT_KHR);
    for (const auto& attributes : ContextAttributes(m_driver))
    {
        EXPECT_EQ(std::count(attributes.begin(), attributes.end(), EGL_CONTEXT_FLAGS_KHR), 0);
        EXPECT_EQ(attributes.size(), 4u); // the version and the priority
    }
}

// ---- the switch ---------------------------------------------------------------------------------

TEST_F(GlDebugTest, IsTurnedOnByTheEnvironment)
{
    setenv("NIB_GL_DEBUG", "1", 1);
    EXPECT_TRUE(GlDebug::IsEnabled());
    setenv("NIB_GL_DEBUG", "0", 1);
    EXPECT_TRUE(GlDebug::IsEnabled()) << "it is read once";
}

TEST_F(GlDebugTest, TheApplicationGoesBeforeTheEnvironment)
{
    setenv("NIB_GL_DEBUG", "1", 1);
    GlDebug::SetEnabled(false);
    EXPECT_FALSE(GlDebug::IsEnabled());
}

TEST_F(GlDebugTest, MakesDebuggingContexts)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr thread = StartedParent();
    const auto lists = ContextAttributes(m_driver);
    ASSERT_FALSE(lists.empty());
    for (const auto& attributes : lists)
    {
        ASSERT_EQ(attributes.size(), 6u);
        EXPECT_EQ(attributes[4], EGL_CONTEXT_FLAGS_KHR);
        EXPECT_EQ(attributes[5], EGL_CONTEXT_OPENGL_DEBUG_BIT_KHR);
    }
}

TEST_F(GlDebugTest, MakesAnOrdinaryContextWhereADebuggingOneIsRefused)
{
    GlDebug::SetEnabled(true);
    ASSERT_TRUE(SharedContext::GetInstance());
    m_driver.ForgetCalls();
    m_driver.FailNext("eglCreateContext", EGL_BAD_ATTRIBUTE);
    const ThreadPtr thread = StartedParent();
    const auto lists = ContextAttributes(m_driver);
    ASSERT_EQ(lists.size(), 2u);
    EXPECT_EQ(lists[0].size(), 6u);
    EXPECT_EQ(lists[1].size(), 4u);
}

// ---- messages -----------------------------------------------------------------------------------

TEST_F(GlDebugTest, TheDriversMessagesAreLinesAtMatchingLevelsOnTheThreadThatCausedThem)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr thread = StartedParent();
    m_driver.ForgetLog();
    unsigned renderThread = 0;
    RunOn(thread->GetMsgQueue(),
          [&]
          {
              renderThread = SimDriver::ThisThread();
              m_driver.SendDebugMessage(GL_DEBUG_SOURCE_API_KHR, GL_DEBUG_TYPE_ERROR_KHR, 0x502,
                                        GL_DEBUG_SEVERITY_HIGH_KHR, "no program\n");
              m_driver.SendDebugMessage(GL_DEBUG_SOURCE_SHADER_COMPILER_KHR,
                                        GL_DEBUG_TYPE_PERFORMANCE_KHR, 7,
                                        GL_DEBUG_SEVERITY_MEDIUM_KHR, "many registers");
              m_driver.SendDebugMessage(GL_DEBUG_SOURCE_OTHER_KHR, GL_DEBUG_TYPE_OTHER_KHR, 8,
                                        GL_DEBUG_SEVERITY_LOW_KHR, "100% busy");
              m_driver.SendDebugMessage(GL_DEBUG_SOURCE_API_KHR, GL_DEBUG_TYPE_PORTABILITY_KHR, 9,
                                        GL_DEBUG_SEVERITY_NOTIFICATION_KHR, "elsewhere not");
          });
    EXPECT_EQ(
        LinesWith(m_driver, "GL "),
        Texts({"E GL API, error 0x502: no program",
               "W GL shader compiler, performance 0x7: many registers",
               "I GL driver, message 0x8: 100% busy", "D GL API, portability 0x9: elsewhere not"}));
    for (const SimLogLine& line : m_driver.Log())
        EXPECT_EQ(line.thread, renderThread) << line;
}

TEST_F(GlDebugTest, MessagesComeInTheCallThatCausesThem)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr thread = StartedParent();
    RunOn(thread->GetMsgQueue(),
          [&]
          {
              EXPECT_EQ(m_driver.Calls("glEnable").size(), 2u);
              EXPECT_EQ(m_driver.Calls("glEnable")[0].Arg(0), GL_DEBUG_OUTPUT_KHR);
              EXPECT_EQ(m_driver.Calls("glEnable")[1].Arg(0), GL_DEBUG_OUTPUT_SYNCHRONOUS_KHR);
          });
}

TEST_F(GlDebugTest, TheMessagesAboutItsOwnGroupsAreNoLines)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr thread = StartedParent();
    m_driver.ForgetLog();
    RunOn(thread->GetMsgQueue(),
          [&]
          {
              for (const GLenum type : {GL_DEBUG_TYPE_PUSH_GROUP_KHR, GL_DEBUG_TYPE_POP_GROUP_KHR})
              {
                  EXPECT_TRUE(m_driver.SendDebugMessage(GL_DEBUG_SOURCE_APPLICATION_KHR, type, 0,
                                                        GL_DEBUG_SEVERITY_NOTIFICATION_KHR, "t"));
              }
          });
    EXPECT_EQ(LinesWith(m_driver, "GL "), Texts());
}

TEST_F(GlDebugTest, AContextThatIsRestoredHasItAgain)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr parent = StartedParent();
    const ThreadPtr child(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    child->GetMsgQueue()->waitForCompleting();
    child->OnPause();
    child->OnResume();
    child->GetMsgQueue()->waitForCompleting();
    m_driver.ForgetLog();
    RunOn(child->GetMsgQueue(),
          [&]
          {
              EXPECT_TRUE(m_driver.SendDebugMessage(GL_DEBUG_SOURCE_API_KHR,
                                                    GL_DEBUG_TYPE_ERROR_KHR, 1,
                                                    GL_DEBUG_SEVERITY_HIGH_KHR, "again"));
          });
    EXPECT_EQ(LinesWith(m_driver, "GL "), Texts({"E GL API, error 0x1: again"}));
}

// ---- groups -------------------------------------------------------------------------------------

class PaintTask : public ITask
{
public:
    void run() override { glClear(GL_COLOR_BUFFER_BIT); }
};

TEST_F(GlDebugTest, EachTaskIsAGroupOfItsTypesName)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr thread = Started();
    thread->GetMsgQueue()->enQueueMsg(new PaintTask);
    thread->GetMsgQueue()->waitForCompleting();
    const std::vector<SimCall> calls =
        m_driver.Calls({"glPushDebugGroupKHR", "glPopDebugGroupKHR", "glClear"});
    ASSERT_GE(calls.size(), 3u);
    EXPECT_EQ(calls[0].name, "glPushDebugGroupKHR");
    EXPECT_EQ(calls[0].Arg(0), GL_DEBUG_SOURCE_APPLICATION_KHR);
    EXPECT_EQ(calls[0].args.at(3).Text(), "(anonymous namespace)::PaintTask");
    EXPECT_EQ(calls[0].Arg(2), 32);
    EXPECT_EQ(calls[1].name, "glClear");
    EXPECT_EQ(calls[2].name, "glPopDebugGroupKHR");
}

TEST_F(GlDebugTest, TheGroupOfATaskThatEndsTheContextIsClosedBefore)
{
    GlDebug::SetEnabled(true);
    const ThreadPtr parent = StartedParent();
    ThreadPtr child(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    child->GetMsgQueue()->waitForCompleting();
    m_driver.ForgetCalls();
    child->OnPause();
    EXPECT_EQ(DebugCalls(m_driver), Texts({"glPushDebugGroupKHR", "glPopDebugGroupKHR"}));
    child->OnResume();
    child->GetMsgQueue()->waitForCompleting();
    m_driver.ForgetCalls();
    child.reset();
    // The wait for the queue, then the task that ends the context.
    EXPECT_EQ(DebugCalls(m_driver), Texts({"glPushDebugGroupKHR", "glPopDebugGroupKHR",
                                           "glPushDebugGroupKHR", "glPopDebugGroupKHR"}));
}

// ---- where it is not ----

TEST(GlDebugWithoutItsExtensions, MakesTheSameCalls)
{
    SimDriver driver(ChildGpu()
                         .WithoutGlExtension("GL_KHR_debug")
                         .WithoutEglExtension("EGL_KHR_create_context"));
    StartedParent()->GetMsgQueue()->waitForCompleting(); // what is asked once in a process
    const auto calls = [&](bool enabled)
    {
        GlDebug::SetEnabled(enabled);
        driver.ForgetCalls();
        StartedParent()->GetMsgQueue()->waitForCompleting();
        Texts names;
        for (const std::string& name : driver.CallNames())
        {
            if (name != "glGetString" && name != "eglQueryString") // by which it asks for them
                names.push_back(name);
        }
        return names;
    };
    EXPECT_EQ(calls(true), calls(false));
}

} // namespace
