#include "sim/SimDriver.h"

#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>

#include <thread>

namespace
{

TEST(SimCalls, AreRecordedWithArgumentsAndThread)
{
    SimDriver driver;
    SimContext context(driver);
    glScissor(1, 2, 30, 40);
    context.Release();
    std::thread(
        [&]
        {
            context.MakeCurrent();
            glFlush();
            context.Release();
        })
        .join();
    context.MakeCurrent();
    glClearColor(0.5f, 0, 0, 1);

    EXPECT_EQ(driver.CallNames(), Names({"glScissor", "glFlush", "glClearColor"}));
    EXPECT_EQ(driver.Calls("glScissor"), Sequence({Call("glScissor", 1, 2, 30, 40)}));
    EXPECT_EQ(driver.LastCall("glClearColor"), Call("glClearColor", 0.5, 0, 0, 1));
    EXPECT_EQ(driver.CallTexts()[0], "glScissor(1, 2, 30, 40)");
    EXPECT_EQ(driver.CallingThreads(), 2u);
    EXPECT_EQ(driver.Calls()[0].context, context.Handle());
    EXPECT_EQ(driver.Calls()[0].thread, SimDriver::ThisThread());
    driver.ForgetCalls();
    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(driver.CallsMade(), 0u);
}

TEST(SimCalls, RecordingMayBeOff)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.RecordCalls(false);
    glFlush();
    driver.RecordCalls(true);
    glFinish();

    EXPECT_EQ(driver.CallNames(), Names({"glFinish"}));
    EXPECT_EQ(driver.CallsMade(), 2u);
}

TEST(SimFailures, ACallFailsAsOftenAsAsked)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.FailNext("glGenTextures", GL_OUT_OF_MEMORY, 2);
    GLuint names[3] = {9, 9, 9};

    for (GLuint& name : names)
        glGenTextures(1, &name);

    EXPECT_EQ(names[0], 0u);
    EXPECT_EQ(names[1], 0u);
    EXPECT_NE(names[2], 0u);
    EXPECT_EQ(glGetError(), GLenum{GL_OUT_OF_MEMORY});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    EXPECT_TRUE(driver.Calls("glGenTextures")[1].failed);
    EXPECT_FALSE(driver.Calls("glGenTextures")[2].failed);
}

TEST(SimFailures, ByArgument)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.FailWhen("eglQuerySurface", 2, EGL_HEIGHT, EGL_BAD_SURFACE, SimDriver::kAlways);
    driver.FailWhen("eglGetProcAddress", 0, "eglCreateSyncKHR", EGL_BAD_PARAMETER);
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    const EGLSurface surface = eglGetCurrentSurface(EGL_DRAW);
    EGLint value = 5;

    EXPECT_EQ(eglQuerySurface(display, surface, EGL_WIDTH, &value), EGLBoolean{EGL_TRUE});
    EXPECT_EQ(value, 1);
    EXPECT_EQ(eglQuerySurface(display, surface, EGL_HEIGHT, &value), EGLBoolean{EGL_FALSE});
    EXPECT_EQ(eglGetError(), EGL_BAD_SURFACE);
    EXPECT_EQ(eglGetProcAddress("eglCreateSyncKHR"), nullptr);
    EXPECT_NE(eglGetProcAddress("eglDestroySyncKHR"), nullptr);
    EXPECT_NE(eglGetProcAddress("eglCreateSyncKHR"), nullptr);
}

TEST(SimFailures, ByNumber)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.FailAt(2);

    glFlush();
    EXPECT_FALSE(eglSwapInterval(eglGetCurrentDisplay(), 1));
    EXPECT_EQ(driver.Calls()[1].name, "eglGetCurrentDisplay");
    EXPECT_TRUE(driver.Calls()[1].failed);
}

TEST(SimFailures, AnErrorQueryThatFailsReportsItOnce)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.FailNext("glGetError", GL_OUT_OF_MEMORY);
    EXPECT_EQ(glGetError(), GLenum{GL_OUT_OF_MEMORY});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST(SimFailures, QueuedErrorsComeOutInOrder)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.QueueGlErrors({GL_INVALID_ENUM, GL_INVALID_VALUE, GL_OUT_OF_MEMORY});

    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_VALUE});
    EXPECT_EQ(glGetError(), GLenum{GL_OUT_OF_MEMORY});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST(SimFailures, StringsMayBeReplacedOrNull)
{
    SimDriver driver(SimGpu::Named("Mali-G72"));
    const SimContext context(driver);
    EXPECT_STREQ(reinterpret_cast<const char*>(glGetString(GL_VENDOR)), "ARM");
    driver.SetGlString(GL_VENDOR, "Somebody");
    driver.SetGlString(GL_RENDERER, std::nullopt);

    EXPECT_STREQ(reinterpret_cast<const char*>(glGetString(GL_VENDOR)), "Somebody");
    EXPECT_EQ(glGetString(GL_RENDERER), nullptr);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST(SimHold, ACallWaitsUntilReleased)
{
    SimDriver driver;
    SimContext context(driver);
    context.Release();
    driver.Hold("glFlush");
    std::thread thread(
        [&]
        {
            context.MakeCurrent();
            glFlush();
            glFinish();
            context.Release();
        });
    driver.WaitUntilHeld("glFlush");
    EXPECT_EQ(driver.CallCount("glFinish"), 0u);

    driver.Release("glFlush");
    thread.join();

    EXPECT_EQ(driver.CallNames(), Names({"glFlush", "glFinish"}));
}

TEST(SimHold, AnActionRunsBeforeTheCall)
{
    SimDriver driver;
    const SimContext context(driver);
    std::size_t seen = 99;
    driver.OnCall("glFinish", [&] { seen = driver.CallCount("glFinish"); });

    glFinish();

    EXPECT_EQ(seen, 0u);
    EXPECT_EQ(driver.CallCount("glFinish"), 1u);
}

TEST(SimMisuse, FailsTheTestUnlessAllowed)
{
    EXPECT_NONFATAL_FAILURE(
        {
            SimDriver driver;
            glFlush();
        },
        "glFlush: no context is current");
    EXPECT_NONFATAL_FAILURE(
        {
            SimDriver driver;
            driver.ExpectMisuse("glFlush");
        },
        "no misuse of glFlush");
    SimDriver driver;
    driver.AllowMisuse("glFlush");
    glFlush();
    EXPECT_EQ(driver.Misuses().size(), 1u);
}

TEST(SimMisuse, DeletingANameTwiceIsOne)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.ExpectMisuse("glDeleteBuffers");
    GLuint name = 0;
    glGenBuffers(1, &name);
    glDeleteBuffers(1, &name);
    glDeleteBuffers(1, &name);

    EXPECT_EQ(driver.Misuses(),
              std::vector<std::string>{"glDeleteBuffers: name 1 was not generated here"});
}

} // namespace
