#include "oracle/Explore.h"

#include <gtest/gtest.h>

#include <ostream>

// In every update mode, a caller that keeps to docs/partial-update.md shows what drawing in full
// would show, whichever buffers its frames get.

using namespace Oracle;

namespace
{

struct Row
{
    Device device;
    unsigned mode;
    Space space;
};

Space WithBuffers(int count)
{
    Space space;
    space.buffers = count;
    return space;
}

Space PreservedSpace()
{
    Space space;
    space.preserved = true;
    space.buffersGetLost = false;
    return space;
}

/// Where nothing tells the age, the centre has to: lost buffers hold zeros, old ones are no older
/// than four swaps.
Space AgelessSpace(int buffers)
{
    Space space;
    space.buffers = buffers;
    space.lostIsZero = true;
    space.maxAge = 4;
    return space;
}

constexpr int kAnyNumber = 0;

const Row kRows[] = {
    {Device::PostSubBuffer, 0x81, WithBuffers(kAnyNumber)},
    {Device::DamageRegion, 0x45, WithBuffers(1)},
    {Device::DamageRegion, 0x45, WithBuffers(2)},
    {Device::DamageRegion, 0x45, WithBuffers(3)},
    {Device::DamageRegion, 0x45, WithBuffers(4)},
    {Device::TileAligned, 0x07, WithBuffers(1)},
    {Device::TileAligned, 0x07, WithBuffers(2)},
    {Device::TileAligned, 0x07, WithBuffers(3)},
    {Device::TileAligned, 0x07, WithBuffers(4)},
    {Device::TiledRendering, 0x25, WithBuffers(1)},
    {Device::TiledRendering, 0x25, WithBuffers(2)},
    {Device::TiledRendering, 0x25, WithBuffers(3)},
    {Device::TiledRendering, 0x25, WithBuffers(4)},
    {Device::TiledRenderingNoAge, 0x25, AgelessSpace(kAnyNumber)},
    {Device::TiledRenderingAgeless, 0x25, AgelessSpace(kAnyNumber)},
    {Device::Preserved, 0x09, PreservedSpace()},
    {Device::FullScreen, 0x01, WithBuffers(kAnyNumber)},
};

void PrintTo(const Row& row, std::ostream* out)
{
    *out << NameOf(row.device);
}

class PartialUpdate : public testing::TestWithParam<Row>
{
};

std::string NameOfRow(const testing::TestParamInfo<Row>& info)
{
    const int buffers = info.param.space.buffers;
    return NameOf(info.param.device) + (buffers != 0 ? std::to_string(buffers) : std::string());
}

} // namespace

TEST_P(PartialUpdate, ShowsWhatDrawingInFullShows)
{
    Player player(GetParam().device);

    EXPECT_EQ(Explore(player, GetParam().space), "");

    EXPECT_EQ(player.UpdateMode(), GetParam().mode);
}

INSTANTIATE_TEST_SUITE_P(Modes, PartialUpdate, testing::ValuesIn(kRows), NameOfRow);

namespace
{

class WholeFrames : public testing::TestWithParam<Device>
{
};

std::string NameOfDevice(const testing::TestParamInfo<Device>& info)
{
    return NameOf(info.param);
}

} // namespace

// The way out where a mode cannot know what a buffer holds.
TEST_P(WholeFrames, AreRightOnEveryDeviceWithEveryBuffer)
{
    Caller caller;
    caller.namesEveryFrameWhole = true;
    Player player(GetParam(), caller);

    EXPECT_EQ(Explore(player, Space()), "");
}

INSTANTIATE_TEST_SUITE_P(Devices, WholeFrames,
                         testing::Values(Device::PostSubBuffer, Device::DamageRegion,
                                         Device::TileAligned, Device::TiledRendering,
                                         Device::TiledRenderingNoAge, Device::TiledRenderingAgeless,
                                         Device::Preserved, Device::PreservedOnce,
                                         Device::FullScreen),
                         NameOfDevice);
