#include "gles/GlesFixture.h"
#include "gles/VertexFormats.h"

#include <nib/exceptions.h>
#include <nib/geometry.h>

using Nib::BufferUsage;
using Nib::PrimitiveType;
using Nib::VertexDescriptor;
using Type = Nib::VertexDescriptor::AttributeType;

namespace
{

VertexDescriptor WithAttributes(int number)
{
    VertexDescriptor descriptor;
    for (int i = 0; i < number; ++i)
        descriptor.addAttribute(Type::Float, 1, -1, 0);
    return descriptor;
}

/// The text of the exception that @p action throws, which also stands in the log.
template <typename Action>
std::string ThrownBy(const SimDriver& driver, Action&& action)
{
    try
    {
        action();
    }
    catch (const Nib::InvalidArgumentException& error)
    {
        EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR), Texts{error.what()});
        return error.what();
    }
    return "nothing thrown";
}

} // namespace

// ---- values -------------------------------------------------------------------------------------

TEST(VertexDescriptor, DefaultIsEmptyAndDynamic)
{
    const VertexDescriptor descriptor;
    EXPECT_EQ(descriptor.numAtributes(), 0);
    EXPECT_EQ(descriptor.size(), 0u);
    EXPECT_EQ(static_cast<int>(descriptor.usage), 2);
}

TEST(VertexDescriptor, FieldsStandInTheirOrder)
{
    EXPECT_EQ(offsetof(VertexDescriptor, count), 0u);
    EXPECT_EQ(offsetof(VertexDescriptor, components), 4u);
    EXPECT_EQ(offsetof(VertexDescriptor, offsets), 36u);
    EXPECT_EQ(offsetof(VertexDescriptor, types), 68u);
    EXPECT_EQ(offsetof(VertexDescriptor, stride), 104u);
    EXPECT_EQ(offsetof(VertexDescriptor, usage), 112u);
    EXPECT_EQ(offsetof(VertexDescriptor, divisors), 116u);
    EXPECT_EQ(sizeof(VertexDescriptor), 152u);
}

TEST(VertexDescriptor, TypesHaveTheirGlTypeAndSize)
{
    struct Row
    {
        int type;
        GLenum glType;
        int bytes;
    };
    const Row rows[] = {
        {0, 0x1400, 1}, // GL_BYTE
        {1, 0x1402, 2}, // GL_SHORT
        {2, 0x1404, 4}, // GL_INT
        {3, 0x1406, 4}, // GL_FLOAT
        {4, 0x1405, 4}, // GL_UNSIGNED_INT
        {5, 0, 8},      // none
    };
    for (const Row& row : rows)
    {
        EXPECT_EQ(Nib::GLES::GetAttributeType(static_cast<Type>(row.type)), row.glType) << row.type;
        EXPECT_EQ(Nib::GLES::aAttributeByteSizes[row.type], row.bytes) << row.type;
        VertexDescriptor descriptor;
        descriptor.addAttribute(static_cast<Type>(row.type), 3, -1, 0);
        EXPECT_EQ(descriptor.size(), 3u * static_cast<unsigned>(row.bytes)) << row.type;
    }
}

TEST(VertexDescriptor, UsagesAndPrimitivesAreGls)
{
    EXPECT_EQ(Nib::GLES::GetBufferUsage(BufferUsage::Stream), 0x88E0u);
    EXPECT_EQ(Nib::GLES::GetBufferUsage(BufferUsage::Static), 0x88E4u);
    EXPECT_EQ(Nib::GLES::GetBufferUsage(BufferUsage::Dynamic), 0x88E8u);
    EXPECT_EQ(static_cast<int>(BufferUsage::Stream), 0);
    EXPECT_EQ(static_cast<int>(BufferUsage::Static), 1);
    EXPECT_EQ(static_cast<int>(PrimitiveType::Points), 0);
    EXPECT_EQ(static_cast<int>(PrimitiveType::Lines), 1);
    EXPECT_EQ(static_cast<int>(PrimitiveType::LineLoop), 2);
    EXPECT_EQ(static_cast<int>(PrimitiveType::LineStrip), 3);
    EXPECT_EQ(static_cast<int>(PrimitiveType::Triangles), 4);
    EXPECT_EQ(static_cast<int>(PrimitiveType::TriangleStrip), 5);
    EXPECT_EQ(static_cast<int>(PrimitiveType::TriangleFan), 6);
}

// ---- adding attributes --------------------------------------------------------------------------

