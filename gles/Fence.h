#ifndef NIB_GLES_FENCE_H
#define NIB_GLES_FENCE_H

#include <nib/pipeline_state.h>

#include <GLES3/gl3.h>

namespace Nib::GLES
{

class Fence : public IFence
{
public:
    Fence() = default;
    Fence(const Fence&) = delete;
    Fence& operator=(const Fence&) = delete;

    void Release() override;
    void Insert() override;
    Result Wait() override;
    Result Wait(unsigned long long timeout) override;
    Result GetStatus() override;

private:
    GLsync m_sync = nullptr; ///< null until inserted
};

} // namespace Nib::GLES

#endif
