#include "SimGl.h"

#include <GLES2/gl2.h>
// After gl2.h, which it needs.
#include <GLES2/gl2ext.h>

#include <algorithm>
#include <cmath>

// glGetError, glGetString and the glGet family.

namespace Sim
{

namespace
{

/// The value of a query as numbers, whatever type it is asked in.
using Numbers = std::vector<double>;

template <typename Range>
Numbers ToNumbers(const Range& range)
{
    return Numbers(range.begin(), range.end());
}

bool GetLimit(const SimGpu& gpu, GLenum name, Numbers& out)
{
    switch (name)
    {
    case GL_MAX_TEXTURE_SIZE: out = {double(gpu.maxTextureSize)}; return true;
    case GL_MAX_CUBE_MAP_TEXTURE_SIZE: out = {double(gpu.maxTextureSize)}; return true;
    case GL_MAX_3D_TEXTURE_SIZE:
    case GL_MAX_ARRAY_TEXTURE_LAYERS: out = {2048}; return true;
    case GL_MAX_RENDERBUFFER_SIZE: out = {double(gpu.maxRenderbufferSize)}; return true;
    case GL_MAX_VIEWPORT_DIMS:
        out = {double(gpu.maxViewportWidth), double(gpu.maxViewportHeight)};
        return true;
    case GL_MAX_VERTEX_ATTRIBS: out = {double(gpu.maxVertexAttribs)}; return true;
    case GL_MAX_TEXTURE_IMAGE_UNITS:
    case GL_MAX_VERTEX_TEXTURE_IMAGE_UNITS: out = {double(gpu.maxTextureUnits)}; return true;
    case GL_MAX_COMBINED_TEXTURE_IMAGE_UNITS:
        out = {double(gpu.maxCombinedTextureUnits)};
        return true;
    case GL_MAX_UNIFORM_BUFFER_BINDINGS: out = {double(gpu.maxUniformBufferBindings)}; return true;
    case GL_MAX_UNIFORM_BLOCK_SIZE: out = {double(gpu.maxUniformBlockSize)}; return true;
    case GL_MAX_VERTEX_UNIFORM_BLOCKS: out = {double(gpu.maxVertexUniformBlocks)}; return true;
    case GL_MAX_FRAGMENT_UNIFORM_BLOCKS: out = {double(gpu.maxFragmentUniformBlocks)}; return true;
    case GL_MAX_COMBINED_UNIFORM_BLOCKS:
        out = {double(gpu.maxVertexUniformBlocks + gpu.maxFragmentUniformBlocks)};
        return true;
    case GL_MAX_SAMPLES: out = {double(gpu.maxSamples)}; return true;
    case GL_MAX_COLOR_ATTACHMENTS:
    case GL_MAX_DRAW_BUFFERS: out = {4}; return true;
    case GL_MAX_VERTEX_UNIFORM_VECTORS:
    case GL_MAX_FRAGMENT_UNIFORM_VECTORS: out = {256}; return true;
    case GL_MAX_VARYING_VECTORS: out = {15}; return true;
    case GL_UNIFORM_BUFFER_OFFSET_ALIGNMENT: out = {64}; return true;
    case GL_NUM_PROGRAM_BINARY_FORMATS:
        out = {double(gpu.programBinaryFormats.size())};
        return true;
    case GL_PROGRAM_BINARY_FORMATS: out = ToNumbers(gpu.programBinaryFormats); return true;
    case GL_NUM_EXTENSIONS: out = {double(gpu.glExtensions.size())}; return true;
    case GL_MAJOR_VERSION: out = {double(gpu.GlVersion() / 10)}; return true;
    case GL_MINOR_VERSION: out = {double(gpu.GlVersion() % 10)}; return true;
    case GL_NUM_COMPRESSED_TEXTURE_FORMATS:
    case GL_NUM_SHADER_BINARY_FORMATS: out = {0}; return true;
    case GL_COMPRESSED_TEXTURE_FORMATS:
    case GL_SHADER_BINARY_FORMATS: out = {}; return true;
    case GL_SHADER_COMPILER: out = {1}; return true;
    case GL_SUBPIXEL_BITS: out = {8}; return true;
    case GL_ALIASED_LINE_WIDTH_RANGE: out = {1, 8}; return true;
    case GL_ALIASED_POINT_SIZE_RANGE: out = {1, 1024}; return true;
    default: return false;
    }
}

bool GetPixelStore(const GlState& gl, GLenum name, Numbers& out)
{
    switch (name)
    {
    case GL_UNPACK_ALIGNMENT: out = {double(gl.unpack.alignment)}; return true;
    case GL_UNPACK_ROW_LENGTH: out = {double(gl.unpack.rowLength)}; return true;
    case GL_UNPACK_SKIP_ROWS: out = {double(gl.unpack.skipRows)}; return true;
    case GL_UNPACK_SKIP_PIXELS: out = {double(gl.unpack.skipPixels)}; return true;
    case GL_UNPACK_IMAGE_HEIGHT: out = {double(gl.unpack.imageHeight)}; return true;
    case GL_UNPACK_SKIP_IMAGES: out = {double(gl.unpack.skipImages)}; return true;
    case GL_PACK_ALIGNMENT: out = {double(gl.pack.alignment)}; return true;
    case GL_PACK_ROW_LENGTH: out = {double(gl.pack.rowLength)}; return true;
    case GL_PACK_SKIP_ROWS: out = {double(gl.pack.skipRows)}; return true;
    case GL_PACK_SKIP_PIXELS: out = {double(gl.pack.skipPixels)}; return true;
    default: return false;
    }
}

GLuint BoundBuffer(const GlState& gl, GLenum target)
{
    const auto found = gl.buffers.find(target);
    return found == gl.buffers.end() ? 0 : found->second;
}

GLuint BoundTexture(const GlState& gl, GLenum target)
{
    const auto& bound = gl.textures[static_cast<std::size_t>(gl.activeUnit)];
    const auto found = bound.find(target);
    return found == bound.end() ? 0 : found->second;
}

bool GetBinding(const GlState& gl, GLenum name, Numbers& out)
{
    const auto one = [&](GLuint value)
    {
        out = {double(value)};
        return true;
    };
    switch (name)
    {
    case GL_CURRENT_PROGRAM: return one(gl.program);
    case GL_ACTIVE_TEXTURE: return one(GL_TEXTURE0 + static_cast<GLuint>(gl.activeUnit));
    case GL_TEXTURE_BINDING_2D: return one(BoundTexture(gl, GL_TEXTURE_2D));
    case GL_TEXTURE_BINDING_3D: return one(BoundTexture(gl, GL_TEXTURE_3D));
    case GL_TEXTURE_BINDING_2D_ARRAY: return one(BoundTexture(gl, GL_TEXTURE_2D_ARRAY));
    case GL_TEXTURE_BINDING_CUBE_MAP: return one(BoundTexture(gl, GL_TEXTURE_CUBE_MAP));
    case GL_TEXTURE_BINDING_EXTERNAL_OES: return one(BoundTexture(gl, GL_TEXTURE_EXTERNAL_OES));
    case GL_SAMPLER_BINDING: return one(gl.samplers[static_cast<std::size_t>(gl.activeUnit)]);
    case GL_RENDERBUFFER_BINDING: return one(gl.renderbuffer);
    case GL_DRAW_FRAMEBUFFER_BINDING: return one(gl.drawFramebuffer); // GL_FRAMEBUFFER_BINDING too
    case GL_READ_FRAMEBUFFER_BINDING: return one(gl.readFramebuffer);
    case GL_ARRAY_BUFFER_BINDING: return one(BoundBuffer(gl, GL_ARRAY_BUFFER));
    case GL_ELEMENT_ARRAY_BUFFER_BINDING: return one(CurrentVertexArray(gl).elementBuffer);
    case GL_UNIFORM_BUFFER_BINDING: return one(BoundBuffer(gl, GL_UNIFORM_BUFFER));
    case GL_PIXEL_PACK_BUFFER_BINDING: return one(BoundBuffer(gl, GL_PIXEL_PACK_BUFFER));
    case GL_PIXEL_UNPACK_BUFFER_BINDING: return one(BoundBuffer(gl, GL_PIXEL_UNPACK_BUFFER));
    case GL_COPY_READ_BUFFER_BINDING: return one(BoundBuffer(gl, GL_COPY_READ_BUFFER));
    case GL_COPY_WRITE_BUFFER_BINDING: return one(BoundBuffer(gl, GL_COPY_WRITE_BUFFER));
    case GL_VERTEX_ARRAY_BINDING: return one(gl.vertexArray);
    case GL_TRANSFORM_FEEDBACK_BINDING: return one(gl.transformFeedback);
    default: return false;
    }
}

bool GetBlendState(const GlState& gl, GLenum name, Numbers& out)
{
    switch (name)
    {
    case GL_BLEND_SRC_RGB: out = {double(gl.blendSrcRgb)}; return true;
    case GL_BLEND_DST_RGB: out = {double(gl.blendDstRgb)}; return true;
    case GL_BLEND_SRC_ALPHA: out = {double(gl.blendSrcAlpha)}; return true;
    case GL_BLEND_DST_ALPHA: out = {double(gl.blendDstAlpha)}; return true;
    case GL_BLEND_EQUATION_RGB: out = {double(gl.blendEquationRgb)}; return true;
    case GL_BLEND_EQUATION_ALPHA: out = {double(gl.blendEquationAlpha)}; return true;
    case GL_BLEND_COLOR: out = ToNumbers(gl.blendColor); return true;
    case GL_COLOR_WRITEMASK: out = ToNumbers(gl.colorMask); return true;
    case GL_COLOR_CLEAR_VALUE: out = ToNumbers(gl.clearColor); return true;
    default: return false;
    }
}

bool GetDepthStencilState(const GlState& gl, GLenum name, Numbers& out)
{
    const auto one = [&](double value)
    {
        out = {value};
        return true;
    };
    const StencilFace& front = gl.stencilFront;
    const StencilFace& back = gl.stencilBack;
    switch (name)
    {
    case GL_DEPTH_FUNC: return one(gl.depthFunc);
    case GL_DEPTH_WRITEMASK: return one(gl.depthMask);
    case GL_DEPTH_CLEAR_VALUE: return one(gl.clearDepth);
    case GL_DEPTH_RANGE: out = ToNumbers(gl.depthRange); return true;
    case GL_STENCIL_CLEAR_VALUE: return one(gl.clearStencil);
    case GL_STENCIL_FUNC: return one(front.func);
    case GL_STENCIL_REF: return one(front.ref);
    case GL_STENCIL_VALUE_MASK: return one(front.readMask);
    case GL_STENCIL_WRITEMASK: return one(front.writeMask);
    case GL_STENCIL_FAIL: return one(front.fail);
    case GL_STENCIL_PASS_DEPTH_FAIL: return one(front.depthFail);
    case GL_STENCIL_PASS_DEPTH_PASS: return one(front.pass);
    case GL_STENCIL_BACK_FUNC: return one(back.func);
    case GL_STENCIL_BACK_REF: return one(back.ref);
    case GL_STENCIL_BACK_VALUE_MASK: return one(back.readMask);
    case GL_STENCIL_BACK_WRITEMASK: return one(back.writeMask);
    case GL_STENCIL_BACK_FAIL: return one(back.fail);
    case GL_STENCIL_BACK_PASS_DEPTH_FAIL: return one(back.depthFail);
    case GL_STENCIL_BACK_PASS_DEPTH_PASS: return one(back.pass);
    default: return false;
    }
}

bool GetRasterState(const GlState& gl, GLenum name, Numbers& out)
{
    switch (name)
    {
    case GL_VIEWPORT: out = ToNumbers(gl.viewport); return true;
    case GL_SCISSOR_BOX: out = ToNumbers(gl.scissor); return true;
    case GL_CULL_FACE_MODE: out = {double(gl.cullFace)}; return true;
    case GL_FRONT_FACE: out = {double(gl.frontFace)}; return true;
    case GL_LINE_WIDTH: out = {gl.lineWidth}; return true;
    case GL_POLYGON_OFFSET_FACTOR: out = {gl.polygonOffsetFactor}; return true;
    case GL_POLYGON_OFFSET_UNITS: out = {gl.polygonOffsetUnits}; return true;
    case GL_SAMPLE_COVERAGE_VALUE: out = {gl.sampleCoverage}; return true;
    case GL_SAMPLE_COVERAGE_INVERT: out = {double(gl.sampleCoverageInvert)}; return true;
    case GL_GENERATE_MIPMAP_HINT: out = {double(gl.mipmapHint)}; return true;
    case GL_FRAGMENT_SHADER_DERIVATIVE_HINT: out = {double(gl.derivativeHint)}; return true;
    default: return false;
    }
}

/// The sizes of the draw surface's configuration, and what reading from it prefers.
bool GetSurfaceState(GlEntry& entry, GLenum name, Numbers& out)
{
    const Surface* const surface = entry.DrawSurface();
    const SimConfig none{0, 0, 0, 0, 0, 0, 0, 0, 0, 0};
    const SimConfig& config =
        surface ? entry.state.gpu.configs[static_cast<std::size_t>(surface->config)] : none;
    switch (name)
    {
    case GL_RED_BITS: out = {double(config.red)}; return true;
    case GL_GREEN_BITS: out = {double(config.green)}; return true;
    case GL_BLUE_BITS: out = {double(config.blue)}; return true;
    case GL_ALPHA_BITS: out = {double(config.alpha)}; return true;
    case GL_DEPTH_BITS: out = {double(config.depth)}; return true;
    case GL_STENCIL_BITS: out = {double(config.stencil)}; return true;
    case GL_SAMPLES: out = {double(config.samples)}; return true;
    case GL_SAMPLE_BUFFERS: out = {double(config.samples > 0)}; return true;
    case GL_IMPLEMENTATION_COLOR_READ_FORMAT: out = {GL_RGBA}; return true;
    case GL_IMPLEMENTATION_COLOR_READ_TYPE: out = {GL_UNSIGNED_BYTE}; return true;
    default: return false;
    }
}

/// False, with the error set, when there is no such state.
bool Query(GlEntry& entry, GLenum name, Numbers& out)
{
    const GlState& gl = entry.Gl();
    if (IsCapability(name))
    {
        out = {gl.enabled.count(name) ? 1.0 : 0.0};
        return true;
    }
    if (GetBinding(gl, name, out) || GetRasterState(gl, name, out) ||
        GetBlendState(gl, name, out) || GetDepthStencilState(gl, name, out) ||
        GetPixelStore(gl, name, out) || GetLimit(entry.state.gpu, name, out) ||
        GetSurfaceState(entry, name, out))
        return true;
    entry.Misuse(GL_INVALID_ENUM, "no such state: " + Hex(name));
    return false;
}

/// Colours and depths are asked for as integers from their full range; everything else is rounded.
bool IsColorOrDepth(GLenum name)
{
    return name == GL_COLOR_CLEAR_VALUE || name == GL_BLEND_COLOR || name == GL_DEPTH_CLEAR_VALUE ||
           name == GL_DEPTH_RANGE;
}

template <typename T>
void Store(GLenum name, const Numbers& numbers, T* data)
{
    for (std::size_t i = 0; i < numbers.size(); ++i)
    {
        if constexpr (std::is_floating_point_v<T>)
            data[i] = static_cast<T>(numbers[i]);
        else if constexpr (std::is_same_v<T, GLboolean>)
            data[i] = numbers[i] != 0 ? GL_TRUE : GL_FALSE;
        else if (IsColorOrDepth(name))
            data[i] = static_cast<T>(std::llround(numbers[i] * 2147483647.0));
        else
            data[i] = static_cast<T>(std::llround(numbers[i]));
    }
}

template <typename T>
void Get(GlEntry& entry, GLenum name, T* data)
{
    Numbers numbers;
    if (entry && Query(entry, name, numbers))
        Store(name, numbers, data);
}

std::optional<std::string> DeviceText(const SimGpu& gpu, GLenum name)
{
    switch (name)
    {
    case GL_VENDOR: return gpu.vendor;
    case GL_RENDERER: return gpu.renderer;
    case GL_VERSION: return gpu.version;
    case GL_SHADING_LANGUAGE_VERSION: return gpu.shadingLanguage;
    case GL_EXTENSIONS: return gpu.GlExtensionString();
    default: return std::nullopt;
    }
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API GLenum glGetError()
{
    GlEntry entry("glGetError", {});
    if (!entry.HasContext())
        return GL_NO_ERROR;
    std::deque<GLenum>& errors = entry.Gl().errors;
    if (errors.empty())
        return GL_NO_ERROR;
    const GLenum error = errors.front();
    errors.pop_front();
    return error;
}

SIM_API const GLubyte* glGetString(GLenum name)
{
    GlEntry entry("glGetString", {name});
    if (!entry)
        return nullptr;
    const auto given = entry.state.glStrings.find(name);
    const std::optional<std::string> text =
        given != entry.state.glStrings.end() ? given->second : DeviceText(entry.state.gpu, name);
    if (text)
        return reinterpret_cast<const GLubyte*>(entry.state.Keep("GL" + Hex(name), *text));
    if (given == entry.state.glStrings.end())
        entry.Misuse(GL_INVALID_ENUM, "no such string: " + Hex(name));
    return nullptr;
}

SIM_API const GLubyte* glGetStringi(GLenum name, GLuint index)
{
    GlEntry entry("glGetStringi", {name, index}, 30);
    if (!entry)
        return nullptr;
    if (name != GL_EXTENSIONS || index >= entry.state.gpu.glExtensions.size())
    {
        entry.Misuse(GL_INVALID_VALUE, "no such string: " + Hex(name));
        return nullptr;
    }
    const std::string& text = entry.state.gpu.glExtensions[index];
    return reinterpret_cast<const GLubyte*>(entry.state.Keep("GL_EXTENSIONS " + text, text));
}

SIM_API void glGetBooleanv(GLenum name, GLboolean* data)
{
    GlEntry entry("glGetBooleanv", {name, (const void*)data});
    Get(entry, name, data);
}

SIM_API void glGetIntegerv(GLenum name, GLint* data)
{
    GlEntry entry("glGetIntegerv", {name, (const void*)data});
    Get(entry, name, data);
}

SIM_API void glGetInteger64v(GLenum name, GLint64* data)
{
    GlEntry entry("glGetInteger64v", {name, (const void*)data}, 30);
    Get(entry, name, data);
}

SIM_API void glGetFloatv(GLenum name, GLfloat* data)
{
    GlEntry entry("glGetFloatv", {name, (const void*)data});
    Get(entry, name, data);
}
