#include "gles/TextureObject.h"

#include <nib/device.h>
#include <nib/exceptions.h>

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "device/TextureFormats.h"
#include "device/TextureLimits.h"
#include "gles/TextureAccounting.h"
#include "gles/TextureParams.h"
#include "gles/TextureSpecification.h"
#include "gles/Throw.h"
#include "gles/UnpackState.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <utility>

namespace Nib::GLES
{

namespace
{

/// The names of a texture that is being made; deletes them unless they are handed on.
class NewNames
{
public:
    explicit NewNames(bool withSampler)
    {
        glGenTextures(1, &m_texture);
        if (withSampler)
            glGenSamplers(1, &m_sampler);
    }
    ~NewNames()
    {
        if (m_texture != 0)
            glDeleteTextures(1, &m_texture);
        if (m_sampler != 0)
            glDeleteSamplers(1, &m_sampler);
    }
    NewNames(const NewNames&) = delete;
    NewNames& operator=(const NewNames&) = delete;

    GLuint Texture() const { return m_texture; }
    GLuint Sampler() const { return m_sampler; }

    void HandOver(TextureObject::TextureInternals& internals)
    {
        internals.glID = std::exchange(m_texture, 0);
        internals.sampler = std::exchange(m_sampler, 0);
    }

private:
    GLuint m_texture = 0;
    GLuint m_sampler = 0;
};

void RequireSize(const TextureDescriptor& descriptor)
{
    if (descriptor.width == 0 && descriptor.height == 0)
        Throw<TextureNotValidException>();
}

/// Whether a texture that is described as @p left needs no change to be as @p right says. What it
/// stores and whether its upload was fenced do not count.
bool IsSameTexture(const TextureDescriptor& left, const TextureDescriptor& right)
{
    return left.width == right.width && left.height == right.height && left.depth == right.depth &&
           left.layout == right.layout && left.target == right.target &&
           left.source == right.source;
}

/// The first pair of an index counts.
TextureObject::Params ParamsOf(const unsigned int* pairs, unsigned int count)
{
    TextureObject::Params params;
    for (unsigned int i = 0; i < count; ++i)
        params.emplace(static_cast<int>(pairs[2 * i]), static_cast<int>(pairs[2 * i + 1]));
    return params;
}

constexpr bool kWithSampler = true;

/// The texture that an alias is a handle onto; null for none and for one that is not the library's.
const TextureObject* SourceOf(const TextureDescriptor& descriptor)
{
    return dynamic_cast<const TextureObject*>(descriptor.source);
}

/// Names a texture, gives it its parameters and first contents, and fences them if it is asked to.
TextureObject::TextureInternals Build(bool withSampler, const TextureDescriptor& descriptor,
                                      const void* pixels, const TextureObject::Params& params,
                                      const TextureBufferInfo* bufferInfo, const char* function)
{
    NewNames names(withSampler);
    if (!IsTextureTarget(descriptor.target) || names.Texture() == 0)
    {
        NIB_LOG_ERROR("%s exception", function);
        return {};
    }
    const GLenum target = GetTextureTarget(descriptor.target);
    const SamplingParameters sampling = withSampler ? SamplingParameters::OfSampler(names.Sampler())
                                                    : SamplingParameters::OfTexture(target);
    glBindTexture(target, names.Texture());
    TextureSpecification(descriptor, pixels, params, bufferInfo, sampling, function)
        .Apply(names.Texture());
    glBindTexture(target, 0);

    TextureObject::TextureInternals internals;
    internals.target = target;
    internals.descriptor = descriptor;
    internals.params = params;
    names.HandOver(internals);
    if (descriptor.syncOnCreate)
    {
        internals.fence.Set(glFenceSync(GL_SYNC_GPU_COMMANDS_COMPLETE, 0));
        glFlush();
    }
    return internals;
}

} // namespace

// ---- creation ----

TextureObject::TextureObject(const TextureDescriptor& descriptor, const void* pixels,
                             const unsigned int* params, unsigned int paramCount,
                             const TextureBufferInfo* bufferInfo)
{
    CreateTexture(descriptor, pixels, params, paramCount, bufferInfo);
}

TextureObject::~TextureObject()
{
    if (m_internals.glID != 0 && !IsAlias())
        Unregister();
    freeTexture();
}

void TextureObject::Release()
{
    delete this;
}

void TextureObject::CreateTexture(const TextureDescriptor& descriptor, const void* pixels,
                                  const unsigned int* params, unsigned int paramCount,
                                  const TextureBufferInfo* bufferInfo)
{
    const Params kept = ParamsOf(params, paramCount);
    if (descriptor.source)
    {
        m_internals = aliasInternals(descriptor, kept);
        return;
    }
    m_internals = createTextureInternals(descriptor, pixels, kept, bufferInfo);
    Register();
}

TextureObject::TextureInternals
TextureObject::createTextureInternals(const TextureDescriptor& descriptor, const void* pixels,
                                      const Params& params, const TextureBufferInfo* bufferInfo)
{
    NIB_FUNCTION("static TextureObject::TextureInternals "
                 "Nib::GLES::TextureObject::createTextureInternals(const Nib::TextureDescriptor &, "
                 "const void *, const std::map<int, int> &, const Nib::TextureBufferInfo *)");
    const int maxWidth = OpenGLRenderer::getMaxTextureSize();
    const int maxHeight = GetMaxTextureHeight();
    if (descriptor.width > maxWidth || descriptor.height > maxHeight)
    {
        NIB_LOG_ERROR("%s, Requested texture size exceed GL_MAX_TEXTURE_SIZE = %d, width = %d, "
                      "height = %d",
                      function, maxHeight, descriptor.width, descriptor.height);
        throw std::logic_error("Requested texture size is bigger than max texture size");
    }
    return OpenGLRenderer::isSupportSampler()
               ? createWithSampler(descriptor, pixels, params, bufferInfo)
               : createWithParameters(descriptor, pixels, params, bufferInfo);
}

TextureObject::TextureInternals
TextureObject::createWithSampler(const TextureDescriptor& descriptor, const void* pixels,
                                 const Params& params, const TextureBufferInfo* bufferInfo)
{
    NIB_FUNCTION("static TextureObject::TextureInternals "
                 "Nib::GLES::TextureObject::createWithSampler(const Nib::TextureDescriptor &, "
                 "const void *, const std::map<int, int> &, const Nib::TextureBufferInfo *)");
    return Build(kWithSampler, descriptor, pixels, params, bufferInfo, function);
}

TextureObject::TextureInternals
TextureObject::createWithParameters(const TextureDescriptor& descriptor, const void* pixels,
                                    const Params& params, const TextureBufferInfo* bufferInfo)
{
    NIB_FUNCTION("static TextureObject::TextureInternals "
                 "Nib::GLES::TextureObject::createWithParameters(const Nib::TextureDescriptor &, "
                 "const void *, const std::map<int, int> &, const Nib::TextureBufferInfo *)");
    return Build(!kWithSampler, descriptor, pixels, params, bufferInfo, function);
}

TextureObject::TextureInternals TextureObject::aliasInternals(const TextureDescriptor& descriptor,
                                                              const Params& params)
{
    TextureInternals internals;
    internals.target = GetTextureTarget(descriptor.target);
    internals.descriptor = descriptor;
    internals.params = params;
    if (const TextureObject* source = SourceOf(descriptor))
    {
        internals.glID = source->m_internals.glID;
        internals.fence = source->m_internals.fence;
        if (OpenGLRenderer::isSupportSampler())
            internals.sampler = source->m_internals.sampler;
    }
    return internals;
}

// ---- use ----

void TextureObject::Activate(int unit) const
{
    if (unit >= kMaxActiveTextures)
        NIB_ABORT("Error! Please, change value of variable MAX_ACTIVE_TEXTURES by %i", unit + 1);
    WaitForUpload();
    RequireSize(m_internals.descriptor);
    glActiveTexture(GL_TEXTURE0 + static_cast<GLenum>(unit));
    Bind();
    glBindSampler(static_cast<GLuint>(unit),
                  OpenGLRenderer::isSupportSampler() ? m_internals.sampler : 0);
}

void TextureObject::Update(const void* pixels, int rowLength)
{
    const TextureDescriptor& texture = m_internals.descriptor;
    Bind();
    const UnpackRowLength setRowLength(rowLength);
    SetUnpackSkips(0, 0);
    glTexSubImage2D(m_internals.target, 0, 0, 0, texture.width, texture.height,
                    GetTextureFormat(texture.layout),
                    GetTextureType(texture.layout, texture.memoryLayout), pixels);
}

void TextureObject::Update(const Rect& rect, const void* pixels, int rowLength)
{
    const TextureDescriptor& texture = m_internals.descriptor;
    Bind();
    const UnpackRowLength setRowLength(rowLength);
    SetUnpackSkips(rect.left, rect.top);
    // y comes from the third field: callers rely on it.
    glTexSubImage2D(m_internals.target, 0, rect.left, rect.right, rect.Width(), rect.Height(),
                    GetTextureFormat(texture.layout),
                    GetTextureType(texture.layout, texture.memoryLayout), pixels);
    SetUnpackSkips(0, 0);
}

void TextureObject::CopyFromFramebuffer()
{
    const TextureDescriptor& texture = m_internals.descriptor;
    Bind();
    glCopyTexImage2D(m_internals.target, 0, GetTextureInternalFormat(texture.memoryLayout), 0, 0,
                     texture.width, texture.height, 0);
}

void TextureObject::SetData(const void* pixels, int rowLength)
{
    RequireSize(m_internals.descriptor);
    GLint previous = 0;
    glGetIntegerv(GetTextureBinding(m_internals.target), &previous);
    Bind();
    SpecifyImage(m_internals.target, m_internals.descriptor, pixels, rowLength);
    glBindTexture(m_internals.target, static_cast<GLuint>(previous));
}

void TextureObject::SetParam(int index, int value)
{
    m_internals.params[index] = value;
    const GLenum name = getGlPname(index);
    const GLint glValue = GetTextureParamValue(index, value);
    BorrowNames();
    if (OpenGLRenderer::isSupportSampler())
    {
        glSamplerParameteri(m_internals.sampler, name, glValue);
        return;
    }
    glBindTexture(GL_TEXTURE_2D, m_internals.glID); // whatever the target is
    glPixelStorei(GL_UNPACK_ALIGNMENT, 1);
    glTexParameteri(m_internals.target, name, glValue);
}

void TextureObject::Bind() const
{
    BorrowNames();
    glBindTexture(m_internals.target, m_internals.glID);
}

/// An alias that was restored before its source, later in the list, got names again.
void TextureObject::BorrowNames() const
{
    if (m_internals.glID != 0 || !IsAlias())
        return;
    if (const TextureObject* source = SourceOf(m_internals.descriptor))
    {
        m_internals.target = GetTextureTarget(m_internals.descriptor.target);
        m_internals.glID = source->m_internals.glID;
        m_internals.sampler = source->m_internals.sampler;
    }
}

/// Makes the GPU wait, once, for an upload that was fenced. The sync object belongs to the texture
/// at the end of the line of aliases; a handle whose source no longer holds it has nothing to wait
/// for, and must not touch it.
void TextureObject::WaitForUpload() const
{
    const GLsync fence = m_internals.fence.Get();
    if (!fence)
        return;
    const TextureObject* texture = this;
    while (texture && texture->m_internals.fence.Take(fence))
    {
        if (!texture->IsAlias())
        {
            glWaitSync(fence, 0, GL_TIMEOUT_IGNORED);
            glDeleteSync(fence);
            return;
        }
        texture = SourceOf(texture->m_internals.descriptor);
    }
}

// ---- description ----

void TextureObject::SetTag(const char* tag)
{
    NIB_FUNCTION("virtual void Nib::GLES::TextureObject::SetTag(const char *)");
    const std::size_t length = std::min<std::size_t>(std::strlen(tag), kTagLength);
    NIB_LOG_DEBUG("%s, tag = %s, strLen = %d, mTexture->internals().tag = %s", function, tag,
                  static_cast<int>(length), m_internals.tag);
    std::memmove(m_internals.tag, tag, length); // it may be the texture's own
    m_internals.tag[length] = '\0';
    Label();
}

/// For a GL debugger. An alias is another handle of a texture that has its label.
void TextureObject::Label() const
{
    if (!IsAlias() && m_internals.glID != 0)
        GlDebugOutput::Label(GL_TEXTURE, m_internals.glID, m_internals.tag);
}

const char* TextureObject::GetTag() const
{
    return m_internals.tag;
}

int TextureObject::GetWidth() const
{
    return m_internals.descriptor.width;
}

int TextureObject::GetHeight() const
{
    return m_internals.descriptor.height;
}

const TextureDescriptor& TextureObject::GetDescriptor() const
{
    return m_internals.descriptor;
}

void TextureObject::SetDescriptor(const TextureDescriptor& descriptor)
{
    if (IsSameTexture(descriptor, m_internals.descriptor))
        return;
    const TextureDescriptor wanted = descriptor; // the argument may be our own
    freeTexture();
    if (wanted.source)
    {
        m_internals = aliasInternals(wanted, m_internals.params);
        return;
    }
    m_internals = createTextureInternals(wanted, nullptr, m_internals.params, nullptr);
    Register();
}

// ---- the end, and the loss of the context ----

void TextureObject::freeTexture()
{
    if (m_internals.glID == 0)
        return;
    if (!IsAlias())
    {
        TextureAccounting::Remove(m_internals.descriptor.width, m_internals.descriptor.height,
                                  m_internals.glID, m_internals.tag);
        DeleteNames();
    }
    ForgetNames();
}

void TextureObject::DeleteNames()
{
    glDeleteTextures(1, &m_internals.glID);
    if (OpenGLRenderer::isSupportSampler())
        glDeleteSamplers(1, &m_internals.sampler);
    const GLsync fence = m_internals.fence.Get();
    if (fence && m_internals.fence.Take(fence))
        glDeleteSync(fence);
}

void TextureObject::ForgetNames()
{
    m_internals.target = 0;
    m_internals.glID = 0;
    m_internals.sampler = 0;
    m_internals.fence.Set(nullptr);
}

void TextureObject::ReleaseGLObject()
{
    NIB_FUNCTION("virtual void Nib::GLES::TextureObject::ReleaseGLObject()");
    NIB_LOG_INFO("%s - Release Was called. Texture - %d", function,
                 static_cast<int>(m_internals.glID));
    if (m_internals.glID == 0)
        return;
    if (!IsAlias())
        DeleteNames();
    ForgetNames();
}

void TextureObject::RestoreGLObject()
{
    NIB_FUNCTION("virtual void Nib::GLES::TextureObject::RestoreGLObject()");
    if (m_internals.glID != 0)
    {
        NIB_LOG_WARN("%s - Restore Was called twice or more.", function);
        return;
    }
    const TextureDescriptor& texture = m_internals.descriptor;
    m_internals = IsAlias() ? aliasInternals(texture, m_internals.params)
                            : createTextureInternals(texture, nullptr, m_internals.params, nullptr);
    NIB_LOG_INFO("%s - Restore Was called. Texture After - %d (err: %d)", function,
                 static_cast<int>(m_internals.glID), static_cast<int>(glGetError()));
}

} // namespace Nib::GLES
