#ifndef NIB_GLES_RASTERIZER_STATE_H
#define NIB_GLES_RASTERIZER_STATE_H

#include <nib/pipeline_state.h>

namespace Nib::GLES
{

class RasterizerState : public IRasterizerState
{
public:
    void SetScissorEnabled(bool enabled) override;
    void SetScissorRect(const ScissorRect& rect) override;
    bool IsScissorEnabled() const override;
    ScissorRect GetScissorRect() const override;
};

} // namespace Nib::GLES

#endif
