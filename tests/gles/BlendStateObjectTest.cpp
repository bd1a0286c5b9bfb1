#include "gles/BlendStateObject.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

using namespace Nib;
using GLES::BlendStateObject;

namespace
{

/// All the calls of an activation with blending on and colours written.
std::vector<SimCall> Blending(GLenum colorFunction, GLenum alphaFunction, GLenum colorSrc,
                              GLenum colorDst, GLenum alphaSrc, GLenum alphaDst)
{
    return Sequence({Call("glBlendEquationSeparate", colorFunction, alphaFunction),
                     Call("glBlendFuncSeparate", colorSrc, colorDst, alphaSrc, alphaDst),
                     Call("glEnable", GL_BLEND),
                     Call("glColorMask", GL_TRUE, GL_TRUE, GL_TRUE, GL_TRUE)});
}

struct FunctionRow
{
    int value;
    GLenum gl;
};
constexpr FunctionRow kFunctions[] = {
    {0, GL_FUNC_ADD}, {1, GL_FUNC_SUBTRACT}, {2, GL_FUNC_REVERSE_SUBTRACT},
    {3, GL_MIN},      {4, GL_MAX},
};
constexpr FunctionRow kFactors[] = {
    {0, GL_ZERO},
    {1, GL_ONE},
    {2, GL_SRC_COLOR},
    {3, GL_ONE_MINUS_SRC_COLOR},
    {4, GL_DST_COLOR},
    {5, GL_ONE_MINUS_DST_COLOR},
    {6, GL_SRC_ALPHA},
    {7, GL_ONE_MINUS_SRC_ALPHA},
    {8, GL_DST_ALPHA},
    {9, GL_ONE_MINUS_DST_ALPHA},
    {10, GL_CONSTANT_COLOR},
    {11, GL_ONE_MINUS_CONSTANT_COLOR},
    {12, GL_CONSTANT_ALPHA},
    {13, GL_ONE_MINUS_CONSTANT_ALPHA},
};

} // namespace

TEST(BlendStateDescriptor, IsPremultipliedAlphaByDefault)
{
    const BlendStateDescriptor descriptor(true);

    EXPECT_TRUE(descriptor.enabled);
    EXPECT_TRUE(descriptor.colorWrite);
    EXPECT_EQ(static_cast<int>(descriptor.colorFunction), 0);
    EXPECT_EQ(static_cast<int>(descriptor.alphaFunction), 0);
    EXPECT_EQ(static_cast<int>(descriptor.colorSrcFactor), 1);
    EXPECT_EQ(static_cast<int>(descriptor.colorDstFactor), 7);
    EXPECT_EQ(static_cast<int>(descriptor.alphaSrcFactor), 1);
    EXPECT_EQ(static_cast<int>(descriptor.alphaDstFactor), 7);
}

TEST(BlendStateDescriptor, TheTwoArgumentConstructorDiffersInColorWriteOnly)
{
    const BlendStateDescriptor descriptor(false, false);

    EXPECT_FALSE(descriptor.enabled);
    EXPECT_FALSE(descriptor.colorWrite);
    EXPECT_EQ(static_cast<int>(descriptor.colorFunction), 0);
    EXPECT_EQ(static_cast<int>(descriptor.alphaFunction), 0);
    EXPECT_EQ(static_cast<int>(descriptor.colorSrcFactor), 1);
    EXPECT_EQ(static_cast<int>(descriptor.colorDstFactor), 7);
    EXPECT_EQ(static_cast<int>(descriptor.alphaSrcFactor), 1);
    EXPECT_EQ(static_cast<int>(descriptor.alphaDstFactor), 7);
}

TEST(BlendStateDescriptor, SetEnabledSetsBothSwitches)
{
    BlendStateDescriptor descriptor(false, false);

    descriptor.SetEnabled(true, false);
    EXPECT_TRUE(descriptor.enabled);
    EXPECT_FALSE(descriptor.colorWrite);

    descriptor.SetEnabled(false, true);
    EXPECT_FALSE(descriptor.enabled);
    EXPECT_TRUE(descriptor.colorWrite);
}

