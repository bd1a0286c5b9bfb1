#include "gles/TextureSpecification.h"

#include <nib/exceptions.h>

#include "base/Log.h"
#include "device/TextureFormats.h"
#include "gles/TextureAccounting.h"
#include "gles/TextureParams.h"
#include "gles/Throw.h"
#include "gles/UnpackState.h"

#include <iterator>

namespace Nib::GLES
{

namespace
{

constexpr GLenum kTexture1D = 0x0DE0;        // GL_TEXTURE_1D and its binding, which OpenGL ES
constexpr GLenum kTextureBinding1D = 0x8068; // does not have
constexpr GLenum kUnsupportedType = 0xFFFFFFFF;

// TextureDescriptor::target -> GL target
constexpr GLenum kTextureTargets[] = {
    kTexture1D,              // 0
    GL_TEXTURE_2D,           // 1
    GL_TEXTURE_2D_ARRAY,     // 2
    GL_TEXTURE_3D,           // 3
    GL_TEXTURE_CUBE_MAP,     // 4
    GL_TEXTURE_EXTERNAL_OES, // 5
};

constexpr GLenum kCubeMapFaces[] = {
    GL_TEXTURE_CUBE_MAP_POSITIVE_X, // 0
    GL_TEXTURE_CUBE_MAP_NEGATIVE_X, // 1
    GL_TEXTURE_CUBE_MAP_POSITIVE_Y, // 2
    GL_TEXTURE_CUBE_MAP_NEGATIVE_Y, // 3
    GL_TEXTURE_CUBE_MAP_POSITIVE_Z, // 4
    GL_TEXTURE_CUBE_MAP_NEGATIVE_Z, // 5
};

GLint InternalFormat(const TextureDescriptor& descriptor)
{
    return static_cast<GLint>(GetTextureInternalFormat(descriptor.memoryLayout));
}

void SpecifyFlatImage(GLenum target, const TextureDescriptor& descriptor, GLsizei height,
                      const void* pixels)
{
    glTexImage2D(target, 0, InternalFormat(descriptor), descriptor.width, height, 0,
                 GetTextureFormat(descriptor.layout),
                 GetTextureType(descriptor.layout, descriptor.memoryLayout), pixels);
}

void SpecifyImage1D(const TextureDescriptor& descriptor, const void* pixels)
{
    RequireSupportedType(GetTextureType(descriptor.layout, descriptor.memoryLayout));
    SpecifyFlatImage(kTexture1D, descriptor, 1, pixels);
}

void SpecifyImage2D(const TextureDescriptor& descriptor, const void* pixels)
{
    SpecifyFlatImage(GL_TEXTURE_2D, descriptor, descriptor.height, pixels);
}

void SpecifyImage3D(GLenum target, const TextureDescriptor& descriptor, const void* pixels)
{
    glTexImage3D(target, 0, InternalFormat(descriptor), descriptor.width, descriptor.height,
                 descriptor.depth, 0, GetTextureFormat(descriptor.layout),
                 GetTextureType(descriptor.layout, descriptor.memoryLayout), pixels);
}

} // namespace

bool IsTextureTarget(int target)
{
    return static_cast<unsigned>(target) < std::size(kTextureTargets);
}

GLenum GetTextureTarget(int target)
{
    return IsTextureTarget(target) ? kTextureTargets[target] : 0;
}

GLenum GetTextureBinding(GLenum target)
{
    switch (target)
    {
    case kTexture1D: return kTextureBinding1D;
    case GL_TEXTURE_2D: return GL_TEXTURE_BINDING_2D;
    case GL_TEXTURE_2D_ARRAY: return GL_TEXTURE_BINDING_2D_ARRAY;
    case GL_TEXTURE_3D: return GL_TEXTURE_BINDING_3D;
    case GL_SAMPLER_EXTERNAL_OES: return GL_TEXTURE_BINDING_EXTERNAL_OES;
    default: return GL_TEXTURE_BINDING_CUBE_MAP;
    }
}

void RequireSupportedType(GLenum type)
{
    if (type == kUnsupportedType)
        Throw<OGLVersionNotSupportedException>();
}

void SpecifyImage(GLenum target, const TextureDescriptor& descriptor, const void* pixels,
                  int rowLength)
{
    switch (target)
    {
    case kTexture1D: return SpecifyImage1D(descriptor, pixels);
    case GL_TEXTURE_2D:
    {
        const UnpackRowLength setRowLength(rowLength);
        return SpecifyImage2D(descriptor, pixels);
    }
    case GL_TEXTURE_3D: return SpecifyImage3D(target, descriptor, pixels);
    case GL_SAMPLER_EXTERNAL_OES: Throw<NotSupportedException>();
    default: return;
    }
}

void SamplingParameters::Set(GLenum name, GLint value) const
{
    if (InSampler())
        glSamplerParameteri(m_sampler, name, value);
    else
        glTexParameteri(m_target, name, value);
}

TextureSpecification::TextureSpecification(const TextureDescriptor& descriptor, const void* pixels,
                                           const std::map<int, int>& params,
                                           const TextureBufferInfo* bufferInfo,
                                           SamplingParameters sampling, const char* function)
    : m_descriptor(descriptor), m_pixels(pixels), m_params(params), m_bufferInfo(bufferInfo),
      m_sampling(sampling), m_function(function)
{
}

void TextureSpecification::Apply(GLuint glID) const
{
    switch (m_descriptor.target)
    {
    case kTextureTarget1D: return Specify1D();
    case kTextureTarget2D: return Specify2D(glID);
    case kTextureTarget2DArray:
    case kTextureTarget3D: return SpecifyVolume();
    case kTextureTargetCubeMap: return SpecifyCubeMap();
    case kTextureTargetExternal: return SpecifyExternal();
    default: return;
    }
}

void TextureSpecification::Specify1D() const
{
    SetParams({kTextureParamWrapS, kTextureParamMagFilter, kTextureParamMinFilter});
    SpecifyImage1D(m_descriptor, m_pixels);
}

void TextureSpecification::Specify2D(GLuint glID) const
{
    glPixelStorei(GL_UNPACK_ALIGNMENT, 1);
    SetParams2D();
    Upload2D();
    TextureAccounting::Add(m_descriptor.width, m_descriptor.height, glID);
    if (m_sampling.InSampler())
        LogErrors();
}

void TextureSpecification::SpecifyVolume() const
{
    SetParams({kTextureParamWrapS, kTextureParamWrapT, kTextureParamWrapR, kTextureParamMagFilter,
               kTextureParamMinFilter});
    SpecifyImage3D(GetTextureTarget(m_descriptor.target), m_descriptor, m_pixels);
}

void TextureSpecification::SpecifyCubeMap() const
{
    SetParams({kTextureParamWrapS, kTextureParamWrapT, kTextureParamWrapR, kTextureParamMagFilter,
               kTextureParamMinFilter});
    for (const GLenum face : kCubeMapFaces)
        SpecifyFlatImage(face, m_descriptor, m_descriptor.height, m_pixels);
}

void TextureSpecification::SpecifyExternal() const
{
    SetParams(
        {kTextureParamWrapS, kTextureParamWrapT, kTextureParamMagFilter, kTextureParamMinFilter});
}

void TextureSpecification::SetParam(int index) const
{
    const auto found = m_params.find(index);
    const int value = found != m_params.end() ? found->second
                                              : GetTextureParamDefault(m_descriptor.target, index);
    m_sampling.Set(getGlPname(index), GetTextureParamValue(index, value));
}

void TextureSpecification::SetParams(std::initializer_list<int> indices) const
{
    for (const int index : indices)
        SetParam(index);
}

void TextureSpecification::SetParams2D() const
{
    SetParams(
        {kTextureParamWrapS, kTextureParamWrapT, kTextureParamMagFilter, kTextureParamMinFilter});
    if (m_sampling.InSampler())
    {
        m_sampling.Set(GL_TEXTURE_MIN_LOD, 0);
        m_sampling.Set(GL_TEXTURE_MAX_LOD, 0);
    }
    if (!m_sampling.InSampler() || m_descriptor.layout == TextureTargetLayout::Depth)
    {
        m_sampling.Set(GL_TEXTURE_COMPARE_FUNC, GL_LEQUAL);
        m_sampling.Set(GL_TEXTURE_COMPARE_MODE, GL_COMPARE_REF_TO_TEXTURE);
    }
}

void TextureSpecification::Upload2D() const
{
    if (m_bufferInfo)
    {
        glPixelStorei(GL_UNPACK_ROW_LENGTH, m_bufferInfo->rowLength);
        glPixelStorei(GL_UNPACK_SKIP_PIXELS, m_bufferInfo->skipPixels);
        glPixelStorei(GL_UNPACK_SKIP_ROWS, m_bufferInfo->skipRows);
    }
    SpecifyImage2D(m_descriptor, m_pixels);
    glPixelStorei(GL_UNPACK_ROW_LENGTH, 0);
    glPixelStorei(GL_UNPACK_SKIP_PIXELS, 0);
    glPixelStorei(GL_UNPACK_SKIP_ROWS, 0);
}

void TextureSpecification::LogErrors() const
{
    for (GLenum error = glGetError(); error != GL_NO_ERROR; error = glGetError())
        NIB_LOG_ERROR("%s - glError = %d", m_function, static_cast<int>(error));
}

} // namespace Nib::GLES
