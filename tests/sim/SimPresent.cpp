#include "SimEgl.h"
#include "SimPicture.h"

#include <algorithm>

// Presentation: what becomes visible in a window, and what the next back buffer holds.

namespace Sim
{

namespace
{

/// Of frames that were presented, as many are kept as the oldest buffer may need.
std::size_t FramesKept(const State& state)
{
    std::size_t kept = 4;
    for (const int age : state.swapChain.ages)
        kept = std::max(kept, static_cast<std::size_t>(std::max(age, 0)));
    return kept;
}

NativeWindow* WindowOf(State& state, const Surface& surface)
{
    return surface.window ? state.windows.at(surface.window).get() : nullptr;
}

/// The age of the buffer that the next frame is drawn to: frames since it was presented.
int NextAge(const State& state, const Surface& surface)
{
    if (surface.swapBehavior == EGL_BUFFER_PRESERVED)
        return 1;
    const std::vector<int>& ages = state.swapChain.ages;
    if (!ages.empty())
    {
        const std::size_t frame = static_cast<std::size_t>(surface.frameCount);
        return ages[std::min(frame, ages.size() - 1)];
    }
    return surface.frameCount >= state.gpu.bufferCount ? state.gpu.bufferCount : 0;
}

/// The back buffer of the next frame holds the frame presented `age` swaps ago.
void TakeNextBuffer(State& state, Surface& surface)
{
    surface.age = NextAge(state, surface);
    const std::size_t index = static_cast<std::size_t>(surface.age) - 1;
    if (surface.age > 0 && index < surface.frames.size())
        surface.back = surface.frames[index];
    else if (state.gpu.poisonBackBuffers)
        surface.back.Fill(Undefined(state));
    surface.clearedTiles.clear();
    surface.ageQueried = false;
    surface.damageSet = false;
}

/// The user sees @p drawn, in the damage alone where there is one.
void Show(NativeWindow& window, const Image& drawn, const std::vector<Box>& damage)
{
    if (damage.empty())
        window.front = drawn;
    for (const Box& box : damage)
        window.front.CopyFrom(drawn, Intersection(box, drawn.Area()));
}

/// A window that changed its size gets buffers of the new one, which hold nothing yet.
void FollowWindowSize(State& state, Surface& surface, NativeWindow& window)
{
    if (surface.width == window.width && surface.height == window.height)
        return;
    surface.width = window.width;
    surface.height = window.height;
    surface.back.width = window.front.width = window.width;
    surface.back.height = window.front.height = window.height;
    surface.back.Fill(state.gpu.poisonBackBuffers ? Undefined(state) : Color{});
    window.front.Fill(Color{});
    surface.frames.clear();
    surface.frameCount = 0;
    surface.age = 0;
}

/// The area of a damaged swap as one box; without damage all of the image.
Box Bounds(const std::vector<Box>& damage, const Image& image)
{
    if (damage.empty())
        return image.Area();
    Box all = damage.front();
    for (const Box& box : damage)
    {
        const int right = std::max(all.x + all.width, box.x + box.width);
        const int top = std::max(all.y + all.height, box.y + box.height);
        all.x = std::min(all.x, box.x);
        all.y = std::min(all.y, box.y);
        all.width = right - all.x;
        all.height = top - all.y;
    }
    return all;
}

} // namespace

Color Undefined(const State& state)
{
    const SimPixel& pixel = state.swapChain.undefined;
    return {pixel.r / 255.0, pixel.g / 255.0, pixel.b / 255.0, pixel.a / 255.0};
}

Image& DrawImage(State& state, Surface& surface)
{
    NativeWindow* const window = WindowOf(state, surface);
    const bool single = window && surface.activeRenderBuffer == EGL_SINGLE_BUFFER;
    return single && surface.autoRefresh ? window->front : surface.back;
}

namespace
{

/// The first of the tiles along one axis that hold pixels from @p start, and the one behind the
/// last; tiles are counted from the other end of @p screen when @p fromEnd.
std::pair<int, int> TilesOf(int start, int length, int screen, int tileSize, bool fromEnd)
{
    const int first = fromEnd ? screen - start - length : start;
    return {first / tileSize, (first + length + tileSize - 1) / tileSize};
}

int TileStart(int tile, int screen, int tileSize, bool fromEnd)
{
    return fromEnd ? screen - (tile + 1) * tileSize : tile * tileSize;
}

} // namespace

void LoseTiles(State& state, Surface& surface, const Box& area)
{
    const SimSwapChain& chain = state.swapChain;
    if (chain.tileSize <= 0 || area.width <= 0 || area.height <= 0)
        return;
    const int size = chain.tileSize;
    const auto columns =
        TilesOf(area.x, area.width, surface.back.width, size, chain.tilesFromRight);
    const auto rows = TilesOf(area.y, area.height, surface.back.height, size, chain.tilesFromTop);
    for (int row = rows.first; row < rows.second; ++row)
    {
        for (int column = columns.first; column < columns.second; ++column)
        {
            if (!surface.clearedTiles.insert({column, row}).second)
                continue;
            const int x = TileStart(column, surface.back.width, size, chain.tilesFromRight);
            const int y = TileStart(row, surface.back.height, size, chain.tilesFromTop);
            surface.back.Fill({x, y, size, size}, Undefined(state), {true, true, true, true});
        }
    }
}

void ShowFrontBuffer(State& state, Surface& surface)
{
    NativeWindow* const window = WindowOf(state, surface);
    if (window && surface.activeRenderBuffer == EGL_SINGLE_BUFFER && surface.autoRefresh)
    {
        ++window->presented;
        NotePicture(state, "window", window->front, window->front.Area());
    }
}

void PresentFrame(State& state, Surface& surface, const std::vector<Box>& damage)
{
    NativeWindow* const window = WindowOf(state, surface);
    if (!window)
        return;
    Image& drawn = DrawImage(state, surface);
    if (&drawn != &window->front)
        Show(*window, drawn, state.swapChain.damageIsAHint ? std::vector<Box>() : damage);
    ++window->presented;
    NotePicture(state, "window", drawn, Bounds(damage, drawn));
    ++surface.frameCount;
    ++surface.nextFrameId;
    surface.activeRenderBuffer = surface.renderBuffer;
    if (surface.activeRenderBuffer == EGL_SINGLE_BUFFER)
    {
        surface.back = window->front;
        return;
    }
    surface.frames.insert(surface.frames.begin(), drawn);
    if (surface.frames.size() > FramesKept(state))
        surface.frames.pop_back();
    TakeNextBuffer(state, surface);
    FollowWindowSize(state, surface, *window);
}

void PresentRegion(State& state, Surface& surface, const Box& region)
{
    NativeWindow* const window = WindowOf(state, surface);
    if (!window)
        return;
    window->front.CopyFrom(surface.back, Intersection(region, surface.back.Area()));
    window->lastDamage = {region.x, region.y, region.width, region.height};
    ++window->presented;
    NotePicture(state, "window", surface.back, region);
    ++surface.nextFrameId;
    surface.clearedTiles.clear();
}

namespace
{

std::vector<Box> Boxes(const EGLint* rects, EGLint count)
{
    std::vector<Box> boxes;
    for (EGLint i = 0; i < count; ++i)
        boxes.push_back({rects[4 * i], rects[4 * i + 1], rects[4 * i + 2], rects[4 * i + 3]});
    return boxes;
}

/// The surface, when the calling thread may present it; null with the error set.
Surface* PresentableSurface(EglEntry& entry, EGLSurface handle)
{
    Surface* const surface = entry.CheckSurface(handle);
    if (!surface)
        return nullptr;
    if (entry.CallingThread().draw != surface)
    {
        entry.Misuse(EGL_BAD_SURFACE, "the surface is not current on this thread");
        return nullptr;
    }
    if (entry.CallingThread().context->group->lost)
    {
        entry.Refuse(EGL_CONTEXT_LOST);
        return nullptr;
    }
    if (surface->window && entry.state.windows.at(surface->window)->abandoned)
    {
        entry.Refuse(EGL_BAD_NATIVE_WINDOW);
        return nullptr;
    }
    return surface;
}

} // namespace

namespace Extension
{

EGLBoolean eglSwapBuffersWithDamageKHR(EGLDisplay display, EGLSurface handle, const EGLint* rects,
                                       EGLint count)
{
    EglEntry entry("eglSwapBuffersWithDamageKHR", {display, handle, (const void*)rects, count});
    entry.List(rects, 4LL * count);
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = PresentableSurface(entry, handle);
    if (!surface)
        return EGL_FALSE;
    if (count < 0 || (count > 0 && !rects))
        return entry.Misuse(EGL_BAD_PARAMETER, "no rectangles");
    if (surface->window)
        entry.state.windows.at(surface->window)->lastDamage.assign(rects, rects + 4 * count);
    FlushContext(*entry.CallingThread().context);
    PresentFrame(entry.state, *surface, Boxes(rects, count));
    return EGL_TRUE;
}

EGLBoolean eglSetDamageRegionKHR(EGLDisplay display, EGLSurface handle, EGLint* rects, EGLint count)
{
    EglEntry entry("eglSetDamageRegionKHR", {display, handle, (const void*)rects, count});
    entry.List(rects, 4LL * count);
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = PresentableSurface(entry, handle);
    if (!surface)
        return EGL_FALSE;
    if (!surface->window || surface->swapBehavior != EGL_BUFFER_DESTROYED)
        return entry.Refuse(EGL_BAD_MATCH);
    if (!surface->ageQueried || surface->damageSet)
        return entry.Refuse(EGL_BAD_ACCESS);
    surface->damageSet = true;
    return EGL_TRUE;
}

EGLBoolean eglPostSubBufferNV(EGLDisplay display, EGLSurface handle, EGLint x, EGLint y,
                              EGLint width, EGLint height)
{
    EglEntry entry("eglPostSubBufferNV", {display, handle, x, y, width, height});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = PresentableSurface(entry, handle);
    if (!surface)
        return EGL_FALSE;
    if (x < 0 || y < 0 || width < 0 || height < 0)
        return entry.Misuse(EGL_BAD_PARAMETER, "a negative rectangle");
    if (!surface->postSubBuffer)
        return entry.Refuse(EGL_BAD_MATCH);
    FlushContext(*entry.CallingThread().context);
    PresentRegion(entry.state, *surface, {x, y, width, height});
    return EGL_TRUE;
}

} // namespace Extension

} // namespace Sim

