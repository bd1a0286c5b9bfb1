#include <nib/exceptions.h>
#include <nib/geometry.h>

#include "gles/Throw.h"
#include "gles/VertexFormats.h"

namespace Nib
{

namespace
{

using GLES::aAttributeByteSizes;
using GLES::Throw;

int ByteSize(const VertexDescriptor& descriptor, int i)
{
    return aAttributeByteSizes[static_cast<int>(descriptor.types[i])] * descriptor.components[i];
}

int PackedOffset(const VertexDescriptor& descriptor)
{
    int end = 0;
    for (int i = 0; i < descriptor.count; ++i)
        end += ByteSize(descriptor, i);
    return end;
}

bool HasAttribute(const VertexDescriptor& descriptor, int i)
{
    return i >= 0 && i < descriptor.count;
}

} // namespace

void VertexDescriptor::addAttribute(AttributeType type, int componentCount, int offset, int divisor)
{
    if (count >= kMaxAttributes)
        Throw<InvalidArgumentException>("VertexDescriptor::addAttribute: too many attributes!");
    offsets[count] = offset == kPacked ? PackedOffset(*this) : offset;
    components[count] = componentCount;
    types[count] = type;
    divisors[count] = divisor;
    ++count;
    stride = calculateAttributeSize();
}

std::uint64_t VertexDescriptor::calculateAttributeSize()
{
    if (count == 0)
        return 0;
    const int last = count - 1;
    return static_cast<std::uint64_t>(offsets[last] + ByteSize(*this, last));
}

std::uint64_t VertexDescriptor::size() const
{
    return stride;
}

int VertexDescriptor::numAtributes() const
{
    return count;
}

VertexDescriptor::AttributeType VertexDescriptor::attributeType(int i) const
{
    if (!HasAttribute(*this, i))
        Throw<InvalidArgumentException>("VertexDescriptor::attributeType: wrong attribute index!");
    return types[i];
}

int VertexDescriptor::attributeSize(int i) const
{
    if (!HasAttribute(*this, i))
        Throw<InvalidArgumentException>("VertexDescriptor::attributeSize: wrong attribute index!");
    return components[i];
}

int VertexDescriptor::attributeOffset(int i) const
{
    if (!HasAttribute(*this, i))
        Throw<InvalidArgumentException>(
            "VertexDescriptor::attributeOffset: wrong attribute index!");
    return offsets[i];
}

} // namespace Nib
