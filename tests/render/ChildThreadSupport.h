#ifndef NIB_TESTS_RENDER_CHILD_THREAD_SUPPORT_H
#define NIB_TESTS_RENDER_CHILD_THREAD_SUPPORT_H

// The offscreen and the front-buffer render thread start, pause, resume and end by the same rules:
// each rule is tested for both.

#include "render/SurfaceThreadSupport.h"

#include <nib/base.h>

#include <ostream>

using ThreadPtr = std::unique_ptr<Nib::RenderThreadGL>;

inline EGLContext ContextOf(Nib::RenderThreadGL& thread)
{
    return AskOn(thread.GetMsgQueue(), [] { return eglGetCurrentContext(); });
}

/// A surface render thread that runs, to be a parent.
inline ThreadPtr StartedParent()
{
    ThreadPtr parent(Nib::GLES::CreateSurfaceRenderer("parent", Nib::RenderThreadGL::Medium));
    EXPECT_TRUE(parent->Start());
    return parent;
}

/// Two configurations: what the first one lacks is the front buffer.
inline SimGpu ChildGpu()
{
    SimConfig ordinary;
    SimConfig frontBuffer;
    frontBuffer.surfaceType = 0x1005;
    return SimGpu::Default()
        .WithFrontBuffer()
        .WithConfigs({ordinary, frontBuffer})
        .WithEglExtension("EGL_IMG_context_priority");
}

/// The surface type of the configuration that a context was made with.
inline int SurfaceTypeOf(const SimDriver& driver, const SimContextState& context)
{
    return driver.Gpu().configs.at(static_cast<std::size_t>(context.config)).surfaceType;
}

/// A render thread that shares the context of its parent.
struct ChildKind
{
    const char* name;
    const char* className;
    Nib::RenderThreadGL* (*create)(Nib::IGLMsgQueue* parent);
    const char* skipLevel; ///< of the line that a pause which is skipped writes
};

inline void PrintTo(const ChildKind& kind, std::ostream* out)
{
    *out << kind.name;
}

inline const ChildKind kChildKinds[] = {
    {"Offscreen", "RenderThreadOffscreenGLImpl",
     [](Nib::IGLMsgQueue* parent)
     { return Nib::GLES::CreateOffscreenRenderer(parent, "child", true); },
     "E"},
    {"FrontBuffer", "RenderThreadFBRImpl",
     [](Nib::IGLMsgQueue* parent) { return Nib::GLES::CreateFBRSurfaceRenderer(parent, "child"); },
     "W"},
};

inline std::string NameOfKind(const testing::TestParamInfo<ChildKind>& info)
{
    return info.param.name;
}

class ChildThread : public testing::TestWithParam<ChildKind>
{
protected:
    ChildThread() { Nib::System::SetSDKVersion(34); }

    static ThreadPtr New(Nib::IGLMsgQueue* parent) { return ThreadPtr(GetParam().create(parent)); }

    static ThreadPtr Started(Nib::IGLMsgQueue* parent = nullptr)
    {
        ThreadPtr thread = New(parent);
        EXPECT_TRUE(thread->Start());
        EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());
        return thread;
    }

    /// The text with the name of the class in place of each '@'.
    static std::string Text(std::string text)
    {
        for (std::size_t at = text.find('@'); at != std::string::npos; at = text.find('@'))
            text.replace(at, 1, GetParam().className);
        return text;
    }

    static std::vector<std::string> Texts(std::initializer_list<std::string> texts)
    {
        std::vector<std::string> result;
        for (const std::string& text : texts)
            result.push_back(Text(text));
        return result;
    }

    SimDriver driver{ChildGpu()};
};

#endif
