#include <nib/nib.h>

#include <gtest/gtest.h>

#include <cstddef>
#include <type_traits>

// Plain values that the caller fills: order and types of their fields, and the numbers of the
// enumerations.

using namespace Nib;

namespace
{

/// Whether @p b lies right behind @p a; to be used on fields without padding between them.
template <typename A, typename B>
bool Follows(const A& a, const B& b)
{
    return reinterpret_cast<const char*>(&b) == reinterpret_cast<const char*>(&a) + sizeof(a);
}

template <typename Enum>
constexpr int Number(Enum value)
{
    return static_cast<int>(value);
}

} // namespace

TEST(Layout, OfHwuiCallback)
{
    EXPECT_EQ(offsetof(HwuiCallback, reserved), 0u);
    EXPECT_EQ(offsetof(HwuiCallback, invoke), 8u);
    EXPECT_EQ(offsetof(HwuiCallback, context), 16u);
    EXPECT_EQ(sizeof(HwuiCallback), 24u);
    static_assert(std::is_same_v<decltype(HwuiCallback::invoke), bool (*)(void*, void*, int)>);
}

TEST(Layout, OfTheReadBuffer)
{
    using Buffer = IRenderTarget::BufferDescriptor;
    EXPECT_EQ(offsetof(Buffer, pixels), 0u);
    EXPECT_EQ(offsetof(Buffer, rowLength), 8u);
    EXPECT_EQ(offsetof(Buffer, skipRows), 12u);
    EXPECT_EQ(offsetof(Buffer, skipPixels), 16u);
}

TEST(Layout, OfTheScissorRectangle)
{
    const IRasterizerState::ScissorRect rect{1, 2, 3, 4};
    EXPECT_EQ(offsetof(IRasterizerState::ScissorRect, x), 0u);
    EXPECT_EQ(offsetof(IRasterizerState::ScissorRect, y), 4u);
    EXPECT_EQ(offsetof(IRasterizerState::ScissorRect, width), 8u);
    EXPECT_EQ(offsetof(IRasterizerState::ScissorRect, height), 12u);
    EXPECT_EQ(sizeof(rect), 16u);
}

TEST(Layout, OfTheTextureDescriptor)
{
    const TextureDescriptor d;
    EXPECT_TRUE(Follows(d.width, d.height));
    EXPECT_TRUE(Follows(d.height, d.depth));
    EXPECT_TRUE(Follows(d.depth, d.layout));
    EXPECT_TRUE(Follows(d.layout, d.memoryLayout));
    EXPECT_TRUE(Follows(d.memoryLayout, d.target));
    EXPECT_TRUE(Follows(d.target, d.syncOnCreate));
    EXPECT_EQ(reinterpret_cast<const char*>(&d.source) - reinterpret_cast<const char*>(&d), 32);
}

TEST(Layout, OfTheTextureBufferInfo)
{
    EXPECT_EQ(offsetof(TextureBufferInfo, skipPixels), 0u);
    EXPECT_EQ(offsetof(TextureBufferInfo, skipRows), 4u);
    EXPECT_EQ(offsetof(TextureBufferInfo, rowLength), 8u);
}

TEST(Layout, OfTheVertexDescriptor)
{
    const VertexDescriptor d;
    EXPECT_TRUE(Follows(d.count, d.components));
    EXPECT_TRUE(Follows(d.components, d.offsets));
    EXPECT_TRUE(Follows(d.offsets, d.types));
    EXPECT_TRUE(Follows(d.stride, d.usage));
    EXPECT_TRUE(Follows(d.usage, d.divisors));
    EXPECT_LT(static_cast<const void*>(&d.types), static_cast<const void*>(&d.stride));
}

TEST(Layout, OfTheBlendState)
{
    const BlendStateDescriptor d(true);
    EXPECT_TRUE(Follows(d.enabled, d.colorWrite));
    EXPECT_TRUE(Follows(d.colorFunction, d.alphaFunction));
    EXPECT_TRUE(Follows(d.alphaFunction, d.colorSrcFactor));
    EXPECT_TRUE(Follows(d.colorSrcFactor, d.colorDstFactor));
    EXPECT_TRUE(Follows(d.colorDstFactor, d.alphaSrcFactor));
    EXPECT_TRUE(Follows(d.alphaSrcFactor, d.alphaDstFactor));
    EXPECT_EQ(sizeof(d), 28u);
}

