#include "gles/DepthStencilState.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

using namespace Nib;
using GLES::DepthStencilState;

namespace
{

struct Row
{
    int value;
    GLenum gl;
};
constexpr Row kFunctions[] = {
    {0, GL_NEVER},   {1, GL_LESS},     {2, GL_EQUAL},  {3, GL_LEQUAL},
    {4, GL_GREATER}, {5, GL_NOTEQUAL}, {6, GL_GEQUAL}, {7, GL_ALWAYS},
};
constexpr Row kOperations[] = {
    {0, GL_KEEP}, {1, GL_ZERO},   {2, GL_REPLACE},   {3, GL_INCR},
    {4, GL_DECR}, {5, GL_INVERT}, {6, GL_INCR_WRAP}, {7, GL_DECR_WRAP},
};

using Operations = std::vector<int>;

Operations Front(const DepthStencilStateDescriptor& d)
{
    return {static_cast<int>(d.frontStencilFail), static_cast<int>(d.frontDepthFail),
            static_cast<int>(d.frontPass)};
}

Operations Back(const DepthStencilStateDescriptor& d)
{
    return {static_cast<int>(d.backStencilFail), static_cast<int>(d.backDepthFail),
            static_cast<int>(d.backPass)};
}

} // namespace

TEST(DepthStencilStateDescriptor, HasTheDefaultsOfItsConstructor)
{
    const DepthStencilStateDescriptor descriptor(true, false);

    EXPECT_TRUE(descriptor.depthEnabled);
    EXPECT_FALSE(descriptor.stencilEnabled);
    EXPECT_EQ(static_cast<int>(descriptor.depthFunction), 1);
    EXPECT_EQ(static_cast<int>(descriptor.stencilFunction), 7);
    EXPECT_EQ(Front(descriptor), (Operations{0, 0, 0}));
    EXPECT_EQ(Back(descriptor), (Operations{0, 0, 0}));
    EXPECT_EQ(descriptor.stencilRef, 0);
    EXPECT_EQ(descriptor.stencilReadMask, 0xFF);
    EXPECT_EQ(descriptor.stencilWriteMask, 0xFF);
    EXPECT_TRUE(descriptor.depthWrite);
}

TEST(DepthStencilStateDescriptor, TheSecondArgumentEnablesStencil)
{
    const DepthStencilStateDescriptor descriptor(false, true);

    EXPECT_FALSE(descriptor.depthEnabled);
    EXPECT_TRUE(descriptor.stencilEnabled);
}

TEST(DepthStencilStateDescriptor, SetDepthFunctionSetsFunctionAndWrites)
{
    DepthStencilStateDescriptor descriptor(true, true);

    descriptor.SetDepthFunction(DepthStencilFunction::GreaterOrEqual, false);

    EXPECT_EQ(descriptor.depthFunction, DepthStencilFunction::GreaterOrEqual);
    EXPECT_FALSE(descriptor.depthWrite);
    EXPECT_EQ(descriptor.stencilFunction, DepthStencilFunction::Always);
}

TEST(DepthStencilStateDescriptor, SetStencilFunctionSetsFunctionReferenceAndMasks)
{
    DepthStencilStateDescriptor descriptor(true, true);

    descriptor.SetStencilFunction(DepthStencilFunction::NotEqual, 0x12, 0x34, 0x56);

    EXPECT_EQ(descriptor.stencilFunction, DepthStencilFunction::NotEqual);
    EXPECT_EQ(descriptor.stencilRef, 0x12);
    EXPECT_EQ(descriptor.stencilReadMask, 0x34);
    EXPECT_EQ(descriptor.stencilWriteMask, 0x56);
    EXPECT_EQ(descriptor.depthFunction, DepthStencilFunction::Less);
}

TEST(DepthStencilStateDescriptor, SetStencilOperationChangesBothFaces)
{
    DepthStencilStateDescriptor descriptor(true, true);

    descriptor.SetStencilOperation(StencilOperation::Zero, StencilOperation::Invert,
                                   StencilOperation::Replace);

    EXPECT_EQ(Front(descriptor), (Operations{1, 5, 2}));
    EXPECT_EQ(Back(descriptor), (Operations{1, 5, 2}));
}

