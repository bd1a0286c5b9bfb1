#ifndef NIB_GLES_TEXTUREOBJECT_H
#define NIB_GLES_TEXTUREOBJECT_H

#include <nib/managed_object.h>
#include <nib/texture.h>

#include "gles/FenceSlot.h"

#include <GLES3/gl3.h>

#include <map>

namespace Nib::GLES
{

/// A GL texture, from OpenGL ES 3.1 on with a sampler object of its own, or an alias: a second
/// handle onto the names of another texture.
///
///  state     names    subscribed  left by
///  created   own      yes         ReleaseGLObject, SetDescriptor, destruction
///  released  none     yes         RestoreGLObject, SetDescriptor, destruction
///  alias     borrowed no (*)      SetDescriptor, destruction
///  failed    none     yes         SetDescriptor, destruction
///  (*) one that SetDescriptor made of a subscribed texture stays subscribed: it lets go of the
///      names at a release and borrows them again at the restore.
///
/// Texture parameters live in the sampler object where there is one, else in the texture.
class TextureObject final : public ITextureObject, public ManagedObject
{
public:
    /// By parameter index; the values are indices too.
    using Params = std::map<int, int>;

    static constexpr int kMaxActiveTextures = 4;
    static constexpr int kTagLength = 126; ///< characters kept of a tag

    /// The texture's GL state, replaced as a whole whenever names are made anew.
    struct TextureInternals
    {
        GLenum target = 0;
        GLuint glID = 0;
        GLuint sampler = 0; ///< 0 without sampler support
        FenceSlot fence;    ///< the upload that the first use has to wait for
        TextureDescriptor descriptor;
        char tag[128] = {};
        Params params;
    };

    /// @p params are @p paramCount pairs of index and value; of two pairs with one index the first
    /// counts. @p bufferInfo says where in @p pixels a 2D texture lies; null: at the start.
    TextureObject(const TextureDescriptor& descriptor, const void* pixels,
                  const unsigned int* params, unsigned int paramCount,
                  const TextureBufferInfo* bufferInfo = nullptr);
    ~TextureObject() override;

    void SetTag(const char* tag) override;
    const char* GetTag() const override;
    int GetWidth() const override;
    int GetHeight() const override;
    void Activate(int unit) const override;
    void Update(const void* pixels, int rowLength) override;
    void Update(const Rect& rect, const void* pixels, int rowLength) override;
    void CopyFromFramebuffer() override;
    void SetData(const void* pixels, int rowLength) override;
    const TextureDescriptor& GetDescriptor() const override;
    void SetParam(int index, int value) override;
    void SetDescriptor(const TextureDescriptor& descriptor) override;
    void Release() override;

    void ReleaseGLObject() override;
    void RestoreGLObject() override;

    const TextureInternals& internals() const { return m_internals; }

private:
    void CreateTexture(const TextureDescriptor& descriptor, const void* pixels,
                       const unsigned int* params, unsigned int paramCount,
                       const TextureBufferInfo* bufferInfo);

    static TextureInternals createTextureInternals(const TextureDescriptor& descriptor,
                                                   const void* pixels, const Params& params,
                                                   const TextureBufferInfo* bufferInfo);
    static TextureInternals createWithSampler(const TextureDescriptor& descriptor,
                                              const void* pixels, const Params& params,
                                              const TextureBufferInfo* bufferInfo);
    static TextureInternals createWithParameters(const TextureDescriptor& descriptor,
                                                 const void* pixels, const Params& params,
                                                 const TextureBufferInfo* bufferInfo);
    static TextureInternals aliasInternals(const TextureDescriptor& descriptor,
                                           const Params& params);

    bool IsAlias() const { return m_internals.descriptor.source != nullptr; }
    void Label() const;
    void BorrowNames() const;
    void WaitForUpload() const;
    void Bind() const;
    void DeleteNames();
    void ForgetNames();
    void freeTexture();

    // Using a texture waits for its upload once, and an alias takes up names that its source got
    // later: both leave the texture, as its users see it, the same.
    mutable TextureInternals m_internals;
};

} // namespace Nib::GLES

#endif
