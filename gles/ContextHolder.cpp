#include "gles/ContextHolder.h"

#include "base/Log.h"

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <iterator>
#include <string_view>

namespace Nib::GLES
{

namespace
{

// Names for the log, indexed by IContextHolder::GPUVendor.
constexpr const char* kVendorNames[] = {
    "None",     // 0
    "ARM",      // 1
    "Qualcomm", // 2
    "Other",    // 3
};
static_assert(std::size(kVendorNames) == 4, "one row per GPUVendor");

IContextHolder::GPUVendor VendorOf(std::string_view text)
{
    if (text.find("ARM") != std::string_view::npos)
        return IContextHolder::Arm;
    if (text.find("Qualcomm") != std::string_view::npos)
        return IContextHolder::Qualcomm;
    return IContextHolder::Other;
}

} // namespace

void* ContextHolder::GetCurrentContextId()
{
    return eglGetCurrentContext();
}

IContextHolder::GPUVendor ContextHolder::GetGPUVendor()
{
    GPUVendor vendor = m_vendor.load(std::memory_order_relaxed);
    if (vendor != Unknown)
        return vendor;
    const auto* text = reinterpret_cast<const char*>(glGetString(GL_VENDOR));
    if (!text)
        return Unknown;
    vendor = VendorOf(text);
    NIB_LOG_INFO("GPU vendor = %s", kVendorNames[vendor]);
    m_vendor.store(vendor, std::memory_order_relaxed);
    return vendor;
}

void ContextHolder::WaitForGpuCompletion()
{
    glFinish();
}

} // namespace Nib::GLES
