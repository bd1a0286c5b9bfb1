#ifndef NIB_GLES_CONTEXT_HOLDER_H
#define NIB_GLES_CONTEXT_HOLDER_H

#include <nib/pipeline_state.h>

#include <atomic>

namespace Nib::GLES
{

class ContextHolder : public IContextHolder
{
public:
    void* GetCurrentContextId() override;
    GPUVendor GetGPUVendor() override;
    void WaitForGpuCompletion() override;

private:
    // No lock: threads that ask at the same time store the same answer, and nothing hangs on it.
    std::atomic<GPUVendor> m_vendor{Unknown};
};

} // namespace Nib::GLES

#endif
