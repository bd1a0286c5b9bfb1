#include "InkSession.h"
#include "sim/SimDriver.h"

#include <cstdlib>
#include <filesystem>
#include <gtest/gtest.h>
#include <memory>

namespace
{

/// A page of 100 x 80 pixels in a window of a device that posts parts of its back buffer, and a
/// first frame.
class PresentCalls : public testing::Test
{
protected:
    explicit PresentCalls(
        const SimGpu& gpu = SimGpu::Named("PowerVR Rogue GE8320").WithPostSubBuffer())
        : driver(gpu)
    {
        std::string folder = std::filesystem::temp_directory_path() / "nib-present-XXXXXX";
        if (!mkdtemp(folder.data()))
            throw std::runtime_error("no temporary folder");
        m_folder = folder;
        m_cache = folder + "/sdk";
        Nib::System::SetSDKCacheDirectoryPath(m_cache.c_str());
        m_thread.reset(Nib::GLES::CreateSurfaceRenderer("ink", Nib::RenderThreadGL::High));
        m_thread->Start();
        m_session = std::make_unique<Ink::InkSession>(*m_thread, 100, 80, Ink::Colour{1, 1, 1, 1});
        m_session->AttachWindow(driver.Window(100, 80));
        m_session->Present();
        driver.ForgetCalls();
    }

    ~PresentCalls() override
    {
        EXPECT_EQ(m_session->Error(), "");
        m_session.reset();
        m_thread.reset();
        std::filesystem::remove_all(m_folder);
    }

    /// Presents ink in the box from (@p left, @p top) to (@p right, @p bottom).
    void Present(float left, float top, float right, float bottom)
    {
        Ink::InkPiece piece;
        piece.style = Ink::DefaultStyle(Ink::BrushKind::Pen);
        piece.startsStroke = true;
        piece.band = {{left, top, 1}, {right, top, 1}, {left, bottom, 1}};
        m_session->Draw(std::move(piece));
        m_session->Present();
    }

    SimDriver driver;

private:
    std::string m_folder;
    std::string m_cache;
    std::unique_ptr<Nib::RenderThreadGL> m_thread;
    std::unique_ptr<Ink::InkSession> m_session;
};

class DamageCalls : public PresentCalls
{
protected:
    DamageCalls() : PresentCalls(SimGpu::Named("Mali-G72")) {}
};

TEST_F(PresentCalls, PostedPartIsWholePixelsAndRightBothWaysUp)
{
    Present(10.5f, 5.25f, 20.25f, 12.75f);

    const SimCall post = driver.LastCall("eglPostSubBufferNV");
    // Rows 5 to 13 from the top are rows 67 to 75 from the bottom.
    EXPECT_EQ(post.Arg(2), 10);
    EXPECT_EQ(post.Arg(3), 5);
    EXPECT_EQ(post.Arg(4), 11);
    EXPECT_EQ(post.Arg(5), 70);
}

TEST_F(DamageCalls, DamageIsTheInkAloneWhereNothingIsPosted)
{
    Present(10.5f, 5.25f, 20.25f, 12.75f);

    EXPECT_EQ(driver.LastCall("eglSwapBuffersWithDamageKHR").list,
              (std::vector<long long>{10, 67, 11, 8}));
}

} // namespace
