#include "BrushStyle.h"
#include "InkSession.h"
#include "InkStroke.h"
#include "Recording.h"

#include <cstdlib>
#include <gtest/gtest.h>
#include <memory>

namespace
{

constexpr int kWidth = 320;
constexpr int kHeight = 200;

/// The sample on a page and a screen, without a display server.
class Screen : public testing::TestWithParam<Ink::BrushKind>
{
protected:
    static void SetUpTestSuite()
    {
        unsetenv("DISPLAY");
        setenv("EGL_PLATFORM", "surfaceless", 1);
        setenv("NIB_LOG", "silent", 0);
    }

    void SetUp() override
    {
        m_recording = Ink::ReadRecording(NIB_SAMPLE);
        m_placement = Ink::FitToPage(m_recording, kWidth, kHeight);
        m_thread.reset(
            Nib::RendererFactory::CreateSurfaceRenderer("screen", Nib::RenderThreadGL::Medium));
        ASSERT_TRUE(m_thread->Start());
    }

    /// Draws sample by sample and calls @p afterFrame with the number of samples.
    template <typename AfterFrame>
    void DrawFrames(Ink::InkSession& session, AfterFrame afterFrame)
    {
        const Ink::BrushStyle style = Ink::DefaultStyle(GetParam());
        int samples = 0;
        for (const Ink::Stroke& stroke : m_recording.strokes)
        {
            Ink::InkStroke ink(style);
            for (const Ink::Sample& sample : stroke)
            {
                ink.Add(Ink::ToPage(sample, m_placement, style));
                if (&sample == &stroke.back())
                    ink.End();
                session.Draw(ink.Take());
                session.Present();
                afterFrame(++samples);
            }
        }
        ASSERT_EQ(session.Error(), "");
    }

    Ink::Recording m_recording;
    Ink::Placement m_placement;
    std::unique_ptr<Nib::RenderThreadGL> m_thread;
};

TEST_P(Screen, ShowsThePageThoughEachFrameRedrawsAPartAlone)
{
    Ink::InkSession session(*m_thread, kWidth, kHeight, {0.9f, 0.95f, 1.0f, 1.0f});
    session.AttachScreen();
    session.Present();
    const long long wholePage = session.Figures().redrawnPixels;
    EXPECT_EQ(wholePage, kWidth * kHeight);
    int frames = 0;
    DrawFrames(session,
               [&](int samples)
               {
                   ++frames;
                   if (samples % 40 == 0)
                   {
                       EXPECT_EQ(session.ReadScreen(), session.ReadPixels()) << samples;
                   }
               });
    EXPECT_EQ(session.ReadScreen(), session.ReadPixels());
    EXPECT_EQ(frames, 433);
    EXPECT_LT(session.Figures().redrawnPixels - wholePage, 433LL * kWidth * kHeight / 20);
}

TEST_P(Screen, PageIsTheOneThatIsDrawnWithoutFrames)
{
    Ink::InkSession framed(*m_thread, kWidth, kHeight, {1.0f, 1.0f, 1.0f, 1.0f});
    framed.AttachScreen();
    DrawFrames(framed, [](int) {});

    Ink::InkSession whole(*m_thread, kWidth, kHeight, {1.0f, 1.0f, 1.0f, 1.0f});
    const Ink::BrushStyle style = Ink::DefaultStyle(GetParam());
    for (const Ink::Stroke& stroke : m_recording.strokes)
    {
        Ink::InkStroke ink(style);
        for (const Ink::Sample& sample : stroke)
            ink.Add(Ink::ToPage(sample, m_placement, style));
        ink.End();
        whole.Draw(ink.Take());
    }
    EXPECT_EQ(framed.ReadPixels(), whole.ReadPixels());
}

TEST_P(Screen, ComesThroughALossOfTheContext)
{
    std::unique_ptr<Nib::RenderThreadGL> child(
        Nib::RendererFactory::CreateOffscreenRenderer(m_thread->GetMsgQueue(), "child", true));
    ASSERT_TRUE(child->Start());
    {
        Ink::InkSession session(*child, kWidth, kHeight, {1.0f, 1.0f, 1.0f, 1.0f});
        session.AttachScreen();
        DrawFrames(session,
                   [&](int samples)
                   {
                       if (samples % 100 == 0)
                       {
                           session.LoseContext();
                           EXPECT_EQ(session.ReadScreen(), session.ReadPixels()) << samples;
                       }
                   });
        EXPECT_EQ(session.ReadScreen(), session.ReadPixels());
    }
}

std::string NameOf(const testing::TestParamInfo<Ink::BrushKind>& brush)
{
    constexpr const char* kNames[] = {"pen", "marker", "stamp"};
    return kNames[static_cast<int>(brush.param)];
}

INSTANTIATE_TEST_SUITE_P(Brushes, Screen,
                         testing::Values(Ink::BrushKind::Pen, Ink::BrushKind::Marker,
                                         Ink::BrushKind::Stamp),
                         NameOf);

} // namespace
