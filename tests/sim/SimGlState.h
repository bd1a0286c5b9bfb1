#ifndef NIB_SIM_GL_STATE_H
#define NIB_SIM_GL_STATE_H

#include "SimImage.h"
#include "SimObjects.h"

#include <GLES3/gl3.h>
// After gl3.h, which it needs.
#include <GLES2/gl2ext.h>

#include <array>
#include <deque>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace Sim
{

constexpr int kTextureUnits = 32;
constexpr int kVertexAttribs = 16;
constexpr int kUniformBufferBindings = 72;

/// Names of one kind of object. A generated name has an object from the start; `created` tells
/// whether it was bound, which is what makes it one for glIs*.
template <typename Object>
class NameTable
{
public:
    GLuint Generate()
    {
        while (m_objects.count(m_next))
            ++m_next;
        m_objects[m_next] = std::make_unique<Object>();
        return m_next++;
    }
    /// The object of a name that nobody generated: ES lets a bind make it.
    Object& Adopt(GLuint name)
    {
        std::unique_ptr<Object>& object = m_objects[name];
        if (!object)
            object = std::make_unique<Object>();
        return *object;
    }
    Object* Find(GLuint name) const
    {
        const auto found = m_objects.find(name);
        return found == m_objects.end() ? nullptr : found->second.get();
    }
    bool Erase(GLuint name) { return m_objects.erase(name) != 0; }
    int Count() const { return static_cast<int>(m_objects.size()); }
    auto begin() const { return m_objects.begin(); }
    auto end() const { return m_objects.end(); }

private:
    std::map<GLuint, std::unique_ptr<Object>> m_objects;
    GLuint m_next = 1;
};

struct Texture
{
    bool created = false;
    GLenum target = 0;
    bool immutable = false;
    std::map<std::pair<GLenum, int>, Image>
        levels; // by face target (the target itself but for cubes), level
    std::map<GLenum, GLint> params;
};

struct Sampler
{
    bool created = false;
    std::map<GLenum, GLint> params;
};

struct Buffer
{
    bool created = false;
    GLenum usage = 0;
    std::vector<unsigned char> bytes;
    bool mapped = false;
    std::size_t mapOffset = 0;
    std::size_t mapLength = 0;
    GLbitfield mapAccess = 0;
};

struct Renderbuffer
{
    bool created = false;
    int samples = 0;
    Image image;
};

struct Shader
{
    GLenum type = 0;
    std::string source;
    bool compiled = false;
    std::string log;
    bool deleted = false; // goes when it is attached to no program
    int attachments = 0;
};

/// A global variable that a shader declares.
struct Variable
{
    std::string name;
    GLenum type = 0;
    int size = 1;
    bool array = false;
    int location = -1;
    int block = -1; // index of its uniform block
};

struct UniformBlock
{
    std::string name;
    GLuint binding = 0;
    int dataSize = 0;
    std::vector<int> members;
};

struct Uniform : Variable
{
    std::vector<double> values;
};

/// What a link makes of the shaders.
struct Executable
{
    std::string vertexSource;
    std::string fragmentSource;
    std::vector<Variable> attributes;
    std::vector<Uniform> uniforms;
    std::vector<UniformBlock> blocks;
};

struct Program
{
    std::vector<GLuint> shaders;
    std::map<std::string, GLuint> boundLocations;
    bool linked = false;
    bool fromBinary = false;
    bool validated = false;
    bool retrievable = false;
    bool deleted = false; // goes when no context uses it
    int uses = 0;
    std::string log;
    Executable executable;
};

struct Sync
{
    bool signalled = false;
    bool flushed = false;
    void* creator = nullptr; // the context it was made in
};

struct Framebuffer
{
    bool created = false;
    std::map<GLenum, SimAttachment> attachments;
    std::vector<GLenum> drawBuffers{GL_COLOR_ATTACHMENT0};
    GLenum readBuffer = GL_COLOR_ATTACHMENT0;
};

struct VertexArray
{
    bool created = false;
    std::array<SimVertexAttrib, kVertexAttribs> attribs;
    GLuint elementBuffer = 0;
};

/// Plain objects that only have a name and a life.
struct PlainObject
{
    bool created = false;
    bool active = false;
    GLenum target = 0;
};

/// What contexts that share objects have in common.
struct ShareGroup
{
    NameTable<Texture> textures;
    NameTable<Sampler> samplers;
    NameTable<Buffer> buffers;
    NameTable<Renderbuffer> renderbuffers;
    NameTable<Program> programs; // the two kinds have one name space
    NameTable<Shader> shaders;
    GLuint lastProgramName = 0; // of either kind
    std::map<GLsync, Sync> syncs;
    bool lost = false; // its contexts do nothing any more
};

struct StencilFace
{
    GLenum func = GL_ALWAYS;
    GLint ref = 0;
    GLuint readMask = ~0u;
    GLuint writeMask = ~0u;
    GLenum fail = GL_KEEP;
    GLenum depthFail = GL_KEEP;
    GLenum pass = GL_KEEP;
};

/// What GL_KHR_debug adds to a context.
struct DebugOutput
{
    GLDEBUGPROCKHR callback = nullptr;
    const void* user = nullptr;
    bool tellsLow = false; // messages of low severity have to be asked for
    int groups = 0;
};

struct BufferRange
{
    GLuint buffer = 0;
    long long offset = 0;
    long long size = 0;
};

/// The state of one context.
struct GlState
{
    std::deque<GLenum> errors;

    NameTable<Framebuffer> framebuffers;
    NameTable<VertexArray> vertexArrays;
    NameTable<PlainObject> queries;
    NameTable<PlainObject> transformFeedbacks;

    std::set<GLenum> enabled{GL_DITHER};
    std::array<int, 4> viewport{};
    std::array<int, 4> scissor{};
    Color clearColor{};
    double clearDepth = 1;
    int clearStencil = 0;
    std::array<bool, 4> colorMask{true, true, true, true};
    bool depthMask = true;
    GLenum depthFunc = GL_LESS;
    std::array<double, 2> depthRange{0, 1};
    StencilFace stencilFront;
    StencilFace stencilBack;
    GLenum blendEquationRgb = GL_FUNC_ADD;
    GLenum blendEquationAlpha = GL_FUNC_ADD;
    GLenum blendSrcRgb = GL_ONE;
    GLenum blendDstRgb = GL_ZERO;
    GLenum blendSrcAlpha = GL_ONE;
    GLenum blendDstAlpha = GL_ZERO;
    std::array<double, 4> blendColor{};
    GLenum cullFace = GL_BACK;
    GLenum frontFace = GL_CCW;
    double lineWidth = 1;
    double polygonOffsetFactor = 0;
    double polygonOffsetUnits = 0;
    double sampleCoverage = 1;
    bool sampleCoverageInvert = false;
    GLenum mipmapHint = GL_DONT_CARE;
    GLenum derivativeHint = GL_DONT_CARE;

    PixelStore unpack;
    PixelStore pack;

    int activeUnit = 0;
    std::array<std::map<GLenum, GLuint>, kTextureUnits> textures; // by unit, then target
    std::map<GLenum, Texture> defaultTextures;                    // those of name 0, by target
    std::array<GLuint, kTextureUnits> samplers{};
    std::map<GLenum, GLuint> buffers; // all targets but GL_ELEMENT_ARRAY_BUFFER
    std::map<GLuint, BufferRange> uniformBuffers;
    std::map<GLuint, BufferRange> feedbackBuffers;
    GLuint renderbuffer = 0;
    GLuint drawFramebuffer = 0;
    GLuint readFramebuffer = 0;
    GLuint vertexArray = 0;
    VertexArray defaultVertexArray;
    std::array<std::array<double, 4>, kVertexAttribs> currentAttribs;
    GLuint program = 0;
    GLuint transformFeedback = 0;
    bool feedbackActive = false;
    GLenum defaultReadBuffer = GL_BACK;
    std::vector<GLenum> defaultDrawBuffers{GL_BACK};
    DebugOutput debug;
    std::optional<Box> tiling; // between glStartTilingQCOM and glEndTilingQCOM: where is drawn

    GlState() { currentAttribs.fill({0, 0, 0, 1}); }
};

} // namespace Sim

#endif