TEST(DepthStencilStateDescriptor, SetStencilOperationFrontChangesTheFrontOnly)
{
    DepthStencilStateDescriptor descriptor(true, true);

    descriptor.SetStencilOperationFront(StencilOperation::Increment, StencilOperation::Decrement,
                                        StencilOperation::IncrementWrap);

    EXPECT_EQ(Front(descriptor), (Operations{3, 4, 6}));
    EXPECT_EQ(Back(descriptor), (Operations{0, 0, 0}));
}

TEST(DepthStencilStateDescriptor, SetStencilOperationBackChangesTheBackOnly)
{
    DepthStencilStateDescriptor descriptor(true, true);

    descriptor.SetStencilOperationBack(StencilOperation::DecrementWrap, StencilOperation::Zero,
                                       StencilOperation::Invert);

    EXPECT_EQ(Front(descriptor), (Operations{0, 0, 0}));
    EXPECT_EQ(Back(descriptor), (Operations{7, 1, 5}));
}

TEST(DepthStencilState, SendsDepthAndStencilInOrder)
{
    GlContext gl;
    DepthStencilStateDescriptor descriptor(true, true);
    descriptor.SetDepthFunction(DepthStencilFunction::LessOrEqual, true);
    descriptor.SetStencilFunction(DepthStencilFunction::Equal, 0x12, 0x34, 0x56);
    descriptor.SetStencilOperationFront(StencilOperation::Keep, StencilOperation::Zero,
                                        StencilOperation::Replace);
    descriptor.SetStencilOperationBack(StencilOperation::Increment, StencilOperation::Decrement,
                                       StencilOperation::Invert);
    DepthStencilState state(descriptor);

    state.Activate();

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glEnable", GL_DEPTH_TEST), Call("glDepthMask", GL_TRUE),
                        Call("glDepthFunc", GL_LEQUAL), Call("glEnable", GL_STENCIL_TEST),
                        Call("glStencilMask", 0x56), Call("glStencilFunc", GL_EQUAL, 0x12, 0x34),
                        Call("glStencilOpSeparate", GL_FRONT, GL_KEEP, GL_ZERO, GL_REPLACE),
                        Call("glStencilOpSeparate", GL_BACK, GL_INCR, GL_DECR, GL_INVERT)}));
}

TEST(DepthStencilState, DefaultStateTestsForLessAndKeepsStencil)
{
    GlContext gl;
    DepthStencilState state(DepthStencilStateDescriptor(true, true));

    state.Activate();

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glEnable", GL_DEPTH_TEST), Call("glDepthMask", GL_TRUE),
                        Call("glDepthFunc", GL_LESS), Call("glEnable", GL_STENCIL_TEST),
                        Call("glStencilMask", 0xFF), Call("glStencilFunc", GL_ALWAYS, 0, 0xFF),
                        Call("glStencilOpSeparate", GL_FRONT, GL_KEEP, GL_KEEP, GL_KEEP),
                        Call("glStencilOpSeparate", GL_BACK, GL_KEEP, GL_KEEP, GL_KEEP)}));
}

TEST(DepthStencilState, WithoutDepthTheDepthMaskStaysAsItIs)
{
    GlContext gl;
    DepthStencilStateDescriptor descriptor(false, true);
    descriptor.SetDepthFunction(DepthStencilFunction::Never, false);
    DepthStencilState state(descriptor);

    state.Activate();

    EXPECT_EQ(gl.driver.CallNames(),
              Names({"glDisable", "glEnable", "glStencilMask", "glStencilFunc",
                     "glStencilOpSeparate", "glStencilOpSeparate"}));
    EXPECT_EQ(gl.driver.LastCall("glDisable"), Call("glDisable", GL_DEPTH_TEST));
    EXPECT_EQ(gl.driver.LastCall("glEnable"), Call("glEnable", GL_STENCIL_TEST));
}

