#ifndef NIB_PARTIAL_UPDATE_H
#define NIB_PARTIAL_UPDATE_H

/// @file
/// Presenting only what changed of a frame.

#include <nib/base.h>
#include <nib/export.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>

#include <cstdint>
#include <memory>

namespace Nib
{

class EglSurface;

/// The dirty rectangles of the last frames. A back buffer that comes back after several swaps lacks
/// the changes of all of them. Window coordinates in pixels, y growing downward. One thread.
class NIB_EXPORT ClipRect
{
public:
    /// Keeps the last @p count rectangles, all empty until Init(). 0 keeps none.
    explicit ClipRect(int count);
    ClipRect(const ClipRect&) = delete;
    ClipRect& operator=(const ClipRect&) = delete;
    ~ClipRect();

    /// Sets the size of the surface, and every rectangle to all of it.
    void Init(int width, int height);

    /// Sets every rectangle to the full surface.
    void Reset();

    /// Records @p rect (null: the full surface) in place of the oldest rectangle.
    /// @return the area to draw: the union of the recorded rectangles, the oldest still among them,
    ///         and @p rect
    RectF AddUpdateRect(const RectF* rect);

private:
    std::unique_ptr<RectF[]> m_rectangles; // oldest first
    int m_width;
    int m_height;
    int m_count;
};

/// Decides, once, how this device can present only the changed part of a frame, and does so frame
/// by frame. A surface render thread owns one.
///
/// Threads  constructed anywhere; everything else on the render thread, with its context current.
/// Order    Init for each new or resized surface; then for each frame UseRect (best once: see
///          docs/partial-update.md), drawing, Reset, DoSwapBuffers.
/// Failure  a technique that the device lacks is not chosen; the last resort redraws everything.
///          Nothing throws.
class NIB_EXPORT UpdateRectangle
{
public:
    /// A rectangle as EGL takes it: pixels, the origin at the bottom left.
    struct DamageRect
    {
        EGLint x;      ///< of the left edge
        EGLint y;      ///< of the lower edge
        EGLint width;  ///< of the rectangle
        EGLint height; ///< of the rectangle
    };

    UpdateRectangle(); ///< Reads the rotation of the panel from "ro.sf.hwrotation".
    UpdateRectangle(const UpdateRectangle&) = delete;
    UpdateRectangle& operator=(const UpdateRectangle&) = delete;
    ~UpdateRectangle();

    void Init(EglSurface* surface); ///< As below, with the size that the surface itself tells.

    /// Presents @p surface (borrowed, until the next Init) from now on. The first call decides the
    /// update mode. The next frames redraw everything. A null @p surface, where none could be made,
    /// only takes the size.
    void Init(EglSurface* surface, int width, int height);

    // The steps of Init.
    /// Resolves the entry points that the display names.
    void InitEGLExtensions();
    /// Decides the update mode.
    void SetUpdateMode();
    /// Makes the record of dirty rectangles that the mode needs.
    void InitClipRect();
    /// Sets the size of the surface, in pixels.
    void SetScreenRect(int width, int height);
    bool SetPreserveBehavior(); ///< whether the surface now keeps its content across swaps

    /// Hands over what a frame is about to change: @p dirty in window coordinates, y downward.
    /// @param rotation of the content, in quarter turns
    void UseRect(RectF dirty, int rotation);

    /// Converts @p rect, in window coordinates, to a GL scissor box: the full screen when the back
    /// buffer's content is unknown, all zero when @p rect is empty, aligned to tiles where the GPU
    /// wants that. All four out parameters are written.
    /// @param rotationIndex in quarter turns: from which edges of the screen tiles are counted
    void GetScissorRect(const RectF& rect, int* x, int* y, int* width, int* height,
                        int rotationIndex);

    /// Stores a scissor box in @p damage.
    void DamageRectFromScissor(DamageRect& damage, int x, int y, int width, int height);

    /// Sets what DoSwapBuffers presents where the update mode goes by a damage rectangle.
    void SetDamageRect(const DamageRect& damage);

    bool DoSwapBuffers(); ///< Presents the frame by the update mode. Whether EGL did.

    void Reset(); ///< Ends tiling and drops depth and stencil: what a frame does before its swap.

    bool IsFramebufferDirty(); ///< whether the back buffer's content is unknown: draw everything

    /// Whether frames are presented with a damage rectangle that nothing here fills: what owns this
    /// object then calls SetDamageRect before each DoSwapBuffers.
    bool NeedsDamageRect() const;

    /// The update mode, 0 before the first Init: 0x81 post sub-buffer, 0x45 damage region, 0x07
    /// tile alignment, 0x25 tiled rendering, 0x09 preserved back buffer, 0x01 full screen.
    unsigned GetUpdateMode() const;

    int GetTileSize() const;          ///< the alignment of scissor boxes in pixels, 0 for none
    DamageRect GetDamageRect() const; ///< as last filled
    int GetScreenWidth() const;       ///< of the surface, in pixels
    int GetScreenHeight() const;      ///< of the surface, in pixels

private:
    friend struct UpdateRectangleModes; // a test's way to modes that no device has

    void RestrictToDirtyArea(const RectF& dirty, int rotation);
    void LogDamageRegionError() const;

    EglSurface* m_surface; // not owned
    int m_hwRotation;      // quarter turns
    int m_screenWidth;
    int m_screenHeight;
    DamageRect m_damageRect;
    std::unique_ptr<ClipRect> m_clipRect;
    std::uint32_t m_mode;
    int m_tileSize;
    bool m_noBufferAge;
    PFNEGLSETDAMAGEREGIONKHRPROC m_setDamageRegion;
    PFNEGLSWAPBUFFERSWITHDAMAGEKHRPROC m_swapBuffersWithDamage;
    PFNEGLPOSTSUBBUFFERNVPROC m_postSubBuffer;
};

/// Reads the system property @p name. From any thread.
/// @param value receives the text and its end; room for 92 characters, the platform's maximum
/// @return the length of the text; 0, with an empty text, when there is no such property
NIB_EXPORT int android_property_get(const char* name, char* value);

} // namespace Nib

#endif
