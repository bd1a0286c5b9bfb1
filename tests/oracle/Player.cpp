#include "oracle/Player.h"

#include "oracle/SwapChain.h"
#include "render/FrameDamage.h"

#include <nib/device.h>

#include <sstream>

namespace Oracle
{

namespace
{

constexpr unsigned kKeepHistory = 0x04;
constexpr unsigned kPostSubBuffer = 0x80;
constexpr unsigned kTiledRenderingMode = 0x25;
constexpr unsigned kFullScreenMode = 0x01;
constexpr int kTileSize = 32;
constexpr SimPixel kGarbage{0xDE, 0xAD, 0xBE, 0xEF};

bool IsOneOf(int value, int a, int b)
{
    return value == a || value == b;
}

SimSwapChain ChainOf(const Scenario& scenario, Device device)
{
    const int quarterTurns = ((scenario.panelRotation / 90 + scenario.rotation) % 4 + 4) % 4;
    SimSwapChain chain;
    for (const Frame& frame : scenario.frames)
        chain.ages.push_back(frame.age);
    chain.undefined = scenario.lostIsZero ? SimPixel{} : kGarbage;
    chain.damageIsAHint = scenario.damageIsAHint;
    chain.tileSize = device == Device::TileAligned ? kTileSize : 0;
    chain.tilesFromRight = IsOneOf(quarterTurns, 1, 2);
    chain.tilesFromTop = IsOneOf(quarterTurns, 2, 3);
    return chain;
}

std::string Text(const SimPixel& pixel)
{
    std::ostringstream out;
    out << pixel;
    return out.str();
}

} // namespace

/// One scenario, from the surface on.
class Player::Run
{
public:
    Run(Player& player, const Caller& caller, const Scenario& scenario)
        : m_player(player), m_caller(caller), m_scenario(scenario),
          m_page(scenario.width, scenario.height), m_history(caller.historyLength)
    {
    }

    std::string Play();

private:
    void Begin();
    void End();
    void PlayFrame(const Frame& frame, bool isFirst);
    std::vector<Nib::RectF> Named(const Frame& frame, bool isFirst) const;
    Nib::RectF AsHanded(Nib::RectF rect) const;
    void DrawWhatChanged(const std::vector<Nib::RectF>& named);
    Box Redrawn(const Nib::RectF& named);
    std::string FirstDifference(std::size_t frame) const;

