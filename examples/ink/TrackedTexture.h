#ifndef INK_TRACKED_TEXTURE_H
#define INK_TRACKED_TEXTURE_H

#include "PostTask.h"

#include <nib/nib.h>

namespace Ink
{

/// A texture whose GL name stands in the leak checker's database while it is alive; engineering
/// builds alone keep that database. Made, used and destroyed on the render thread.
class TrackedTexture
{
public:
    TrackedTexture() = default;
    TrackedTexture(const TrackedTexture&) = delete;
    TrackedTexture& operator=(const TrackedTexture&) = delete;
    ~TrackedTexture(); ///< ends the texture

    /// Takes @p texture over, which appears under @p tag in the log.
    void Reset(Nib::ITextureObject* texture, const char* tag);

    /// Before the context is lost, its name is taken out; after the restore the new one goes in.
    void Forget();
    void Remember();

    Nib::ITextureObject* operator->() const { return m_texture.get(); }
    Nib::ITextureObject& operator*() const { return *m_texture; }

private:
    Owned<Nib::ITextureObject> m_texture;
    const char* m_tag = "";
    unsigned int m_name = 0; ///< 0 while it does not stand in the database
};

} // namespace Ink

#endif