TEST(DepthStencilState, WithoutStencilOnlyItsTestIsSwitchedOff)
{
    GlContext gl;
    DepthStencilState state(DepthStencilStateDescriptor(true, false));

    state.Activate();

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glEnable", GL_DEPTH_TEST), Call("glDepthMask", GL_TRUE),
                        Call("glDepthFunc", GL_LESS), Call("glDisable", GL_STENCIL_TEST)}));
}

TEST(DepthStencilState, WithNeitherBothTestsAreSwitchedOff)
{
    GlContext gl;
    DepthStencilState state(DepthStencilStateDescriptor(false, false));

    state.Activate();

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glDisable", GL_DEPTH_TEST), Call("glDisable", GL_STENCIL_TEST)}));
}

TEST(DepthStencilState, DepthWritesMayBeOff)
{
    GlContext gl;
    DepthStencilStateDescriptor descriptor(true, false);
    descriptor.SetDepthFunction(DepthStencilFunction::Always, false);

    DepthStencilState(descriptor).Activate();

    EXPECT_EQ(gl.driver.LastCall("glDepthMask"), Call("glDepthMask", GL_FALSE));
}

TEST(DepthStencilState, EveryActivationIssuesAllItsCalls)
{
    GlContext gl;
    DepthStencilState state(DepthStencilStateDescriptor(true, true));
    state.Activate();
    const std::vector<SimCall> first = gl.Issued();
    gl.Forget();

    state.Activate();

    EXPECT_EQ(first.size(), 8u);
    EXPECT_EQ(gl.Issued(), first);
}

TEST(DepthStencilState, SetDescriptorSendsNothingUntilActivated)
{
    GlContext gl;
    DepthStencilState state(DepthStencilStateDescriptor(true, true));

    state.SetDescriptor(DepthStencilStateDescriptor(false, false));

    EXPECT_EQ(gl.driver.CallCount(), 0u);
    state.Activate();
    EXPECT_EQ(gl.driver.CallNames(), Names({"glDisable", "glDisable"}));
}

TEST(DepthStencilState, EveryFunctionHasItsGLValue)
{
    GlContext gl;
    for (const Row& row : kFunctions)
    {
        const auto function = static_cast<DepthStencilFunction>(row.value);
        EXPECT_EQ(DepthStencilState::GetGLDepthStencilFunc(function), row.gl) << row.value;

        DepthStencilStateDescriptor descriptor(true, true);
        descriptor.SetDepthFunction(function, true);
        descriptor.SetStencilFunction(function, 1, 2, 3);
        DepthStencilState(descriptor).Activate();
        EXPECT_EQ(gl.driver.LastCall("glDepthFunc"), Call("glDepthFunc", row.gl));
        EXPECT_EQ(gl.driver.LastCall("glStencilFunc"), Call("glStencilFunc", row.gl, 1, 2));
    }
}

TEST(DepthStencilState, EveryOperationHasItsGLValue)
{
    GlContext gl;
    for (const Row& row : kOperations)
    {
        const auto operation = static_cast<StencilOperation>(row.value);
        EXPECT_EQ(DepthStencilState::GetGLStencilOp(operation), row.gl) << row.value;

        // In each of the six places, with another operation beside it.
        const StencilOperation keep = StencilOperation::Keep;
        DepthStencilStateDescriptor descriptor(false, true);
        descriptor.SetStencilOperationFront(operation, keep, operation);
        descriptor.SetStencilOperationBack(keep, operation, keep);
        gl.Forget();
        DepthStencilState(descriptor).Activate();
        EXPECT_EQ(gl.driver.Calls("glStencilOpSeparate"),
                  Sequence({Call("glStencilOpSeparate", GL_FRONT, row.gl, GL_KEEP, row.gl),
                            Call("glStencilOpSeparate", GL_BACK, GL_KEEP, row.gl, GL_KEEP)}));
    }
}
