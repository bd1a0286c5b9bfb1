#include <GLES3/gl3.h>

#include <algorithm>
#include <cstring>
#include <iterator>

// A GL that does nothing: names come from counters, every program links, and every question has an
// answer that lets the caller go on. What calls cost here is what it costs to make them.

namespace
{

constexpr GLint kLimit = 4096; // of sizes
constexpr GLint kBinaryLength = 4096;
constexpr GLenum kBinaryFormat = 0x1234;

struct Uniform
{
    const char* name;
    GLenum type;
};

constexpr Uniform kUniforms[] = {
    {"u_transform", GL_FLOAT_MAT4},
    {"u_tint", GL_FLOAT_VEC4},
};

GLuint NewName()
{
    static GLuint last = 0;
    return ++last;
}

void Generate(GLsizei count, GLuint* names)
{
    std::generate_n(names, count, NewName);
}

} // namespace

extern "C"
{
    // ---- with an answer ----

    const GLubyte* glGetString(GLenum name)
    {
        const char* text = name == GL_VERSION                    ? "OpenGL ES 3.0 stub"
                           : name == GL_SHADING_LANGUAGE_VERSION ? "OpenGL ES GLSL ES 3.00"
                           : name == GL_EXTENSIONS
                               ? "GL_OES_element_index_uint GL_QCOM_tiled_rendering"
                               : "stub";
        return reinterpret_cast<const GLubyte*>(text);
    }
    void glGetIntegerv(GLenum name, GLint* value)
    {
        if (name == GL_MAX_VIEWPORT_DIMS)
            value[0] = value[1] = kLimit;
        else
            *value = name == GL_MAX_TEXTURE_SIZE || name == GL_MAX_RENDERBUFFER_SIZE ? kLimit : 0;
    }
    void glGetProgramiv(GLuint, GLenum name, GLint* value)
    {
        *value = name == GL_ACTIVE_UNIFORMS         ? static_cast<GLint>(std::size(kUniforms))
                 : name == GL_PROGRAM_BINARY_LENGTH ? kBinaryLength
                                                    : GL_TRUE;
    }
    void glGetShaderiv(GLuint, GLenum, GLint* value)
    {
        *value = GL_TRUE;
    }
    void glGetActiveUniform(GLuint, GLuint index, GLsizei size, GLsizei* length, GLint* count,
                            GLenum* type, GLchar* name)
    {
        const Uniform& uniform = kUniforms[index];
        *count = 1;
        *type = uniform.type;
        *length = std::min(size - 1, static_cast<GLsizei>(std::strlen(uniform.name)));
        std::memcpy(name, uniform.name, static_cast<std::size_t>(*length) + 1);
    }
    void glGetProgramBinary(GLuint, GLsizei size, GLsizei* length, GLenum* format, void* binary)
    {
        if (length)
            *length = size;
        *format = kBinaryFormat;
        std::memset(binary, 0, static_cast<std::size_t>(size));
    }
    void glGetSynciv(GLsync, GLenum, GLsizei, GLsizei*, GLint* value)
    {
        *value = GL_SIGNALED;
    }
    GLint glGetUniformLocation(GLuint, const GLchar*)
    {
        return 0;
    }
    GLuint glGetUniformBlockIndex(GLuint, const GLchar*)
    {
        return GL_INVALID_INDEX;
    }
    GLuint glCreateProgram()
    {
        return NewName();
    }
    GLuint glCreateShader(GLenum)
    {
        return NewName();
    }
    void glGenBuffers(GLsizei count, GLuint* names)
    {
        Generate(count, names);
    }
    void glGenFramebuffers(GLsizei count, GLuint* names)
    {
        Generate(count, names);
    }
    void glGenRenderbuffers(GLsizei count, GLuint* names)
    {
        Generate(count, names);
    }
    void glGenSamplers(GLsizei count, GLuint* names)
    {
        Generate(count, names);
    }
    void glGenTextures(GLsizei count, GLuint* names)
    {
        Generate(count, names);
    }
    GLenum glCheckFramebufferStatus(GLenum)
    {
        return GL_FRAMEBUFFER_COMPLETE;
    }
    GLsync glFenceSync(GLenum, GLbitfield)
    {
        static int sync = 0;
        return reinterpret_cast<GLsync>(&sync);
    }
    GLenum glClientWaitSync(GLsync, GLbitfield, GLuint64)
    {
        return GL_ALREADY_SIGNALED;
    }
    GLboolean glIsTexture(GLuint)
    {
        return GL_TRUE;
    }
    GLenum glGetError()
    {
        return GL_NO_ERROR;
    }

    // ---- without ----

    // clang-format off
void glActiveTexture(GLenum) {}
void glAttachShader(GLuint, GLuint) {}
void glBindAttribLocation(GLuint, GLuint, const GLchar*) {}
void glBindBuffer(GLenum, GLuint) {}
void glBindBufferBase(GLenum, GLuint, GLuint) {}
void glBindFramebuffer(GLenum, GLuint) {}
void glBindRenderbuffer(GLenum, GLuint) {}
void glBindSampler(GLuint, GLuint) {}
void glBindTexture(GLenum, GLuint) {}
void glBlendEquationSeparate(GLenum, GLenum) {}
void glBlendFunc(GLenum, GLenum) {}
void glBlendFuncSeparate(GLenum, GLenum, GLenum, GLenum) {}
void glBufferData(GLenum, GLsizeiptr, const void*, GLenum) {}
void glClear(GLbitfield) {}
void glClearColor(GLfloat, GLfloat, GLfloat, GLfloat) {}
void glClearDepthf(GLfloat) {}
void glClearStencil(GLint) {}
void glColorMask(GLboolean, GLboolean, GLboolean, GLboolean) {}
void glCompileShader(GLuint) {}
void glCopyTexImage2D(GLenum, GLint, GLenum, GLint, GLint, GLsizei, GLsizei, GLint) {}
void glCullFace(GLenum) {}
void glDeleteBuffers(GLsizei, const GLuint*) {}
void glDeleteFramebuffers(GLsizei, const GLuint*) {}
void glDeleteProgram(GLuint) {}
void glDeleteRenderbuffers(GLsizei, const GLuint*) {}
void glDeleteSamplers(GLsizei, const GLuint*) {}
void glDeleteShader(GLuint) {}
void glDeleteSync(GLsync) {}
void glDeleteTextures(GLsizei, const GLuint*) {}
void glDepthFunc(GLenum) {}
void glDepthMask(GLboolean) {}
void glDetachShader(GLuint, GLuint) {}
void glDisable(GLenum) {}
void glDisableVertexAttribArray(GLuint) {}
void glDrawArrays(GLenum, GLint, GLsizei) {}
void glDrawArraysInstanced(GLenum, GLint, GLsizei, GLsizei) {}
void glDrawElements(GLenum, GLsizei, GLenum, const void*) {}
void glEnable(GLenum) {}
void glEnableVertexAttribArray(GLuint) {}
void glFinish() {}
void glFlush() {}
void glFramebufferRenderbuffer(GLenum, GLenum, GLenum, GLuint) {}
void glFramebufferTexture2D(GLenum, GLenum, GLenum, GLuint, GLint) {}
void glGetBooleanv(GLenum, GLboolean*) {}
void glGetProgramInfoLog(GLuint, GLsizei, GLsizei*, GLchar*) {}
void glGetShaderInfoLog(GLuint, GLsizei, GLsizei*, GLchar*) {}
void glGetVertexAttribPointerv(GLuint, GLenum, void**) {}
void glGetVertexAttribiv(GLuint, GLenum, GLint*) {}
void glInvalidateFramebuffer(GLenum, GLsizei, const GLenum*) {}
void glLinkProgram(GLuint) {}
void glPixelStorei(GLenum, GLint) {}
void glProgramBinary(GLuint, GLenum, const void*, GLsizei) {}
void glReadPixels(GLint, GLint, GLsizei, GLsizei, GLenum, GLenum, void*) {}
void glRenderbufferStorage(GLenum, GLenum, GLsizei, GLsizei) {}
void glSamplerParameteri(GLuint, GLenum, GLint) {}
void glScissor(GLint, GLint, GLsizei, GLsizei) {}
void glShaderSource(GLuint, GLsizei, const GLchar* const*, const GLint*) {}
void glStencilFunc(GLenum, GLint, GLuint) {}
void glStencilFuncSeparate(GLenum, GLenum, GLint, GLuint) {}
void glStencilMask(GLuint) {}
void glStencilMaskSeparate(GLenum, GLuint) {}
void glStencilOpSeparate(GLenum, GLenum, GLenum, GLenum) {}
void glTexImage2D(GLenum, GLint, GLint, GLsizei, GLsizei, GLint, GLenum, GLenum, const void*) {}
void glTexImage3D(GLenum, GLint, GLint, GLsizei, GLsizei, GLsizei, GLint, GLenum, GLenum, const void*) {}
void glTexParameteri(GLenum, GLenum, GLint) {}
void glTexSubImage2D(GLenum, GLint, GLint, GLint, GLsizei, GLsizei, GLenum, GLenum, const void*) {}
void glUniform1f(GLint, GLfloat) {}
void glUniform1i(GLint, GLint) {}
void glUniform2fv(GLint, GLsizei, const GLfloat*) {}
void glUniform3fv(GLint, GLsizei, const GLfloat*) {}
void glUniform4fv(GLint, GLsizei, const GLfloat*) {}
void glUniformBlockBinding(GLuint, GLuint, GLuint) {}
void glUniformMatrix4fv(GLint, GLsizei, GLboolean, const GLfloat*) {}
void glUseProgram(GLuint) {}
void glVertexAttribDivisor(GLuint, GLuint) {}
void glVertexAttribPointer(GLuint, GLint, GLenum, GLboolean, GLsizei, const void*) {}
void glViewport(GLint, GLint, GLsizei, GLsizei) {}
void glWaitSync(GLsync, GLbitfield, GLuint64) {}
    // clang-format on
}
