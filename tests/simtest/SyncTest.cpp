#include "sim/SimDriver.h"

#include <gtest/gtest.h>

#include <thread>

namespace
{

template <typename Function>
Function Resolve(const char* name)
{
    return reinterpret_cast<Function>(eglGetProcAddress(name));
}

struct EglFences
{
    PFNEGLCREATESYNCKHRPROC create = Resolve<PFNEGLCREATESYNCKHRPROC>("eglCreateSyncKHR");
    PFNEGLDESTROYSYNCKHRPROC destroy = Resolve<PFNEGLDESTROYSYNCKHRPROC>("eglDestroySyncKHR");
    PFNEGLCLIENTWAITSYNCKHRPROC wait = Resolve<PFNEGLCLIENTWAITSYNCKHRPROC>("eglClientWaitSyncKHR");
    PFNEGLGETSYNCATTRIBKHRPROC get = Resolve<PFNEGLGETSYNCATTRIBKHRPROC>("eglGetSyncAttribKHR");
    EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);

    EGLint Status(EGLSyncKHR sync) const
    {
        EGLint status = -1;
        get(display, sync, EGL_SYNC_STATUS_KHR, &status);
        return status;
    }
};

TEST(SimSync, AFenceIsPassedAtOnce)
{
    SimDriver driver;
    const SimContext context(driver);
    const GLsync sync = glFenceSync(GL_SYNC_GPU_COMMANDS_COMPLETE, 0);

    EXPECT_EQ(glClientWaitSync(sync, 0, 0), GLenum{GL_ALREADY_SIGNALED});
    glDeleteSync(sync);
    EXPECT_EQ(driver.Live().syncs, 0);
}

TEST(SimSync, AtTheWaitersPaceTheFirstWaitPassesIt)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.SetPace(SimPace::OnWait);
    const GLsync sync = glFenceSync(GL_SYNC_GPU_COMMANDS_COMPLETE, 0);
    GLint status = 0;
    glGetSynciv(sync, GL_SYNC_STATUS, 1, nullptr, &status);

    EXPECT_EQ(status, GL_UNSIGNALED);
    EXPECT_EQ(glClientWaitSync(sync, 0, 0), GLenum{GL_TIMEOUT_EXPIRED});
    EXPECT_EQ(glClientWaitSync(sync, 0, 1), GLenum{GL_CONDITION_SATISFIED});
    EXPECT_EQ(glClientWaitSync(sync, 0, 1), GLenum{GL_ALREADY_SIGNALED});
}

TEST(SimSync, AHeldGpuKeepsWaitersUntilItIsReleased)
{
    SimDriver driver;
    SimContext context(driver);
    driver.SetPace(SimPace::Held);
    const GLsync sync = glFenceSync(GL_SYNC_GPU_COMMANDS_COMPLETE, 0);
    EXPECT_EQ(glClientWaitSync(sync, 0, 1000000), GLenum{GL_TIMEOUT_EXPIRED});
    context.Release();
    GLenum result = 0;
    std::thread waiter(
        [&]
        {
            context.MakeCurrent();
            result = glClientWaitSync(sync, 0, GL_TIMEOUT_IGNORED);
            context.Release();
        });
    driver.WaitUntilHeld("glClientWaitSync");

    driver.ReleaseGpu();
    waiter.join();

    EXPECT_EQ(result, GLenum{GL_CONDITION_SATISFIED});
}

TEST(SimSync, FinishWaitsForAHeldGpu)
{
    SimDriver driver;
    SimContext context(driver);
    context.Release();
    driver.SetPace(SimPace::Held);
    std::thread waiter(
        [&]
        {
            context.MakeCurrent();
            glFinish();
            glFlush();
            context.Release();
        });
    driver.WaitUntilHeld("glFinish");
    EXPECT_EQ(driver.CallCount("glFlush"), 0u);

    driver.ReleaseGpu();
    waiter.join();

    EXPECT_EQ(driver.CallCount("glFlush"), 1u);
}

TEST(SimSync, AnUnflushedFenceOfAnotherContextIsMisuse)
{
    SimDriver driver;
    SimContext first(driver);
    const GLsync sync = glFenceSync(GL_SYNC_GPU_COMMANDS_COMPLETE, 0);
    driver.ExpectMisuse("glWaitSync");
    glWaitSync(sync, 0, GL_TIMEOUT_IGNORED); // its own context may
    EXPECT_TRUE(driver.Misuses().empty());
    {
        std::thread(
            [&]
            {
                const SimContext second(driver, first);
                glWaitSync(sync, 0, GL_TIMEOUT_IGNORED);
            })
            .join();
    }
    EXPECT_EQ(driver.Misuses().size(), 1u);
    glFlush();
    std::thread(
        [&]
        {
            const SimContext second(driver, first);
            glWaitSync(sync, 0, GL_TIMEOUT_IGNORED);
        })
        .join();
    EXPECT_EQ(driver.Misuses().size(), 1u);
}

TEST(SimSync, EglFences)
{
    SimDriver driver;
    const SimContext context(driver);
    const EglFences egl;
    const EGLSyncKHR passed = egl.create(egl.display, EGL_SYNC_FENCE_KHR, nullptr);
    EXPECT_EQ(egl.Status(passed), EGL_SIGNALED_KHR);
    driver.SetPace(SimPace::Held);
    const EGLSyncKHR sync = egl.create(egl.display, EGL_SYNC_FENCE_KHR, nullptr);
    EXPECT_EQ(egl.Status(sync), EGL_UNSIGNALED_KHR);
    EXPECT_EQ(egl.wait(egl.display, sync, 0, 5), EGL_TIMEOUT_EXPIRED_KHR);

    driver.ReleaseGpu();

    EXPECT_EQ(egl.wait(egl.display, sync, 0, EGL_FOREVER_KHR), EGL_CONDITION_SATISFIED_KHR);
    EXPECT_EQ(egl.Status(sync), EGL_SIGNALED_KHR);
    egl.destroy(egl.display, sync);
    egl.destroy(egl.display, passed);
    EXPECT_EQ(driver.Live().eglSyncs, 0);
}

TEST(SimSync, ADestroyedEglFenceIsMisuse)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.ExpectMisuse("eglClientWaitSyncKHR");
    const EglFences egl;
    const EGLSyncKHR sync = egl.create(egl.display, EGL_SYNC_FENCE_KHR, nullptr);
    egl.destroy(egl.display, sync);

    EXPECT_EQ(egl.wait(egl.display, sync, 0, 0), EGL_FALSE);
    EXPECT_EQ(eglGetError(), EGL_BAD_PARAMETER);
}

} // namespace
