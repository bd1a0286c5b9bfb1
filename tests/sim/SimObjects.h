#ifndef NIB_SIM_OBJECTS_H
#define NIB_SIM_OBJECTS_H

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <cstdint>
#include <iosfwd>
#include <map>
#include <string>
#include <vector>

// What a test sees of the objects that the simulated driver keeps: plain values, copied when asked
// for.

/// One RGBA8 pixel.
struct SimPixel
{
    int r = 0;
    int g = 0;
    int b = 0;
    int a = 0;

    friend bool operator==(const SimPixel&, const SimPixel&) = default;
};

std::ostream& operator<<(std::ostream& out, const SimPixel& pixel);

struct SimCounts
{
    int contexts = 0;
    int surfaces = 0;
    int eglSyncs = 0;
    int textures = 0;
    int samplers = 0;
    int buffers = 0;
    int renderbuffers = 0;
    int framebuffers = 0;
    int programs = 0;
    int shaders = 0;
    int syncs = 0;

    friend bool operator==(const SimCounts&, const SimCounts&) = default;
};

std::ostream& operator<<(std::ostream& out, const SimCounts& counts);

struct SimTextureState
{
    bool exists = false;
    GLenum target = 0; ///< 0 until the name was bound for the first time
    int width = 0;     ///< of level 0; of face +X of a cube map
    int height = 0;
    int depth = 0;
    GLenum internalFormat = 0;
    GLenum format = 0;
    GLenum type = 0;
    bool immutable = false;
    int faces = 0; ///< cube map faces that have a level 0
    std::map<GLenum, GLint> params;
    std::vector<unsigned char> bytes; ///< level 0, tightly packed, in the format and type given

    /// The pixel (x, y) of a texture of format GL_RGBA and type GL_UNSIGNED_BYTE.
    SimPixel At(int x, int y) const;
};

struct SimSamplerState
{
    bool exists = false;
    std::map<GLenum, GLint> params;
};

struct SimBufferState
{
    bool exists = false;
    GLenum usage = 0; ///< 0 until there is a data store
    std::vector<unsigned char> bytes;
};

struct SimRenderbufferState
{
    bool exists = false;
    GLenum internalFormat = 0;
    int width = 0;
    int height = 0;
    int samples = 0;
};

struct SimAttachment
{
    GLenum type = GL_NONE; ///< GL_TEXTURE, GL_RENDERBUFFER or GL_NONE
    GLuint name = 0;
    int level = 0;
    int layer = 0;
    GLenum textureTarget = 0;

    friend bool operator==(const SimAttachment&, const SimAttachment&) = default;
};

struct SimFramebufferState
{
    bool exists = false;
    std::map<GLenum, SimAttachment> attachments; ///< by attachment point; only points that have one
};

struct SimUniform
{
    std::string name; ///< as GL reports it: arrays end in "[0]"
    GLenum type = 0;
    int size = 1;
    int location = -1;          ///< of element 0; -1 for a member of a block
    std::vector<double> values; ///< all elements one after the other; matrices column by column
};

struct SimUniformBlock
{
    std::string name;
    GLuint binding = 0;
};

struct SimProgramState
{
    bool exists = false;
    bool linked = false;
    bool fromBinary = false;               ///< the link status comes from glProgramBinary
    std::map<std::string, int> attributes; ///< active attributes and their locations
    std::map<std::string, int> bound;      ///< all glBindAttribLocation so far
    std::vector<SimUniform> uniforms;
    std::vector<SimUniformBlock> blocks;
    std::vector<GLuint> shaders; ///< attached now
};

struct SimContextState
{
    bool exists = false;
    EGLContext share = EGL_NO_CONTEXT; ///< the share context that it was created with
    int clientVersion = 0;
    int priority = 0;    ///< EGL_CONTEXT_PRIORITY_LEVEL_IMG, medium when not asked for
    int config = -1;     ///< index into SimGpu::configs
    unsigned thread = 0; ///< thread on which it is current, 0 for none
};

struct SimSurfaceState
{
    bool exists = false;
    bool window = false;
    int width = 0;
    int height = 0;
    int config = -1;
    EGLint renderBuffer = 0;
    EGLint swapBehavior = 0;
    bool autoRefresh = false;
    bool timestamps = false;
    int bufferAge = 0;
    std::vector<long long> presentationTimes; ///< as set by eglPresentationTimeANDROID, in order
    unsigned thread = 0; ///< thread on which it is the draw surface, 0 for none
};

struct SimWindowState
{
    bool exists = false;
    int width = 0;
    int height = 0;
    int format = 0; ///< from ANativeWindow_setBuffersGeometry; 0 until then
    int geometryCalls = 0;
    int presented = 0; ///< frames shown: swaps, sub-buffer posts, refreshes of the front buffer
    bool connected = false; ///< a surface exists for it
    std::vector<long long>
        lastDamage; ///< x, y, width, height of each rectangle of the last damaged swap
};

struct SimVertexAttrib
{
    bool enabled = false;
    int size = 4;
    GLenum type = GL_FLOAT;
    bool normalized = false;
    bool integer = false;
    int stride = 0;
    const void* pointer = nullptr;
    GLuint buffer = 0;
    unsigned divisor = 0;
};

/// A draw call and the state that it used.
struct SimDraw
{
    std::string name;
    GLenum mode = 0;
    int first = 0;
    int count = 0;
    int instances = 1;
    GLenum indexType = 0; ///< 0 without indices
    const void* indices = nullptr;
    GLuint indexBuffer = 0;
    GLuint program = 0;
    GLuint framebuffer = 0;
    std::vector<SimVertexAttrib> attribs; ///< all attributes, by location
    std::map<int, GLuint> textures;       ///< 2D textures by unit
    std::map<int, GLuint> uniformBuffers; ///< by binding point
    bool scissorTest = false;
    int scissor[4] = {};
    int viewport[4] = {};
    unsigned thread = 0;
};

/// What became visible in a window, or was read back, as a number: the same in two runs that
/// cleared, uploaded, drew and copied the same.
struct SimPicture
{
    std::string where; ///< "window" or "read"
    std::uint64_t digest = 0;
    int area[4] = {}; ///< the part that was shown or read: x, y, width, height

    friend bool operator==(const SimPicture&, const SimPicture&) = default;
};

#endif
