#ifndef NIB_TESTS_ORACLE_PLAYER_H
#define NIB_TESTS_ORACLE_PLAYER_H

#include "oracle/Page.h"
#include "oracle/Scenario.h"

#include <nib/egl.h>
#include <nib/partial_update.h>

#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

namespace Oracle
{

/// A device for each update mode, and for each way to tell the age of a back buffer.
enum class Device
{
    PostSubBuffer,         ///< 0x81
    DamageRegion,          ///< 0x45
    TileAligned,           ///< 0x07; tiles are not loaded before they are drawn into
    TiledRendering,        ///< 0x25
    TiledRenderingNoAge,   ///< 0x25, where the age is not to be trusted
    TiledRenderingAgeless, ///< 0x25, where EGL_EXT_buffer_age is missing
    Preserved,             ///< 0x09
    PreservedOnce,         ///< 0x09, where the surface of the scenario itself refuses
    FullScreen,            ///< 0x01
};

SimGpu GpuOf(Device device);
const char* NameOf(Device device);
void PrintTo(Device device, std::ostream* out); // for the names of tests

/// What a caller makes of the dirty rectangles of a frame. As it stands it does all that
/// docs/partial-update.md asks for.
struct Caller
{
    bool namesTheFirstFrameWhole = true;
    bool namesEveryFrameWhole = false;
    bool namesEmptyFrames = true;     ///< by an empty rectangle, where nothing changes
    bool namesOneRectangle = true;    ///< a frame: the bounding box, where there are several
    bool namesWholePixels = true;     ///< rounded outward
    bool namesOnlyTheScreen = true;   ///< clipped to it
    bool turnsForSubBuffers = true;   ///< y counted from the bottom where the mode has 0x80
    bool drawsWhatTheModeAsks = true; ///< else what the frame changes, and no more
    int historyLength = 3;            ///< frames that it remembers, where it does

    friend bool operator==(const Caller&, const Caller&) = default;
};

/// Plays scenarios on one device: each frame is drawn and presented as the update mode has it, and
/// what the user then sees is compared with the page drawn in full. One a process, because GL
/// parameters are read once.
class Player
{
public:
    explicit Player(Device device, const Caller& caller = {});
    ~Player();
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    /// The first pixel that differs, or an empty text. The scenario's ages must be possible.
    std::string Play(const Scenario& scenario);

    /// Plays the scenario with other habits.
    std::string PlayAs(const Caller& caller, const Scenario& scenario);

    /// A test that fails as @p scenario does, to be pasted.
    std::string ToTest(const Scenario& scenario, const std::string& name) const;

    unsigned UpdateMode() const { return m_mode; } ///< of the scenario played last

private:
    class Run;

    Device m_device;
    Caller m_caller;
    SimDriver m_driver;
    ANativeWindow* m_window;
    Nib::EglContext m_context;
    unsigned m_mode = 0;
};

} // namespace Oracle

#endif
