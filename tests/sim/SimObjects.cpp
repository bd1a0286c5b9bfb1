#include "SimObjects.h"

#include <ostream>

std::ostream& operator<<(std::ostream& out, const SimPixel& pixel)
{
    return out << "(" << pixel.r << ", " << pixel.g << ", " << pixel.b << ", " << pixel.a << ")";
}

std::ostream& operator<<(std::ostream& out, const SimCounts& counts)
{
    return out << "contexts " << counts.contexts << ", surfaces " << counts.surfaces
               << ", EGL fences " << counts.eglSyncs << ", textures " << counts.textures
               << ", samplers " << counts.samplers << ", buffers " << counts.buffers
               << ", renderbuffers " << counts.renderbuffers << ", framebuffers "
               << counts.framebuffers << ", programs " << counts.programs << ", shaders "
               << counts.shaders << ", fences " << counts.syncs;
}

SimPixel SimTextureState::At(int x, int y) const
{
    const std::size_t at = 4 * (static_cast<std::size_t>(y) * static_cast<std::size_t>(width) +
                                static_cast<std::size_t>(x));
    if (format != GL_RGBA || type != GL_UNSIGNED_BYTE || at + 4 > bytes.size())
        return {-1, -1, -1, -1};
    return {bytes[at], bytes[at + 1], bytes[at + 2], bytes[at + 3]};
}
