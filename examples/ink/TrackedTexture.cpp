#include "TrackedTexture.h"

#include <GLES3/gl3.h>

#include <memory>

namespace Ink
{

TrackedTexture::~TrackedTexture()
{
    Forget();
}

void TrackedTexture::Reset(Nib::ITextureObject* texture, const char* tag)
{
    Forget();
    m_texture.reset(texture);
    m_texture->SetTag(tag);
    m_tag = tag;
    Remember();
}

void TrackedTexture::Forget()
{
    if (m_name == 0)
        return;
    Nib::ResourceChecker::removeLookup(m_name, Nib::ResourceChecker::textureDbDescriptor);
    m_name = 0;
}

void TrackedTexture::Remember()
{
    if (!Nib::System::IsBuildTypeEngMode())
        return;
    m_texture->Activate(0); // the library does not tell its names; the binding does
    GLint name = 0;
    glGetIntegerv(GL_TEXTURE_BINDING_2D, &name);
    m_name = static_cast<unsigned int>(name);
    Nib::ResourceChecker::addLookup(m_name, Nib::ResourceChecker::textureDbDescriptor,
                                    std::make_unique<Nib::ResourceChecker::TextureInfo>(
                                        m_texture->GetWidth(), m_texture->GetHeight(), GL_RGBA8));
    Nib::ResourceChecker::updateTagLookup(m_name, m_tag, Nib::ResourceChecker::textureDbDescriptor);
}

} // namespace Ink