    Player& m_player;
    const Caller& m_caller;
    const Scenario& m_scenario;
    Page m_page;
    Nib::ClipRect m_history;
    Nib::GLES::FrameDamage m_damage;
    std::unique_ptr<Nib::EglSurface> m_surface;
    std::unique_ptr<Nib::UpdateRectangle> m_update;
};

std::string Player::Run::Play()
{
    Begin();
    std::string difference;
    for (std::size_t i = 0; i < m_scenario.frames.size() && difference.empty(); ++i)
    {
        PlayFrame(m_scenario.frames[i], i == 0);
        difference = FirstDifference(i);
    }
    End();
    return difference;
}

void Player::Run::Begin()
{
    SimDriver& driver = m_player.m_driver;
    driver.SetSwapChain(ChainOf(m_scenario, m_player.m_device));
    driver.SetProperty("ro.sf.hwrotation", std::to_string(m_scenario.panelRotation));
    driver.ResizeWindow(m_player.m_window, m_scenario.width, m_scenario.height);
    Nib::Egl* const egl = Nib::Egl::GetInstance();
    m_surface.reset(egl->CreateWindowSurface(m_player.m_window));
    egl->MakeCurrent(&m_player.m_context, m_surface.get());
    InitOpenGLExtensions();

    m_update = std::make_unique<Nib::UpdateRectangle>();
    m_update->Init(m_surface.get(), m_scenario.width, m_scenario.height);
    m_history.Init(m_scenario.width, m_scenario.height);
    if (m_player.m_device == Device::PreservedOnce)
    {
        m_surface->SetAttribute(EGL_SWAP_BEHAVIOR, EGL_BUFFER_DESTROYED);
        driver.FailNext("eglSurfaceAttrib", EGL_BAD_MATCH);
        m_update->Init(m_surface.get(), m_scenario.width, m_scenario.height);
    }
    m_player.m_mode = m_update->GetUpdateMode();
}

void Player::Run::End()
{
    Nib::Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    m_player.m_driver.ForgetLog();
}

void Player::Run::PlayFrame(const Frame& frame, bool isFirst)
{
    for (const Nib::RectF& rect : frame.dirty)
        m_page.Paint(rect);

    const std::vector<Nib::RectF> named = Named(frame, isFirst);
    for (const Nib::RectF& rect : named)
    {
        m_damage.Add(rect); // as a surface render thread does
        m_update->UseRect(AsHanded(rect), m_scenario.rotation);
    }
    DrawWhatChanged(named);
    const Nib::UpdateRectangle::DamageRect damage =
        m_damage.Take({m_scenario.width, m_scenario.height});
    if (m_update->NeedsDamageRect())
        m_update->SetDamageRect(damage);
    m_update->Reset();
    m_update->DoSwapBuffers();
}

// The rectangles of one frame, as the caller tells of them.
std::vector<Nib::RectF> Player::Run::Named(const Frame& frame, bool isFirst) const
{
    const Nib::RectF screen(0, 0, static_cast<float>(m_scenario.width),
                            static_cast<float>(m_scenario.height));
    std::vector<Nib::RectF> named = frame.dirty;
    if (named.empty() && m_caller.namesEmptyFrames)
        named = {Nib::RectF()};
    if (named.size() > 1 && m_caller.namesOneRectangle)
    {
        for (const Nib::RectF& rect : named)
            named.front().Union(rect);
        named.resize(1);
    }
    if ((isFirst && m_caller.namesTheFirstFrameWhole) || m_caller.namesEveryFrameWhole)
        named = {screen};
    for (Nib::RectF& rect : named)
    {
        if (m_caller.namesOnlyTheScreen && !rect.Intersect(screen))
            rect = Nib::RectF();
        if (m_caller.namesWholePixels)
            rect.ExtendRect();
    }
    return named;
}

Nib::RectF Player::Run::AsHanded(Nib::RectF rect) const
{
    const bool isTurned = (m_update->GetUpdateMode() & kPostSubBuffer) != 0;
    if (!isTurned || !m_caller.turnsForSubBuffers || rect.IsEmpty())
        return rect;
    const float height = static_cast<float>(m_scenario.height);
    return {rect.left, height - rect.bottom, rect.right, height - rect.top};
}

void Player::Run::DrawWhatChanged(const std::vector<Nib::RectF>& named)
{
    for (const Nib::RectF& rect : named)
        m_page.Draw(m_caller.drawsWhatTheModeAsks
                        ? Redrawn(rect)
                        : TouchedPixels(rect, m_page.Width(), m_page.Height()));
}

// What the back buffer needs to become the page.
Box Player::Run::Redrawn(const Nib::RectF& named)
{
    const unsigned mode = m_update->GetUpdateMode();
    if (mode == kFullScreenMode || mode == kTiledRenderingMode)
        return m_page.All(); // the tiling region is not told, and clips by itself
    if ((mode & kPostSubBuffer) != 0)
        return TouchedPixels(named, m_page.Width(), m_page.Height());

    const Nib::RectF area = (mode & kKeepHistory) != 0 ? m_history.AddUpdateRect(&named) : named;
    const int rotationIndex = (m_scenario.panelRotation / 90 + m_scenario.rotation) % 4;
    Box box{};
    m_update->GetScissorRect(area, &box.x, &box.y, &box.width, &box.height, rotationIndex);
    return box;
}

std::string Player::Run::FirstDifference(std::size_t frame) const
{
    const std::vector<SimPixel> seen = m_player.m_driver.FrontPixels(m_player.m_window);
    const std::vector<SimPixel>& wanted = m_page.Pixels();
    const std::size_t width = static_cast<std::size_t>(m_scenario.width);
    const std::size_t height = static_cast<std::size_t>(m_scenario.height);
    for (std::size_t y = 0; y < height; ++y)
    {
        for (std::size_t x = 0; x < width; ++x)
        {
            const std::size_t i = (height - 1 - y) * width + x;
            if (seen.at(i) != wanted[i])
                return "frame " + std::to_string(frame) + ", pixel (" + std::to_string(x) + ", " +
                       std::to_string(y) + "): " + Text(seen[i]) + " instead of " + Text(wanted[i]);
        }
    }
    return "";
}

Player::Player(Device device, const Caller& caller)
    : m_device(device), m_caller(caller), m_driver(GpuOf(device)), m_window(m_driver.Window(8, 8))
{
    m_driver.RecordCalls(false);
    m_context.Create(EGL_NO_CONTEXT, false, Nib::EglContext::Priority::Medium);
}

Player::~Player() = default;

std::string Player::Play(const Scenario& scenario)
{
    return PlayAs(m_caller, scenario);
}

std::string Player::PlayAs(const Caller& caller, const Scenario& scenario)
{
    if (Repaired(scenario) != scenario)
        return "the window's buffers cannot have these ages";
    if (!caller.namesOnlyTheScreen)
        m_driver.AllowMisuse("eglPostSubBufferNV"); // which takes no rectangle beyond the window
    return Run(*this, caller, scenario).Play();
}

} // namespace Oracle