TEST(BlendStateDescriptor, SetColorBlendingModeLeavesAlphaAlone)
{
    BlendStateDescriptor descriptor(true);

    descriptor.SetColorBlendingMode(BlendingFunction::Subtract, BlendingFactor::SourceColor,
                                    BlendingFactor::DestinationColor);

    EXPECT_EQ(descriptor.colorFunction, BlendingFunction::Subtract);
    EXPECT_EQ(descriptor.colorSrcFactor, BlendingFactor::SourceColor);
    EXPECT_EQ(descriptor.colorDstFactor, BlendingFactor::DestinationColor);
    EXPECT_EQ(descriptor.alphaFunction, BlendingFunction::Add);
    EXPECT_EQ(descriptor.alphaSrcFactor, BlendingFactor::One);
    EXPECT_EQ(descriptor.alphaDstFactor, BlendingFactor::OneMinusSourceAlpha);
}

TEST(BlendStateDescriptor, SetAlphaBlendingModeLeavesColorAlone)
{
    BlendStateDescriptor descriptor(true);

    descriptor.SetAlphaBlendingMode(BlendingFunction::Max, BlendingFactor::Zero,
                                    BlendingFactor::DestinationAlpha);

    EXPECT_EQ(descriptor.alphaFunction, BlendingFunction::Max);
    EXPECT_EQ(descriptor.alphaSrcFactor, BlendingFactor::Zero);
    EXPECT_EQ(descriptor.alphaDstFactor, BlendingFactor::DestinationAlpha);
    EXPECT_EQ(descriptor.colorFunction, BlendingFunction::Add);
    EXPECT_EQ(descriptor.colorSrcFactor, BlendingFactor::One);
    EXPECT_EQ(descriptor.colorDstFactor, BlendingFactor::OneMinusSourceAlpha);
}

TEST(BlendStateObject, DefaultStateBlendsPremultipliedAlpha)
{
    GlContext gl;
    BlendStateObject state(BlendStateDescriptor(true));

    state.Activate();

    EXPECT_EQ(gl.Issued(), Blending(GL_FUNC_ADD, GL_FUNC_ADD, GL_ONE, GL_ONE_MINUS_SRC_ALPHA,
                                    GL_ONE, GL_ONE_MINUS_SRC_ALPHA));
}

TEST(BlendStateObject, EachOfTheSixModesReachesItsOwnPlace)
{
    GlContext gl;
    BlendStateDescriptor descriptor(true);
    descriptor.SetColorBlendingMode(BlendingFunction::Subtract, BlendingFactor::SourceColor,
                                    BlendingFactor::OneMinusSourceColor);
    descriptor.SetAlphaBlendingMode(BlendingFunction::ReverseSubtract, BlendingFactor::SourceAlpha,
                                    BlendingFactor::DestinationAlpha);
    BlendStateObject state(descriptor);

    state.Activate();

    EXPECT_EQ(gl.Issued(), Blending(GL_FUNC_SUBTRACT, GL_FUNC_REVERSE_SUBTRACT, GL_SRC_COLOR,
                                    GL_ONE_MINUS_SRC_COLOR, GL_SRC_ALPHA, GL_DST_ALPHA));
}

TEST(BlendStateObject, DisabledStateOnlySwitchesBlendingOff)
{
    GlContext gl;
    BlendStateObject state(BlendStateDescriptor(false));

    state.Activate();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glDisable", GL_BLEND),
                                     Call("glColorMask", GL_TRUE, GL_TRUE, GL_TRUE, GL_TRUE)}));
}

TEST(BlendStateObject, DisabledStateWithoutColorWriteMasksAllChannels)
{
    GlContext gl;
    BlendStateObject state(BlendStateDescriptor(false, false));

    state.Activate();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glDisable", GL_BLEND),
                                     Call("glColorMask", GL_FALSE, GL_FALSE, GL_FALSE, GL_FALSE)}));
}