using namespace Sim;

SIM_API EGLBoolean eglSwapBuffers(EGLDisplay display, EGLSurface handle)
{
    EglEntry entry("eglSwapBuffers", {display, handle});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    Surface* const surface = PresentableSurface(entry, handle);
    if (!surface)
        return EGL_FALSE;
    FlushContext(*entry.CallingThread().context);
    if (surface->window)
        entry.state.windows.at(surface->window)->lastDamage.clear();
    PresentFrame(entry.state, *surface, {});
    return EGL_TRUE;
}

SIM_API EGLBoolean eglSwapInterval(EGLDisplay display, EGLint interval)
{
    EglEntry entry("eglSwapInterval", {display, interval});
    if (!entry || !entry.Check(display))
        return EGL_FALSE;
    return entry.CallingThread().draw ? EGL_TRUE : entry.Refuse(EGL_BAD_SURFACE);
}

SimPixel SimDriver::FrontPixel(ANativeWindow* window, int x, int y) const
{
    const std::lock_guard lock(GetState().mutex);
    return ToPixel(GetState().windows.at(window)->front.Read(x, y));
}

std::vector<SimPixel> SimDriver::FrontPixels(ANativeWindow* window) const
{
    const std::lock_guard lock(GetState().mutex);
    const std::vector<unsigned char> bytes = GetState().windows.at(window)->front.CopyOfBytes();
    std::vector<SimPixel> pixels;
    pixels.reserve(bytes.size() / 4);
    for (std::size_t i = 0; i + 4 <= bytes.size(); i += 4)
        pixels.push_back({bytes[i], bytes[i + 1], bytes[i + 2], bytes[i + 3]});
    return pixels;
}

void SimDriver::SetSwapChain(const SimSwapChain& chain)
{
    const std::lock_guard lock(GetState().mutex);
    GetState().swapChain = chain;
}

SimPixel SimDriver::BackPixel(ANativeWindow* window, int x, int y) const
{
    const std::lock_guard lock(GetState().mutex);
    State& state = GetState();
    Sim::Surface* const surface = state.FindSurface(state.windows.at(window)->surface);
    return surface ? ToPixel(DrawImage(state, *surface).Read(x, y)) : SimPixel{};
}
