#include "oracle/Explore.h"
#include "oracle/Page.h"
#include "oracle/Shrink.h"

#include <nib/render_thread.h>
#include <nib/task.h>

#include <gtest/gtest.h>

#include <memory>

// The whole road: an application that knows nothing of update modes, and the surface render thread.
// It draws everything in each frame, and names a rectangle that is right both ways up.

using namespace Oracle;

namespace
{

/// Draws the page; the caller waits for the frame before it changes the page again.
class DrawTask : public Nib::ITask
{
public:
    explicit DrawTask(const Page& page) : m_page(page) {}

    void run() override { m_page.Draw(m_page.All()); }
    bool isGlobalLockAllowed() override { return true; }

private:
    const Page& m_page;
};

class Application
{
public:
    explicit Application(Device device)
        : m_driver(GpuOf(device)), m_window(m_driver.Window(8, 8)),
          m_thread(Nib::GLES::CreateSurfaceRenderer("oracle", Nib::RenderThreadGL::Medium))
    {
        m_driver.RecordCalls(false);
        m_thread->Start();
    }

    /// The first frame that does not show its page; -1 where all do.
    int FirstWrongFrame(const Scenario& scenario)
    {
        SimSwapChain chain;
        for (const Frame& frame : scenario.frames)
            chain.ages.push_back(frame.age);
        chain.undefined = scenario.lostIsZero ? SimPixel{} : chain.undefined;
        chain.damageIsAHint = scenario.damageIsAHint;
        m_driver.SetSwapChain(chain);
        m_driver.ResizeWindow(m_window, scenario.width, scenario.height);
        m_thread->OnSurfaceChanged(m_window, scenario.width, scenario.height, 0);
        const int wrong = Play(scenario);
        m_thread->OnSurfaceDestroyed();
        m_driver.ForgetLog();
        return wrong;
    }

private:
    int Play(const Scenario& scenario)
    {
        Page page(scenario.width, scenario.height);
        int number = 0;
        for (const Frame& frame : scenario.frames)
        {
            for (const Nib::RectF& rect : frame.dirty)
                page.Paint(rect);
            m_thread->ApplyUpdateRect(Named(frame, scenario, number == 0), scenario.rotation);
            m_thread->GetMsgQueue()->enQueueMsg(new DrawTask(page));
            m_thread->Render();
            if (m_driver.FrontPixels(m_window) != page.Pixels())
                return number;
            ++number;
        }
        return -1;
    }

    // Whole pixels of the screen, and the same ones counted from the bottom.
    static Nib::RectF Named(const Frame& frame, const Scenario& scenario, bool isFirst)
    {
        const float height = static_cast<float>(scenario.height);
        const Nib::RectF screen(0, 0, static_cast<float>(scenario.width), height);
        if (isFirst)
            return screen;
        Nib::RectF named;
        for (const Nib::RectF& rect : frame.dirty)
            named.Union(rect);
        if (!named.Intersect(screen))
            return Nib::RectF();
        named.ExtendRect();
        named.Union(Nib::RectF(named.left, height - named.bottom, named.right, height - named.top));
        return named;
    }

    SimDriver m_driver;
    ANativeWindow* m_window;
    std::unique_ptr<Nib::RenderThreadGL> m_thread;
};

class SurfaceThread : public testing::TestWithParam<Device>
{
};

std::string NameOfDevice(const testing::TestParamInfo<Device>& info)
{
    return NameOf(info.param);
}

} // namespace

TEST_P(SurfaceThread, ShowsWhatDrawingInFullShows)
{
    Application application(GetParam());
    const bool isPreserved = GetParam() == Device::Preserved;
    Space space;
    space.preserved = isPreserved;
    space.buffersGetLost = !isPreserved;

    for (std::uint32_t seed = 1; seed <= 60; ++seed)
    {
        const Scenario scenario = RandomScenario(seed).Make(space);
        ASSERT_EQ(application.FirstWrongFrame(scenario), -1) << ToStatements(Shrunk(
            scenario, [&](const Scenario& s) { return application.FirstWrongFrame(s) >= 0; }));
    }
}

INSTANTIATE_TEST_SUITE_P(Devices, SurfaceThread,
                         testing::Values(Device::PostSubBuffer, Device::DamageRegion,
                                         Device::TileAligned, Device::TiledRendering,
                                         Device::Preserved, Device::FullScreen),
                         NameOfDevice);