TEST(VertexDescriptor, PackedAttributesFollowOneAnother)
{
    VertexDescriptor descriptor;
    descriptor.addAttribute(Type::Float, 2, -1, 0);
    descriptor.addAttribute(Type::Float, 4, -1, 0);
    descriptor.addAttribute(Type::Byte, 4, -1, 0);
    EXPECT_EQ(descriptor.attributeOffset(0), 0);
    EXPECT_EQ(descriptor.attributeOffset(1), 8);
    EXPECT_EQ(descriptor.attributeOffset(2), 24);
    EXPECT_EQ(descriptor.size(), 28u);
    EXPECT_EQ(descriptor.calculateAttributeSize(), 28u);
    EXPECT_EQ(descriptor.numAtributes(), 3);
}

TEST(VertexDescriptor, EightByteTypeCountsInOffsets)
{
    VertexDescriptor descriptor;
    descriptor.addAttribute(static_cast<Type>(5), 2, -1, 0);
    descriptor.addAttribute(Type::Short, 1, -1, 0);
    EXPECT_EQ(descriptor.attributeOffset(1), 16);
    EXPECT_EQ(descriptor.size(), 18u);
}

TEST(VertexDescriptor, AttributeKeepsWhatItWasGiven)
{
    VertexDescriptor descriptor;
    descriptor.addAttribute(Type::Short, 3, 12, 5);
    EXPECT_EQ(descriptor.attributeType(0), Type::Short);
    EXPECT_EQ(descriptor.attributeSize(0), 3);
    EXPECT_EQ(descriptor.attributeOffset(0), 12);
    EXPECT_EQ(descriptor.divisors[0], 5);
    EXPECT_EQ(descriptor.size(), 18u);
}

TEST(VertexDescriptor, StrideIsTheEndOfTheLastAddedNotTheLargest)
{
    VertexDescriptor descriptor;
    descriptor.addAttribute(Type::Float, 4, 8, 0); // ends at 24
    descriptor.addAttribute(Type::Float, 2, 0, 0); // ends at 8
    EXPECT_EQ(descriptor.size(), 8u);
    EXPECT_EQ(descriptor.calculateAttributeSize(), 8u);
}

TEST(VertexDescriptor, PackedOffsetSumsSizesNotOffsets)
{
    VertexDescriptor descriptor;
    descriptor.addAttribute(Type::Float, 1, 100, 0);
    descriptor.addAttribute(Type::Float, 1, -1, 0);
    EXPECT_EQ(descriptor.attributeOffset(1), 4);
    EXPECT_EQ(descriptor.size(), 8u);
}

// ---- wrong arguments ----------------------------------------------------------------------------

TEST(VertexDescriptor, NinthAttributeIsRefused)
{
    SimDriver driver;
    VertexDescriptor descriptor = WithAttributes(8);
    EXPECT_EQ(ThrownBy(driver, [&] { descriptor.addAttribute(Type::Float, 1, -1, 0); }),
              "VertexDescriptor::addAttribute: too many attributes!");
    EXPECT_EQ(descriptor.numAtributes(), 8);
    EXPECT_EQ(descriptor.size(), 32u);
}

TEST(VertexDescriptor, TypeOfAMissingAttributeIsRefused)
{
    SimDriver driver;
    const VertexDescriptor descriptor = WithAttributes(2);
    EXPECT_EQ(ThrownBy(driver, [&] { descriptor.attributeType(2); }),
              "VertexDescriptor::attributeType: wrong attribute index!");
}

TEST(VertexDescriptor, SizeOfAMissingAttributeIsRefused)
{
    SimDriver driver;
    const VertexDescriptor descriptor = WithAttributes(2);
    EXPECT_EQ(ThrownBy(driver, [&] { descriptor.attributeSize(7); }),
              "VertexDescriptor::attributeSize: wrong attribute index!");
}

TEST(VertexDescriptor, OffsetOfAMissingAttributeIsRefused)
{
    SimDriver driver;
    const VertexDescriptor descriptor = WithAttributes(0);
    EXPECT_EQ(ThrownBy(driver, [&] { descriptor.attributeOffset(0); }),
              "VertexDescriptor::attributeOffset: wrong attribute index!");
}

TEST(VertexDescriptor, NegativeIndexIsRefused)
{
    SimDriver driver;
    const VertexDescriptor descriptor = WithAttributes(2);
    EXPECT_EQ(ThrownBy(driver, [&] { descriptor.attributeSize(-1); }),
              "VertexDescriptor::attributeSize: wrong attribute index!");
}
