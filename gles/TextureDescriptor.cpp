#include <nib/texture.h>

namespace Nib
{

TextureDescriptor::TextureDescriptor(const ITextureObject* texture)
{
    if (texture)
        *this = texture->GetDescriptor();
    source = texture;
}

} // namespace Nib