TEST(Layout, OfTheDepthStencilState)
{
    const DepthStencilStateDescriptor d(true, true);
    EXPECT_TRUE(Follows(d.depthEnabled, d.stencilEnabled));
    EXPECT_TRUE(Follows(d.depthFunction, d.stencilFunction));
    EXPECT_TRUE(Follows(d.stencilFunction, d.frontStencilFail));
    EXPECT_TRUE(Follows(d.frontStencilFail, d.frontDepthFail));
    EXPECT_TRUE(Follows(d.frontDepthFail, d.frontPass));
    EXPECT_TRUE(Follows(d.frontPass, d.backStencilFail));
    EXPECT_TRUE(Follows(d.backStencilFail, d.backDepthFail));
    EXPECT_TRUE(Follows(d.backDepthFail, d.backPass));
    EXPECT_TRUE(Follows(d.backPass, d.stencilRef));
    EXPECT_TRUE(Follows(d.stencilRef, d.stencilReadMask));
    EXPECT_TRUE(Follows(d.stencilReadMask, d.stencilWriteMask));
    EXPECT_TRUE(Follows(d.stencilWriteMask, d.depthWrite));
    EXPECT_EQ(sizeof(d), 40u);
}

TEST(Layout, OfRectangles)
{
    EXPECT_EQ(offsetof(RectF, left), 0u);
    EXPECT_EQ(offsetof(RectF, top), 4u);
    EXPECT_EQ(offsetof(RectF, right), 8u);
    EXPECT_EQ(offsetof(RectF, bottom), 12u);
    EXPECT_EQ(offsetof(Rect, left), 0u);
    EXPECT_EQ(offsetof(Rect, top), 4u);
    EXPECT_EQ(offsetof(Rect, right), 8u);
    EXPECT_EQ(offsetof(Rect, bottom), 12u);
}

TEST(Layout, OfMatrices)
{
    EXPECT_EQ(sizeof(Matrix3<float>), 36u);
    EXPECT_EQ(sizeof(Matrix4<float>), 64u);
}

TEST(Numbers, OfEnumerationsThatCallersPass)
{
    EXPECT_EQ(Number(RenderThreadGL::High), 0);
    EXPECT_EQ(Number(RenderThreadGL::Medium), 1);
    EXPECT_EQ(Number(RenderThreadGL::Low), 2);
    EXPECT_EQ(Number(BufferUsage::Stream), 0);
    EXPECT_EQ(Number(BufferUsage::Static), 1);
    EXPECT_EQ(Number(BufferUsage::Dynamic), 2);
    EXPECT_EQ(Number(PrimitiveType::Points), 0);
    EXPECT_EQ(Number(PrimitiveType::Triangles), 4);
    EXPECT_EQ(Number(PrimitiveType::TriangleFan), 6);
    EXPECT_EQ(Number(BindingType::Undefined), 0);
    EXPECT_EQ(Number(BindingType::UniformBlock), 9);
    EXPECT_EQ(Number(EglContext::Priority::High), 0x3101);
    EXPECT_EQ(Number(EglContext::Priority::Low), 0x3103);
}

TEST(Numbers, EnumerationsAreAsWideAsInt)
{
    EXPECT_EQ(sizeof(RenderThreadGL::RenderPriority), sizeof(int));
    EXPECT_EQ(sizeof(BufferUsage), sizeof(int));
    EXPECT_EQ(sizeof(PrimitiveType), sizeof(int));
    EXPECT_EQ(sizeof(VertexDescriptor::AttributeType), sizeof(int));
    EXPECT_EQ(sizeof(TextureTargetLayout), sizeof(int));
    EXPECT_EQ(sizeof(TextureMemoryLayout), sizeof(int));
    EXPECT_EQ(sizeof(BlendingFunction), sizeof(int));
    EXPECT_EQ(sizeof(BlendingFactor), sizeof(int));
    EXPECT_EQ(sizeof(DepthStencilFunction), sizeof(int));
    EXPECT_EQ(sizeof(StencilOperation), sizeof(int));
    EXPECT_EQ(sizeof(BindingType), sizeof(int));
    EXPECT_EQ(sizeof(IFence::Result), sizeof(int));
    EXPECT_EQ(sizeof(IContextHolder::GPUVendor), sizeof(int));
}
