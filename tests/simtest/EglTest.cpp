#include "sim/SimDriver.h"

#include <gtest/gtest.h>

#include <thread>

namespace
{

EGLDisplay Display()
{
    const EGLDisplay display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    eglInitialize(display, nullptr, nullptr);
    return display;
}

std::vector<EGLConfig> Choose(EGLDisplay display, std::vector<EGLint> wanted)
{
    wanted.push_back(EGL_NONE);
    EGLint count = 0;
    if (!eglChooseConfig(display, wanted.data(), nullptr, 0, &count))
        return {};
    std::vector<EGLConfig> configs(static_cast<std::size_t>(count));
    eglChooseConfig(display, wanted.data(), configs.data(), count, &count);
    configs.resize(static_cast<std::size_t>(count));
    return configs;
}

EGLint Attribute(EGLDisplay display, EGLConfig config, EGLint name)
{
    EGLint value = -1;
    eglGetConfigAttrib(display, config, name, &value);
    return value;
}

EGLContext NewContext(EGLDisplay display, EGLContext share = EGL_NO_CONTEXT, EGLint version = 3)
{
    const EGLConfig config = Choose(display, {EGL_RENDERABLE_TYPE, 0x40, EGL_ALPHA_SIZE, 8}).at(0);
    const EGLint list[] = {EGL_CONTEXT_CLIENT_VERSION, version, EGL_NONE};
    return eglCreateContext(display, config, share, list);
}

TEST(SimEgl, ContextIsCurrentOnTheThreadThatMadeItCurrent)
{
    SimDriver driver;
    const SimContext context(driver);

    EXPECT_EQ(eglGetCurrentContext(), context.Handle());
    EXPECT_EQ(driver.CallNames(), Names({"eglGetCurrentContext"}));
    EXPECT_EQ(driver.Context(context.Handle()).thread, SimDriver::ThisThread());
    std::thread([] { EXPECT_EQ(eglGetCurrentContext(), EGL_NO_CONTEXT); }).join();
}

TEST(SimEgl, SizesAreMinimumsAndTypesAreMasks)
{
    SimConfig small;
    small.red = small.green = small.blue = 4;
    small.alpha = 0;
    SimConfig pbufferOnly;
    pbufferOnly.surfaceType = EGL_PBUFFER_BIT;
    SimConfig deep;
    deep.depth = 24;
    SimDriver driver(SimGpu::Default().WithConfigs({deep, pbufferOnly, small}));
    const EGLDisplay display = Display();

    const std::vector<EGLConfig> both =
        Choose(display, {EGL_RENDERABLE_TYPE, 0x40, EGL_SURFACE_TYPE, 0x5, EGL_RED_SIZE, 4});
    ASSERT_EQ(both.size(), 2u);
    EXPECT_EQ(Attribute(display, both[0], EGL_DEPTH_SIZE), 24);
    EXPECT_EQ(Attribute(display, both[1], EGL_RED_SIZE), 4);
    EXPECT_EQ(Choose(display, {EGL_RENDERABLE_TYPE, 0x40, EGL_RED_SIZE, 8}).size(), 1u);
    EXPECT_EQ(
        Choose(display, {EGL_RENDERABLE_TYPE, 0x40, EGL_SURFACE_TYPE, EGL_PBUFFER_BIT}).size(), 3u);
    EXPECT_EQ(Choose(display, {}).size(), 0u); // an ES 1 configuration by default
}

TEST(SimEgl, MutableConfigurationsNeedTheExtension)
{
    SimDriver driver(
        SimGpu::Default().WithFrontBuffer().WithoutEglExtension("EGL_KHR_mutable_render_buffer"));
    const EGLDisplay display = Display();

    EXPECT_TRUE(Choose(display, {EGL_RENDERABLE_TYPE, 0x40, EGL_SURFACE_TYPE, 0x1005}).empty());
    EXPECT_EQ(eglGetError(), EGL_BAD_ATTRIBUTE);
}

TEST(SimEgl, CountsOfConfigurationsMayDiffer)
{
    SimDriver driver;
    const EGLDisplay display = Display();
    driver.SetConfigCounts(4, 1);
    const EGLint wanted[] = {EGL_RENDERABLE_TYPE, 0x40, EGL_NONE};
    EGLConfig configs[4];
    EGLint count = 0;
    eglChooseConfig(display, wanted, nullptr, 0, &count);
    EXPECT_EQ(count, 4);
    eglChooseConfig(display, wanted, configs, 4, &count);
    EXPECT_EQ(count, 1);
}

TEST(SimEgl, ACurrentContextIsRefusedToOtherThreads)
{
    SimDriver driver;
    driver.ExpectMisuse("eglMakeCurrent");
    const SimContext context(driver);
    const EGLSurface surface = eglGetCurrentSurface(EGL_DRAW);

    std::thread(
        [&]
        {
            EXPECT_FALSE(eglMakeCurrent(Display(), surface, surface, context.Handle()));
            EXPECT_EQ(eglGetError(), EGL_BAD_ACCESS);
        })
        .join();

    EXPECT_EQ(eglGetError(), EGL_SUCCESS); // each thread has its own
}

TEST(SimEgl, ADestroyedContextLivesUntilItIsReleased)
{
    SimDriver driver;
    const EGLDisplay display = Display();
    const EGLContext context = NewContext(display);
    eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, context);
    eglDestroyContext(display, context);
    EXPECT_EQ(driver.Live().contexts, 1);
    EXPECT_FALSE(driver.Context(context).exists);
    glFlush();

    eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);

    EXPECT_EQ(driver.Live().contexts, 0);
}

TEST(SimEgl, AThreadThatEndsReleasesItsContext)
{
    SimDriver driver;
    const EGLDisplay display = Display();
    const EGLContext context = NewContext(display);
    std::thread([&] { eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, context); }).join();

    EXPECT_EQ(driver.Context(context).thread, 0u);
    eglDestroyContext(display, context);
    EXPECT_EQ(driver.Live().contexts, 0);
}

TEST(SimEgl, ADestroyedContextDiesWithItsThread)
{
    SimDriver driver;
    const EGLDisplay display = Display();
    const EGLContext context = NewContext(display);
    std::thread(
        [&]
        {
            eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, context);
            eglDestroyContext(display, context);
        })
        .join();

    EXPECT_EQ(driver.Live().contexts, 0);
}

TEST(SimEgl, ObjectsBelongToTheShareGroup)
{
    SimDriver driver;
    const SimContext first(driver);
    GLuint texture = 0;
    glGenTextures(1, &texture);
    glBindTexture(GL_TEXTURE_2D, texture);
    GLuint framebuffer = 0;
    glGenFramebuffers(1, &framebuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);
    {
        const SimContext second(driver, first);
        EXPECT_TRUE(glIsTexture(texture));
        EXPECT_FALSE(glIsFramebuffer(framebuffer));
        const SimContext stranger(driver);
        EXPECT_FALSE(glIsTexture(texture));
    }
    EXPECT_EQ(driver.Live().textures, 1);
    EXPECT_EQ(driver.LostWithContext(), SimCounts{});
}

TEST(SimEgl, WhatDiesWithTheGroupIsCounted)
{
    SimDriver driver;
    {
        const SimContext context(driver);
        GLuint names[2];
        glGenTextures(2, names);
        glGenFramebuffers(1, names);
        glCreateShader(GL_VERTEX_SHADER);
    }
    EXPECT_EQ(driver.LostWithContext().textures, 2);
    EXPECT_EQ(driver.LostWithContext().framebuffers, 1);
    EXPECT_EQ(driver.LostWithContext().shaders, 1);
    EXPECT_EQ(driver.Live(), SimCounts{});
}

TEST(SimEgl, ContextAttributes)
{
    SimDriver driver;
    const EGLDisplay display = Display();
    const EGLConfig config = Choose(display, {EGL_RENDERABLE_TYPE, 0x40}).at(0);
    const EGLint list[] = {EGL_CONTEXT_CLIENT_VERSION, 2, EGL_CONTEXT_PRIORITY_LEVEL_IMG,
                           EGL_CONTEXT_PRIORITY_LOW_IMG, EGL_NONE};
    const EGLContext parent = eglCreateContext(display, config, EGL_NO_CONTEXT, list);
    const EGLContext child = NewContext(display, parent, 2);

    EXPECT_EQ(driver.Context(parent).clientVersion, 2);
    EXPECT_EQ(driver.Context(parent).priority, EGL_CONTEXT_PRIORITY_LOW_IMG);
    EXPECT_EQ(driver.Context(child).share, parent);
    EXPECT_EQ(driver.Calls("eglCreateContext")[0].list,
              (std::vector<long long>{EGL_CONTEXT_CLIENT_VERSION, 2, 0x3100, 0x3103}));
    EGLint version = 0;
    eglQueryContext(display, child, EGL_CONTEXT_CLIENT_VERSION, &version);
    EXPECT_EQ(version, 2);
}

TEST(SimEgl, TheApiIsBoundByThread)
{
    SimDriver driver;
    driver.SetInitialApi(EGL_OPENGL_API);
    EXPECT_EQ(eglQueryAPI(), EGLenum{EGL_OPENGL_API});
    EXPECT_EQ(eglBindAPI(EGL_OPENGL_ES_API), EGLBoolean{EGL_TRUE});
    EXPECT_EQ(eglQueryAPI(), EGLenum{EGL_OPENGL_ES_API});
    std::thread([] { EXPECT_EQ(eglQueryAPI(), EGLenum{EGL_OPENGL_API}); }).join();
}

TEST(SimEgl, EntryPointsComeWithTheirExtensions)
{
    SimDriver driver(SimGpu::Named("Mali-G72"));
    EXPECT_NE(eglGetProcAddress("eglSetDamageRegionKHR"), nullptr);
    EXPECT_EQ(eglGetProcAddress("eglPostSubBufferNV"), nullptr);
    EXPECT_EQ(eglGetProcAddress("glStartTilingQCOM"), nullptr);
    EXPECT_EQ(eglGetProcAddress("eglNoSuchThing"), nullptr);
}

TEST(SimGpus, NamedOnesAnswerToTheirNames)
{
    for (const SimGpu& gpu : SimGpu::All())
    {
        EXPECT_EQ(SimGpu::Named(gpu.renderer).renderer, gpu.renderer);
        EXPECT_FALSE(gpu.vendor.empty());
        EXPECT_GE(gpu.GlVersion(), 20);
    }
    EXPECT_EQ(SimGpu::Named("Mali-G610").vendor, "ARM");
    EXPECT_EQ(SimGpu::Named("Adreno (TM) 740").vendor, "Qualcomm");
    EXPECT_EQ(SimGpu::Named("Adreno (TM) 330").GlVersion(), 30);
    EXPECT_EQ(SimGpu::Default().WithVersion("OpenGL ES 2.0").GlVersion(), 20);
}

} // namespace
