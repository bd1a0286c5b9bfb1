#include <nib/pipeline_state.h>

namespace Nib
{

BlendStateDescriptor::BlendStateDescriptor(bool blending) : BlendStateDescriptor(blending, true) {}

BlendStateDescriptor::BlendStateDescriptor(bool blending, bool writeColor)
    : enabled(blending), colorWrite(writeColor), colorFunction(BlendingFunction::Add),
      alphaFunction(BlendingFunction::Add), colorSrcFactor(BlendingFactor::One),
      colorDstFactor(BlendingFactor::OneMinusSourceAlpha), alphaSrcFactor(BlendingFactor::One),
      alphaDstFactor(BlendingFactor::OneMinusSourceAlpha)
{
}

void BlendStateDescriptor::SetEnabled(bool blending, bool writeColor)
{
    enabled = blending;
    colorWrite = writeColor;
}

void BlendStateDescriptor::SetColorBlendingMode(BlendingFunction function, BlendingFactor src,
                                                BlendingFactor dst)
{
    colorFunction = function;
    colorSrcFactor = src;
    colorDstFactor = dst;
}

void BlendStateDescriptor::SetAlphaBlendingMode(BlendingFunction function, BlendingFactor src,
                                                BlendingFactor dst)
{
    alphaFunction = function;
    alphaSrcFactor = src;
    alphaDstFactor = dst;
}

DepthStencilStateDescriptor::DepthStencilStateDescriptor(bool testDepth, bool testStencil)
    : depthEnabled(testDepth), stencilEnabled(testStencil),
      depthFunction(DepthStencilFunction::Less), stencilFunction(DepthStencilFunction::Always),
      frontStencilFail(StencilOperation::Keep), frontDepthFail(StencilOperation::Keep),
      frontPass(StencilOperation::Keep), backStencilFail(StencilOperation::Keep),
      backDepthFail(StencilOperation::Keep), backPass(StencilOperation::Keep), stencilRef(0),
      stencilReadMask(0xFF), stencilWriteMask(0xFF), depthWrite(true)
{
}

void DepthStencilStateDescriptor::SetDepthFunction(DepthStencilFunction function, bool writeDepth)
{
    depthFunction = function;
    depthWrite = writeDepth;
}

void DepthStencilStateDescriptor::SetStencilFunction(DepthStencilFunction function,
                                                     unsigned char ref, unsigned char readMask,
                                                     unsigned char writeMask)
{
    stencilFunction = function;
    stencilRef = ref;
    stencilReadMask = readMask;
    stencilWriteMask = writeMask;
}

void DepthStencilStateDescriptor::SetStencilOperation(StencilOperation sfail,
                                                      StencilOperation dpfail,
                                                      StencilOperation dppass)
{
    SetStencilOperationFront(sfail, dpfail, dppass);
    SetStencilOperationBack(sfail, dpfail, dppass);
}

void DepthStencilStateDescriptor::SetStencilOperationFront(StencilOperation sfail,
                                                           StencilOperation dpfail,
                                                           StencilOperation dppass)
{
    frontStencilFail = sfail;
    frontDepthFail = dpfail;
    frontPass = dppass;
}

void DepthStencilStateDescriptor::SetStencilOperationBack(StencilOperation sfail,
                                                          StencilOperation dpfail,
                                                          StencilOperation dppass)
{
    backStencilFail = sfail;
    backDepthFail = dpfail;
    backPass = dppass;
}

} // namespace Nib
