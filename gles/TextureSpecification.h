#ifndef NIB_GLES_TEXTURESPECIFICATION_H
#define NIB_GLES_TEXTURESPECIFICATION_H

#include <nib/texture.h>

#include <GLES3/gl3.h>

#include <initializer_list>
#include <map>

namespace Nib::GLES
{

/// Whether a texture can have this target index.
bool IsTextureTarget(int target);

/// The GL target of a target index; 0 when there is none.
GLenum GetTextureTarget(int target);

/// What tells which texture is bound to @p target. An external texture is told apart by the value
/// of the sampler type, so that its target gets the last answer.
GLenum GetTextureBinding(GLenum target);

/// Throws OGLVersionNotSupportedException for the mark of a pair of layouts that cannot be used.
void RequireSupportedType(GLenum type);

/// Level 0 of the texture that is bound to @p target, at the descriptor's size: 1D, 2D and 3D
/// textures. Any other keeps what it has, and a target that is GL_SAMPLER_EXTERNAL_OES throws
/// NotSupportedException.
void SpecifyImage(GLenum target, const TextureDescriptor& descriptor, const void* pixels,
                  int rowLength);

/// Where sampling parameters go: into a sampler object, or into the texture that is bound.
class SamplingParameters
{
public:
    static SamplingParameters OfSampler(GLuint sampler) { return {sampler, 0}; }
    static SamplingParameters OfTexture(GLenum target) { return {0, target}; }

    bool InSampler() const { return m_target == 0; }
    void Set(GLenum name, GLint value) const;

private:
    SamplingParameters(GLuint sampler, GLenum target) : m_sampler(sampler), m_target(target) {}

    GLuint m_sampler;
    GLenum m_target;
};

/// Gives a texture that was just named its parameters and its first contents.
class TextureSpecification
{
public:
    /// Borrows everything; @p function stands in the log lines.
    TextureSpecification(const TextureDescriptor& descriptor, const void* pixels,
                         const std::map<int, int>& params, const TextureBufferInfo* bufferInfo,
                         SamplingParameters sampling, const char* function);

    /// The texture @p glID is bound to its target; throws what RequireSupportedType throws.
    void Apply(GLuint glID) const;

private:
    void Specify1D() const;
    void Specify2D(GLuint glID) const;
    void SpecifyVolume() const;
    void SpecifyCubeMap() const;
    void SpecifyExternal() const;

    void SetParam(int index) const;
    void SetParams(std::initializer_list<int> indices) const;
    void SetParams2D() const;
    void Upload2D() const;
    void LogErrors() const;

    const TextureDescriptor& m_descriptor;
    const void* m_pixels;
    const std::map<int, int>& m_params;
    const TextureBufferInfo* m_bufferInfo;
    SamplingParameters m_sampling;
    const char* m_function;
};

} // namespace Nib::GLES

#endif