TEST(BlendStateObject, BlendingWithoutColorWriteMasksAllChannels)
{
    GlContext gl;
    BlendStateObject state(BlendStateDescriptor(true, false));

    state.Activate();

    EXPECT_EQ(gl.driver.CallNames(),
              Names({"glBlendEquationSeparate", "glBlendFuncSeparate", "glEnable", "glColorMask"}));
    EXPECT_EQ(gl.driver.LastCall("glColorMask"),
              Call("glColorMask", GL_FALSE, GL_FALSE, GL_FALSE, GL_FALSE));
}

TEST(BlendStateObject, EveryActivationIssuesAllItsCalls)
{
    GlContext gl;
    BlendStateObject state(BlendStateDescriptor(true));
    state.Activate();
    const std::vector<SimCall> first = gl.Issued();
    gl.Forget();

    state.Activate();

    EXPECT_EQ(first.size(), 4u);
    EXPECT_EQ(gl.Issued(), first);
}

TEST(BlendStateObject, SetDescriptorSendsNothingUntilActivated)
{
    GlContext gl;
    BlendStateObject state(BlendStateDescriptor(true));

    state.SetDescriptor(BlendStateDescriptor(false));

    EXPECT_EQ(gl.driver.CallCount(), 0u);
    state.Activate();
    EXPECT_EQ(gl.driver.CallNames(), Names({"glDisable", "glColorMask"}));
}

TEST(BlendStateObject, KeepsACopyOfItsDescriptor)
{
    GlContext gl;
    BlendStateDescriptor descriptor(true);
    BlendStateObject state(descriptor);

    descriptor.SetEnabled(false, false);
    state.Activate();

    EXPECT_EQ(gl.driver.CallCount("glEnable"), 1u);
}

TEST(BlendStateObject, EveryFunctionHasItsGLValue)
{
    GlContext gl;
    for (const FunctionRow& row : kFunctions)
    {
        const auto function = static_cast<BlendingFunction>(row.value);
        EXPECT_EQ(BlendStateObject::GetGLBlendFunction(function), row.gl) << row.value;

        BlendStateDescriptor descriptor(true);
        descriptor.SetColorBlendingMode(function, BlendingFactor::One, BlendingFactor::One);
        BlendStateObject(descriptor).Activate();
        EXPECT_EQ(gl.driver.LastCall("glBlendEquationSeparate"),
                  Call("glBlendEquationSeparate", row.gl, GL_FUNC_ADD));

        descriptor = BlendStateDescriptor(true);
        descriptor.SetAlphaBlendingMode(function, BlendingFactor::One, BlendingFactor::One);
        BlendStateObject(descriptor).Activate();
        EXPECT_EQ(gl.driver.LastCall("glBlendEquationSeparate"),
                  Call("glBlendEquationSeparate", GL_FUNC_ADD, row.gl));
    }
}

TEST(BlendStateObject, EveryFactorHasItsGLValue)
{
    GlContext gl;
    for (const FunctionRow& row : kFactors)
    {
        const auto factor = static_cast<BlendingFactor>(row.value);
        EXPECT_EQ(BlendStateObject::GetGLBlendFactor(factor), row.gl) << row.value;

        BlendStateDescriptor descriptor(true);
        descriptor.SetColorBlendingMode(BlendingFunction::Add, factor, BlendingFactor::Zero);
        descriptor.SetAlphaBlendingMode(BlendingFunction::Add, BlendingFactor::Zero, factor);
        BlendStateObject(descriptor).Activate();
        EXPECT_EQ(gl.driver.LastCall("glBlendFuncSeparate"),
                  Call("glBlendFuncSeparate", row.gl, GL_ZERO, GL_ZERO, row.gl));

        descriptor.SetColorBlendingMode(BlendingFunction::Add, BlendingFactor::Zero, factor);
        descriptor.SetAlphaBlendingMode(BlendingFunction::Add, factor, BlendingFactor::Zero);
        BlendStateObject(descriptor).Activate();
        EXPECT_EQ(gl.driver.LastCall("glBlendFuncSeparate"),
                  Call("glBlendFuncSeparate", GL_ZERO, row.gl, row.gl, GL_ZERO));
    }
}
