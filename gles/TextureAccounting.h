#ifndef NIB_GLES_TEXTUREACCOUNTING_H
#define NIB_GLES_TEXTUREACCOUNTING_H

namespace Nib::GLES::TextureAccounting
{

// The pixels and the number of live textures in the whole process, for the log alone. Only 2D
// textures are counted when they are made, but every texture that owns its names is when it is
// freed, and a restored 2D texture counts again: the numbers drift, by intent.

/// Counts a 2D texture that was made, and logs it.
void Add(int width, int height, unsigned glID);

/// Takes a texture out again that is about to be deleted, and logs it.
void Remove(int width, int height, unsigned glID, const char* tag);

} // namespace Nib::GLES::TextureAccounting

#endif
