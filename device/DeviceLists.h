#ifndef NIB_DEVICE_DEVICE_LISTS_H
#define NIB_DEVICE_DEVICE_LISTS_H

#include <nib/device.h>

#include <array>

namespace Nib
{

/// The names of what OpenGLRenderer::getGPUVendor answers.
inline constexpr std::array<const char*, 4> kGpuVendorNames = {
    "None",     // 0
    "ARM",      // 1
    "Qualcomm", // 2
    "Other",    // 3
};

// The GPUs that are treated apart, by what GL_RENDERER begins with. A null pointer ends each list.

/// Fails at GL_MIN and GL_MAX as blend equations.
inline constexpr std::array<const char*, 2> kNoMinMaxBlendingGpus = {"Mali-400", nullptr};

/// Have what front-buffer rendering needs and fail at it all the same.
inline constexpr std::array<const char*, 3> kNoFrontBufferGpus = {"Adreno (TM) 530", "Mali-T830",
                                                                  nullptr};

/// What front-buffer rendering needs of EGL, in the order of testing. A substring is enough, so that
/// "EGL_" may be left out.
inline constexpr std::array<const char*, 4> kFrontBufferExtensions = {
    "EGL_KHR_mutable_render_buffer",
    "KHR_fence_sync",
    "ANDROID_get_frame_timestamps",
    "ANDROID_presentation_time",
};

/// Give no buffer age that can be trusted.
inline constexpr std::array<const char*, 5> kNoBufferAgeGpus = {
    "Adreno (TM) 330", "Adreno (TM) 306", "Adreno (TM) 305", "Adreno (TM) 308", nullptr};

inline constexpr int kMaliT760DamageLevel = 26; // the API level from which it takes damage regions

/// Take a damage region (EGL_KHR_partial_update).
constexpr std::array<const char*, 8> PartialUpdateGpus(int sdkVersion)
{
    return {"Mali-T720",
            "Mali-T820",
            "Mali-T830",
            "Mali-T880",
            "Mali-G71",
            "Mali-G72",
            sdkVersion >= kMaliT760DamageLevel ? "Mali-T760" : nullptr,
            nullptr};
}

/// Want dirty rectangles that are aligned to their tiles.
constexpr std::array<const char*, 3> TileAlignedGpus(int sdkVersion)
{
    return {"Mali-T860", sdkVersion < kMaliT760DamageLevel ? "Mali-T760" : nullptr, nullptr};
}

/// Whether the GPU is in a list. A thread with a current context.
template <std::size_t Size>
bool IsGpuIn(std::array<const char*, Size> list)
{
    return OpenGLRenderer::isGpuOneOf(list.data());
}

} // namespace Nib

#endif
