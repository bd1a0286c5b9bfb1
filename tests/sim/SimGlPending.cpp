#include "SimEgl.h"
#include "SimGl.h"

using namespace Sim;

SIM_API void glActiveTexture(GLenum texture)
{
    GlEntry entry("glActiveTexture", {texture});
}

SIM_API void glAttachShader(GLuint program, GLuint shader)
{
    GlEntry entry("glAttachShader", {program, shader});
}

SIM_API void glBindAttribLocation(GLuint program, GLuint index, const GLchar* name)
{
    GlEntry entry("glBindAttribLocation", {program, index, name});
}

SIM_API void glBindBuffer(GLenum target, GLuint buffer)
{
    GlEntry entry("glBindBuffer", {target, buffer});
}

SIM_API void glBindFramebuffer(GLenum target, GLuint framebuffer)
{
    GlEntry entry("glBindFramebuffer", {target, framebuffer});
}

SIM_API void glBindRenderbuffer(GLenum target, GLuint renderbuffer)
{
    GlEntry entry("glBindRenderbuffer", {target, renderbuffer});
}

SIM_API void glBindTexture(GLenum target, GLuint texture)
{
    GlEntry entry("glBindTexture", {target, texture});
}

SIM_API void glBlendColor(GLfloat red, GLfloat green, GLfloat blue, GLfloat alpha)
{
    GlEntry entry("glBlendColor", {red, green, blue, alpha});
}

SIM_API void glBlendEquation(GLenum mode)
{
    GlEntry entry("glBlendEquation", {mode});
}

SIM_API void glBlendEquationSeparate(GLenum modeRGB, GLenum modeAlpha)
{
    GlEntry entry("glBlendEquationSeparate", {modeRGB, modeAlpha});
}

SIM_API void glBlendFunc(GLenum sfactor, GLenum dfactor)
{
    GlEntry entry("glBlendFunc", {sfactor, dfactor});
}

SIM_API void glBlendFuncSeparate(GLenum sfactorRGB, GLenum dfactorRGB, GLenum sfactorAlpha,
                                 GLenum dfactorAlpha)
{
    GlEntry entry("glBlendFuncSeparate", {sfactorRGB, dfactorRGB, sfactorAlpha, dfactorAlpha});
}

SIM_API void glBufferData(GLenum target, GLsizeiptr size, const void* data, GLenum usage)
{
    GlEntry entry("glBufferData", {target, size, (const void*)data, usage});
}

SIM_API void glBufferSubData(GLenum target, GLintptr offset, GLsizeiptr size, const void* data)
{
    GlEntry entry("glBufferSubData", {target, offset, size, (const void*)data});
}

SIM_API GLenum glCheckFramebufferStatus(GLenum target)
{
    GlEntry entry("glCheckFramebufferStatus", {target});
    return GL_FRAMEBUFFER_COMPLETE;
}

SIM_API void glClear(GLbitfield mask)
{
    GlEntry entry("glClear", {mask});
}

SIM_API void glClearColor(GLfloat red, GLfloat green, GLfloat blue, GLfloat alpha)
{
    GlEntry entry("glClearColor", {red, green, blue, alpha});
}

SIM_API void glClearDepthf(GLfloat d)
{
    GlEntry entry("glClearDepthf", {d});
}

SIM_API void glClearStencil(GLint s)
{
    GlEntry entry("glClearStencil", {s});
}

SIM_API void glColorMask(GLboolean red, GLboolean green, GLboolean blue, GLboolean alpha)
{
    GlEntry entry("glColorMask", {red, green, blue, alpha});
}

SIM_API void glCompileShader(GLuint shader)
{
    GlEntry entry("glCompileShader", {shader});
}

SIM_API void glCompressedTexImage2D(GLenum target, GLint level, GLenum internalformat,
                                    GLsizei width, GLsizei height, GLint border, GLsizei imageSize,
                                    const void* data)
{
    GlEntry entry("glCompressedTexImage2D", {target, level, internalformat, width, height, border,
                                             imageSize, (const void*)data});
}

SIM_API void glCompressedTexSubImage2D(GLenum target, GLint level, GLint xoffset, GLint yoffset,
                                       GLsizei width, GLsizei height, GLenum format,
                                       GLsizei imageSize, const void* data)
{
    GlEntry entry("glCompressedTexSubImage2D", {target, level, xoffset, yoffset, width, height,
                                                format, imageSize, (const void*)data});
}

SIM_API void glCopyTexImage2D(GLenum target, GLint level, GLenum internalformat, GLint x, GLint y,
                              GLsizei width, GLsizei height, GLint border)
{
    GlEntry entry("glCopyTexImage2D", {target, level, internalformat, x, y, width, height, border});
}

SIM_API void glCopyTexSubImage2D(GLenum target, GLint level, GLint xoffset, GLint yoffset, GLint x,
                                 GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glCopyTexSubImage2D", {target, level, xoffset, yoffset, x, y, width, height});
}

SIM_API GLuint glCreateProgram(void)
{
    GlEntry entry("glCreateProgram", {});
    static GLuint last = 0;
    return ++last;
}

SIM_API GLuint glCreateShader(GLenum type)
{
    GlEntry entry("glCreateShader", {type});
    static GLuint last = 0;
    return ++last;
}

SIM_API void glCullFace(GLenum mode)
{
    GlEntry entry("glCullFace", {mode});
}

SIM_API void glDeleteBuffers(GLsizei n, const GLuint* buffers)
{
    GlEntry entry("glDeleteBuffers", {n, (const void*)buffers});
}

SIM_API void glDeleteFramebuffers(GLsizei n, const GLuint* framebuffers)
{
    GlEntry entry("glDeleteFramebuffers", {n, (const void*)framebuffers});
}

SIM_API void glDeleteProgram(GLuint program)
{
    GlEntry entry("glDeleteProgram", {program});
}

SIM_API void glDeleteRenderbuffers(GLsizei n, const GLuint* renderbuffers)
{
    GlEntry entry("glDeleteRenderbuffers", {n, (const void*)renderbuffers});
}

SIM_API void glDeleteShader(GLuint shader)
{
    GlEntry entry("glDeleteShader", {shader});
}

SIM_API void glDeleteTextures(GLsizei n, const GLuint* textures)
{
    GlEntry entry("glDeleteTextures", {n, (const void*)textures});
}

SIM_API void glDepthFunc(GLenum func)
{
    GlEntry entry("glDepthFunc", {func});
}

SIM_API void glDepthMask(GLboolean flag)
{
    GlEntry entry("glDepthMask", {flag});
}

SIM_API void glDepthRangef(GLfloat n, GLfloat f)
{
    GlEntry entry("glDepthRangef", {n, f});
}

SIM_API void glDetachShader(GLuint program, GLuint shader)
{
    GlEntry entry("glDetachShader", {program, shader});
}

SIM_API void glDisable(GLenum cap)
{
    GlEntry entry("glDisable", {cap});
}

SIM_API void glDisableVertexAttribArray(GLuint index)
{
    GlEntry entry("glDisableVertexAttribArray", {index});
}

SIM_API void glDrawArrays(GLenum mode, GLint first, GLsizei count)
{
    GlEntry entry("glDrawArrays", {mode, first, count});
}

SIM_API void glDrawElements(GLenum mode, GLsizei count, GLenum type, const void* indices)
{
    GlEntry entry("glDrawElements", {mode, count, type, (const void*)indices});
}

SIM_API void glEnable(GLenum cap)
{
    GlEntry entry("glEnable", {cap});
}

SIM_API void glEnableVertexAttribArray(GLuint index)
{
    GlEntry entry("glEnableVertexAttribArray", {index});
}

SIM_API void glFinish(void)
{
    GlEntry entry("glFinish", {});
}

SIM_API void glFlush(void)
{
    GlEntry entry("glFlush", {});
}

SIM_API void glFramebufferRenderbuffer(GLenum target, GLenum attachment, GLenum renderbuffertarget,
                                       GLuint renderbuffer)
{
    GlEntry entry("glFramebufferRenderbuffer",
                  {target, attachment, renderbuffertarget, renderbuffer});
}

SIM_API void glFramebufferTexture2D(GLenum target, GLenum attachment, GLenum textarget,
                                    GLuint texture, GLint level)
{
    GlEntry entry("glFramebufferTexture2D", {target, attachment, textarget, texture, level});
}

SIM_API void glFrontFace(GLenum mode)
{
    GlEntry entry("glFrontFace", {mode});
}

SIM_API void glGenBuffers(GLsizei n, GLuint* buffers)
{
    GlEntry entry("glGenBuffers", {n, (const void*)buffers});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        buffers[i] = entry ? ++last : 0;
}

SIM_API void glGenerateMipmap(GLenum target)
{
    GlEntry entry("glGenerateMipmap", {target});
}

SIM_API void glGenFramebuffers(GLsizei n, GLuint* framebuffers)
{
    GlEntry entry("glGenFramebuffers", {n, (const void*)framebuffers});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        framebuffers[i] = entry ? ++last : 0;
}

SIM_API void glGenRenderbuffers(GLsizei n, GLuint* renderbuffers)
{
    GlEntry entry("glGenRenderbuffers", {n, (const void*)renderbuffers});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        renderbuffers[i] = entry ? ++last : 0;
}

SIM_API void glGenTextures(GLsizei n, GLuint* textures)
{
    GlEntry entry("glGenTextures", {n, (const void*)textures});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        textures[i] = entry ? ++last : 0;
}

SIM_API void glGetActiveAttrib(GLuint program, GLuint index, GLsizei bufSize, GLsizei* length,
                               GLint* size, GLenum* type, GLchar* name)
{
    GlEntry entry("glGetActiveAttrib", {program, index, bufSize, (const void*)length,
                                        (const void*)size, (const void*)type, (const void*)name});
}

SIM_API void glGetActiveUniform(GLuint program, GLuint index, GLsizei bufSize, GLsizei* length,
                                GLint* size, GLenum* type, GLchar* name)
{
    GlEntry entry("glGetActiveUniform", {program, index, bufSize, (const void*)length,
                                         (const void*)size, (const void*)type, (const void*)name});
}

SIM_API void glGetAttachedShaders(GLuint program, GLsizei maxCount, GLsizei* count, GLuint* shaders)
{
    GlEntry entry("glGetAttachedShaders",
                  {program, maxCount, (const void*)count, (const void*)shaders});
}

SIM_API GLint glGetAttribLocation(GLuint program, const GLchar* name)
{
    GlEntry entry("glGetAttribLocation", {program, name});
    return {};
}

SIM_API void glGetBufferParameteriv(GLenum target, GLenum pname, GLint* params)
{
    GlEntry entry("glGetBufferParameteriv", {target, pname, (const void*)params});
}

SIM_API void glGetFramebufferAttachmentParameteriv(GLenum target, GLenum attachment, GLenum pname,
                                                   GLint* params)
{
    GlEntry entry("glGetFramebufferAttachmentParameteriv",
                  {target, attachment, pname, (const void*)params});
}

SIM_API void glGetProgramiv(GLuint program, GLenum pname, GLint* params)
{
    GlEntry entry("glGetProgramiv", {program, pname, (const void*)params});
    *params = 1;
}

SIM_API void glGetProgramInfoLog(GLuint program, GLsizei bufSize, GLsizei* length, GLchar* infoLog)
{
    GlEntry entry("glGetProgramInfoLog",
                  {program, bufSize, (const void*)length, (const void*)infoLog});
}

SIM_API void glGetRenderbufferParameteriv(GLenum target, GLenum pname, GLint* params)
{
    GlEntry entry("glGetRenderbufferParameteriv", {target, pname, (const void*)params});
}

SIM_API void glGetShaderiv(GLuint shader, GLenum pname, GLint* params)
{
    GlEntry entry("glGetShaderiv", {shader, pname, (const void*)params});
    *params = 1;
}

SIM_API void glGetShaderInfoLog(GLuint shader, GLsizei bufSize, GLsizei* length, GLchar* infoLog)
{
    GlEntry entry("glGetShaderInfoLog",
                  {shader, bufSize, (const void*)length, (const void*)infoLog});
}

SIM_API void glGetShaderPrecisionFormat(GLenum shadertype, GLenum precisiontype, GLint* range,
                                        GLint* precision)
{
    GlEntry entry("glGetShaderPrecisionFormat",
                  {shadertype, precisiontype, (const void*)range, (const void*)precision});
}

SIM_API void glGetShaderSource(GLuint shader, GLsizei bufSize, GLsizei* length, GLchar* source)
{
    GlEntry entry("glGetShaderSource", {shader, bufSize, (const void*)length, (const void*)source});
}

SIM_API void glGetTexParameterfv(GLenum target, GLenum pname, GLfloat* params)
{
    GlEntry entry("glGetTexParameterfv", {target, pname, (const void*)params});
}

SIM_API void glGetTexParameteriv(GLenum target, GLenum pname, GLint* params)
{
    GlEntry entry("glGetTexParameteriv", {target, pname, (const void*)params});
}

SIM_API void glGetUniformfv(GLuint program, GLint location, GLfloat* params)
{
    GlEntry entry("glGetUniformfv", {program, location, (const void*)params});
}

SIM_API void glGetUniformiv(GLuint program, GLint location, GLint* params)
{
    GlEntry entry("glGetUniformiv", {program, location, (const void*)params});
}

SIM_API GLint glGetUniformLocation(GLuint program, const GLchar* name)
{
    GlEntry entry("glGetUniformLocation", {program, name});
    return {};
}

SIM_API void glGetVertexAttribfv(GLuint index, GLenum pname, GLfloat* params)
{
    GlEntry entry("glGetVertexAttribfv", {index, pname, (const void*)params});
}

SIM_API void glGetVertexAttribiv(GLuint index, GLenum pname, GLint* params)
{
    GlEntry entry("glGetVertexAttribiv", {index, pname, (const void*)params});
}

SIM_API void glGetVertexAttribPointerv(GLuint index, GLenum pname, void** pointer)
{
    GlEntry entry("glGetVertexAttribPointerv", {index, pname, (const void*)pointer});
}

SIM_API void glHint(GLenum target, GLenum mode)
{
    GlEntry entry("glHint", {target, mode});
}

SIM_API GLboolean glIsBuffer(GLuint buffer)
{
    GlEntry entry("glIsBuffer", {buffer});
    return {};
}

SIM_API GLboolean glIsEnabled(GLenum cap)
{
    GlEntry entry("glIsEnabled", {cap});
    return {};
}

SIM_API GLboolean glIsFramebuffer(GLuint framebuffer)
{
    GlEntry entry("glIsFramebuffer", {framebuffer});
    return {};
}

SIM_API GLboolean glIsProgram(GLuint program)
{
    GlEntry entry("glIsProgram", {program});
    return {};
}

SIM_API GLboolean glIsRenderbuffer(GLuint renderbuffer)
{
    GlEntry entry("glIsRenderbuffer", {renderbuffer});
    return {};
}

SIM_API GLboolean glIsShader(GLuint shader)
{
    GlEntry entry("glIsShader", {shader});
    return {};
}

SIM_API GLboolean glIsTexture(GLuint texture)
{
    GlEntry entry("glIsTexture", {texture});
    return {};
}

SIM_API void glLineWidth(GLfloat width)
{
    GlEntry entry("glLineWidth", {width});
}

SIM_API void glLinkProgram(GLuint program)
{
    GlEntry entry("glLinkProgram", {program});
}

SIM_API void glPixelStorei(GLenum pname, GLint param)
{
    GlEntry entry("glPixelStorei", {pname, param});
}

SIM_API void glPolygonOffset(GLfloat factor, GLfloat units)
{
    GlEntry entry("glPolygonOffset", {factor, units});
}

SIM_API void glReadPixels(GLint x, GLint y, GLsizei width, GLsizei height, GLenum format,
                          GLenum type, void* pixels)
{
    GlEntry entry("glReadPixels", {x, y, width, height, format, type, (const void*)pixels});
}

SIM_API void glReleaseShaderCompiler(void)
{
    GlEntry entry("glReleaseShaderCompiler", {});
}

SIM_API void glRenderbufferStorage(GLenum target, GLenum internalformat, GLsizei width,
                                   GLsizei height)
{
    GlEntry entry("glRenderbufferStorage", {target, internalformat, width, height});
}

SIM_API void glSampleCoverage(GLfloat value, GLboolean invert)
{
    GlEntry entry("glSampleCoverage", {value, invert});
}

SIM_API void glScissor(GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glScissor", {x, y, width, height});
}

SIM_API void glShaderBinary(GLsizei count, const GLuint* shaders, GLenum binaryFormat,
                            const void* binary, GLsizei length)
{
    GlEntry entry("glShaderBinary",
                  {count, (const void*)shaders, binaryFormat, (const void*)binary, length});
}

SIM_API void glShaderSource(GLuint shader, GLsizei count, const GLchar* const* string,
                            const GLint* length)
{
    GlEntry entry("glShaderSource", {shader, count, (const void*)string, (const void*)length});
}

SIM_API void glStencilFunc(GLenum func, GLint ref, GLuint mask)
{
    GlEntry entry("glStencilFunc", {func, ref, mask});
}

SIM_API void glStencilFuncSeparate(GLenum face, GLenum func, GLint ref, GLuint mask)
{
    GlEntry entry("glStencilFuncSeparate", {face, func, ref, mask});
}

SIM_API void glStencilMask(GLuint mask)
{
    GlEntry entry("glStencilMask", {mask});
}

SIM_API void glStencilMaskSeparate(GLenum face, GLuint mask)
{
    GlEntry entry("glStencilMaskSeparate", {face, mask});
}

SIM_API void glStencilOp(GLenum fail, GLenum zfail, GLenum zpass)
{
    GlEntry entry("glStencilOp", {fail, zfail, zpass});
}

SIM_API void glStencilOpSeparate(GLenum face, GLenum sfail, GLenum dpfail, GLenum dppass)
{
    GlEntry entry("glStencilOpSeparate", {face, sfail, dpfail, dppass});
}

SIM_API void glTexImage2D(GLenum target, GLint level, GLint internalformat, GLsizei width,
                          GLsizei height, GLint border, GLenum format, GLenum type,
                          const void* pixels)
{
    GlEntry entry("glTexImage2D", {target, level, internalformat, width, height, border, format,
                                   type, (const void*)pixels});
}

SIM_API void glTexParameterf(GLenum target, GLenum pname, GLfloat param)
{
    GlEntry entry("glTexParameterf", {target, pname, param});
}

SIM_API void glTexParameterfv(GLenum target, GLenum pname, const GLfloat* params)
{
    GlEntry entry("glTexParameterfv", {target, pname, (const void*)params});
}

SIM_API void glTexParameteri(GLenum target, GLenum pname, GLint param)
{
    GlEntry entry("glTexParameteri", {target, pname, param});
}

SIM_API void glTexParameteriv(GLenum target, GLenum pname, const GLint* params)
{
    GlEntry entry("glTexParameteriv", {target, pname, (const void*)params});
}

SIM_API void glTexSubImage2D(GLenum target, GLint level, GLint xoffset, GLint yoffset,
                             GLsizei width, GLsizei height, GLenum format, GLenum type,
                             const void* pixels)
{
    GlEntry entry("glTexSubImage2D", {target, level, xoffset, yoffset, width, height, format, type,
                                      (const void*)pixels});
}

SIM_API void glUniform1f(GLint location, GLfloat v0)
{
    GlEntry entry("glUniform1f", {location, v0});
}

SIM_API void glUniform1fv(GLint location, GLsizei count, const GLfloat* value)
{
    GlEntry entry("glUniform1fv", {location, count, (const void*)value});
}

SIM_API void glUniform1i(GLint location, GLint v0)
{
    GlEntry entry("glUniform1i", {location, v0});
}

SIM_API void glUniform1iv(GLint location, GLsizei count, const GLint* value)
{
    GlEntry entry("glUniform1iv", {location, count, (const void*)value});
}

SIM_API void glUniform2f(GLint location, GLfloat v0, GLfloat v1)
{
    GlEntry entry("glUniform2f", {location, v0, v1});
}

SIM_API void glUniform2fv(GLint location, GLsizei count, const GLfloat* value)
{
    GlEntry entry("glUniform2fv", {location, count, (const void*)value});
}

SIM_API void glUniform2i(GLint location, GLint v0, GLint v1)
{
    GlEntry entry("glUniform2i", {location, v0, v1});
}

SIM_API void glUniform2iv(GLint location, GLsizei count, const GLint* value)
{
    GlEntry entry("glUniform2iv", {location, count, (const void*)value});
}

SIM_API void glUniform3f(GLint location, GLfloat v0, GLfloat v1, GLfloat v2)
{
    GlEntry entry("glUniform3f", {location, v0, v1, v2});
}

SIM_API void glUniform3fv(GLint location, GLsizei count, const GLfloat* value)
{
    GlEntry entry("glUniform3fv", {location, count, (const void*)value});
}

SIM_API void glUniform3i(GLint location, GLint v0, GLint v1, GLint v2)
{
    GlEntry entry("glUniform3i", {location, v0, v1, v2});
}

SIM_API void glUniform3iv(GLint location, GLsizei count, const GLint* value)
{
    GlEntry entry("glUniform3iv", {location, count, (const void*)value});
}

SIM_API void glUniform4f(GLint location, GLfloat v0, GLfloat v1, GLfloat v2, GLfloat v3)
{
    GlEntry entry("glUniform4f", {location, v0, v1, v2, v3});
}

SIM_API void glUniform4fv(GLint location, GLsizei count, const GLfloat* value)
{
    GlEntry entry("glUniform4fv", {location, count, (const void*)value});
}

SIM_API void glUniform4i(GLint location, GLint v0, GLint v1, GLint v2, GLint v3)
{
    GlEntry entry("glUniform4i", {location, v0, v1, v2, v3});
}

SIM_API void glUniform4iv(GLint location, GLsizei count, const GLint* value)
{
    GlEntry entry("glUniform4iv", {location, count, (const void*)value});
}

SIM_API void glUniformMatrix2fv(GLint location, GLsizei count, GLboolean transpose,
                                const GLfloat* value)
{
    GlEntry entry("glUniformMatrix2fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix3fv(GLint location, GLsizei count, GLboolean transpose,
                                const GLfloat* value)
{
    GlEntry entry("glUniformMatrix3fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix4fv(GLint location, GLsizei count, GLboolean transpose,
                                const GLfloat* value)
{
    GlEntry entry("glUniformMatrix4fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUseProgram(GLuint program)
{
    GlEntry entry("glUseProgram", {program});
}

SIM_API void glValidateProgram(GLuint program)
{
    GlEntry entry("glValidateProgram", {program});
}

SIM_API void glVertexAttrib1f(GLuint index, GLfloat x)
{
    GlEntry entry("glVertexAttrib1f", {index, x});
}

SIM_API void glVertexAttrib1fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib1fv", {index, (const void*)v});
}

SIM_API void glVertexAttrib2f(GLuint index, GLfloat x, GLfloat y)
{
    GlEntry entry("glVertexAttrib2f", {index, x, y});
}

SIM_API void glVertexAttrib2fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib2fv", {index, (const void*)v});
}

SIM_API void glVertexAttrib3f(GLuint index, GLfloat x, GLfloat y, GLfloat z)
{
    GlEntry entry("glVertexAttrib3f", {index, x, y, z});
}

SIM_API void glVertexAttrib3fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib3fv", {index, (const void*)v});
}

SIM_API void glVertexAttrib4f(GLuint index, GLfloat x, GLfloat y, GLfloat z, GLfloat w)
{
    GlEntry entry("glVertexAttrib4f", {index, x, y, z, w});
}

SIM_API void glVertexAttrib4fv(GLuint index, const GLfloat* v)
{
    GlEntry entry("glVertexAttrib4fv", {index, (const void*)v});
}

SIM_API void glVertexAttribPointer(GLuint index, GLint size, GLenum type, GLboolean normalized,
                                   GLsizei stride, const void* pointer)
{
    GlEntry entry("glVertexAttribPointer",
                  {index, size, type, normalized, stride, (const void*)pointer});
}

SIM_API void glViewport(GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glViewport", {x, y, width, height});
}

SIM_API void glReadBuffer(GLenum src)
{
    GlEntry entry("glReadBuffer", {src});
}

SIM_API void glDrawRangeElements(GLenum mode, GLuint start, GLuint end, GLsizei count, GLenum type,
                                 const void* indices)
{
    GlEntry entry("glDrawRangeElements", {mode, start, end, count, type, (const void*)indices});
}

SIM_API void glTexImage3D(GLenum target, GLint level, GLint internalformat, GLsizei width,
                          GLsizei height, GLsizei depth, GLint border, GLenum format, GLenum type,
                          const void* pixels)
{
    GlEntry entry("glTexImage3D", {target, level, internalformat, width, height, depth, border,
                                   format, type, (const void*)pixels});
}

SIM_API void glTexSubImage3D(GLenum target, GLint level, GLint xoffset, GLint yoffset,
                             GLint zoffset, GLsizei width, GLsizei height, GLsizei depth,
                             GLenum format, GLenum type, const void* pixels)
{
    GlEntry entry("glTexSubImage3D", {target, level, xoffset, yoffset, zoffset, width, height,
                                      depth, format, type, (const void*)pixels});
}

SIM_API void glCopyTexSubImage3D(GLenum target, GLint level, GLint xoffset, GLint yoffset,
                                 GLint zoffset, GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glCopyTexSubImage3D",
                  {target, level, xoffset, yoffset, zoffset, x, y, width, height});
}

SIM_API void glCompressedTexImage3D(GLenum target, GLint level, GLenum internalformat,
                                    GLsizei width, GLsizei height, GLsizei depth, GLint border,
                                    GLsizei imageSize, const void* data)
{
    GlEntry entry("glCompressedTexImage3D", {target, level, internalformat, width, height, depth,
                                             border, imageSize, (const void*)data});
}

SIM_API void glCompressedTexSubImage3D(GLenum target, GLint level, GLint xoffset, GLint yoffset,
                                       GLint zoffset, GLsizei width, GLsizei height, GLsizei depth,
                                       GLenum format, GLsizei imageSize, const void* data)
{
    GlEntry entry("glCompressedTexSubImage3D",
                  {target, level, xoffset, yoffset, zoffset, width, height, depth, format,
                   imageSize, (const void*)data});
}

SIM_API void glGenQueries(GLsizei n, GLuint* ids)
{
    GlEntry entry("glGenQueries", {n, (const void*)ids});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        ids[i] = entry ? ++last : 0;
}

SIM_API void glDeleteQueries(GLsizei n, const GLuint* ids)
{
    GlEntry entry("glDeleteQueries", {n, (const void*)ids});
}

SIM_API GLboolean glIsQuery(GLuint id)
{
    GlEntry entry("glIsQuery", {id});
    return {};
}

SIM_API void glBeginQuery(GLenum target, GLuint id)
{
    GlEntry entry("glBeginQuery", {target, id});
}

SIM_API void glEndQuery(GLenum target)
{
    GlEntry entry("glEndQuery", {target});
}

SIM_API void glGetQueryiv(GLenum target, GLenum pname, GLint* params)
{
    GlEntry entry("glGetQueryiv", {target, pname, (const void*)params});
}

SIM_API void glGetQueryObjectuiv(GLuint id, GLenum pname, GLuint* params)
{
    GlEntry entry("glGetQueryObjectuiv", {id, pname, (const void*)params});
}

SIM_API GLboolean glUnmapBuffer(GLenum target)
{
    GlEntry entry("glUnmapBuffer", {target});
    return {};
}

SIM_API void glGetBufferPointerv(GLenum target, GLenum pname, void** params)
{
    GlEntry entry("glGetBufferPointerv", {target, pname, (const void*)params});
}

SIM_API void glDrawBuffers(GLsizei n, const GLenum* bufs)
{
    GlEntry entry("glDrawBuffers", {n, (const void*)bufs});
}

SIM_API void glUniformMatrix2x3fv(GLint location, GLsizei count, GLboolean transpose,
                                  const GLfloat* value)
{
    GlEntry entry("glUniformMatrix2x3fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix3x2fv(GLint location, GLsizei count, GLboolean transpose,
                                  const GLfloat* value)
{
    GlEntry entry("glUniformMatrix3x2fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix2x4fv(GLint location, GLsizei count, GLboolean transpose,
                                  const GLfloat* value)
{
    GlEntry entry("glUniformMatrix2x4fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix4x2fv(GLint location, GLsizei count, GLboolean transpose,
                                  const GLfloat* value)
{
    GlEntry entry("glUniformMatrix4x2fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix3x4fv(GLint location, GLsizei count, GLboolean transpose,
                                  const GLfloat* value)
{
    GlEntry entry("glUniformMatrix3x4fv", {location, count, transpose, (const void*)value});
}

SIM_API void glUniformMatrix4x3fv(GLint location, GLsizei count, GLboolean transpose,
                                  const GLfloat* value)
{
    GlEntry entry("glUniformMatrix4x3fv", {location, count, transpose, (const void*)value});
}

SIM_API void glBlitFramebuffer(GLint srcX0, GLint srcY0, GLint srcX1, GLint srcY1, GLint dstX0,
                               GLint dstY0, GLint dstX1, GLint dstY1, GLbitfield mask,
                               GLenum filter)
{
    GlEntry entry("glBlitFramebuffer",
                  {srcX0, srcY0, srcX1, srcY1, dstX0, dstY0, dstX1, dstY1, mask, filter});
}

SIM_API void glRenderbufferStorageMultisample(GLenum target, GLsizei samples, GLenum internalformat,
                                              GLsizei width, GLsizei height)
{
    GlEntry entry("glRenderbufferStorageMultisample",
                  {target, samples, internalformat, width, height});
}

SIM_API void glFramebufferTextureLayer(GLenum target, GLenum attachment, GLuint texture,
                                       GLint level, GLint layer)
{
    GlEntry entry("glFramebufferTextureLayer", {target, attachment, texture, level, layer});
}

SIM_API void* glMapBufferRange(GLenum target, GLintptr offset, GLsizeiptr length, GLbitfield access)
{
    GlEntry entry("glMapBufferRange", {target, offset, length, access});
    return {};
}

SIM_API void glFlushMappedBufferRange(GLenum target, GLintptr offset, GLsizeiptr length)
{
    GlEntry entry("glFlushMappedBufferRange", {target, offset, length});
}

SIM_API void glBindVertexArray(GLuint array)
{
    GlEntry entry("glBindVertexArray", {array});
}

SIM_API void glDeleteVertexArrays(GLsizei n, const GLuint* arrays)
{
    GlEntry entry("glDeleteVertexArrays", {n, (const void*)arrays});
}

SIM_API void glGenVertexArrays(GLsizei n, GLuint* arrays)
{
    GlEntry entry("glGenVertexArrays", {n, (const void*)arrays});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        arrays[i] = entry ? ++last : 0;
}

SIM_API GLboolean glIsVertexArray(GLuint array)
{
    GlEntry entry("glIsVertexArray", {array});
    return {};
}

SIM_API void glGetIntegeri_v(GLenum target, GLuint index, GLint* data)
{
    GlEntry entry("glGetIntegeri_v", {target, index, (const void*)data});
}

SIM_API void glBeginTransformFeedback(GLenum primitiveMode)
{
    GlEntry entry("glBeginTransformFeedback", {primitiveMode});
}

SIM_API void glEndTransformFeedback(void)
{
    GlEntry entry("glEndTransformFeedback", {});
}

SIM_API void glBindBufferRange(GLenum target, GLuint index, GLuint buffer, GLintptr offset,
                               GLsizeiptr size)
{
    GlEntry entry("glBindBufferRange", {target, index, buffer, offset, size});
}

SIM_API void glBindBufferBase(GLenum target, GLuint index, GLuint buffer)
{
    GlEntry entry("glBindBufferBase", {target, index, buffer});
}

SIM_API void glTransformFeedbackVaryings(GLuint program, GLsizei count,
                                         const GLchar* const* varyings, GLenum bufferMode)
{
    GlEntry entry("glTransformFeedbackVaryings",
                  {program, count, (const void*)varyings, bufferMode});
}

SIM_API void glGetTransformFeedbackVarying(GLuint program, GLuint index, GLsizei bufSize,
                                           GLsizei* length, GLsizei* size, GLenum* type,
                                           GLchar* name)
{
    GlEntry entry("glGetTransformFeedbackVarying",
                  {program, index, bufSize, (const void*)length, (const void*)size,
                   (const void*)type, (const void*)name});
}

SIM_API void glVertexAttribIPointer(GLuint index, GLint size, GLenum type, GLsizei stride,
                                    const void* pointer)
{
    GlEntry entry("glVertexAttribIPointer", {index, size, type, stride, (const void*)pointer});
}

SIM_API void glGetVertexAttribIiv(GLuint index, GLenum pname, GLint* params)
{
    GlEntry entry("glGetVertexAttribIiv", {index, pname, (const void*)params});
}

SIM_API void glGetVertexAttribIuiv(GLuint index, GLenum pname, GLuint* params)
{
    GlEntry entry("glGetVertexAttribIuiv", {index, pname, (const void*)params});
}

SIM_API void glVertexAttribI4i(GLuint index, GLint x, GLint y, GLint z, GLint w)
{
    GlEntry entry("glVertexAttribI4i", {index, x, y, z, w});
}

SIM_API void glVertexAttribI4ui(GLuint index, GLuint x, GLuint y, GLuint z, GLuint w)
{
    GlEntry entry("glVertexAttribI4ui", {index, x, y, z, w});
}

SIM_API void glVertexAttribI4iv(GLuint index, const GLint* v)
{
    GlEntry entry("glVertexAttribI4iv", {index, (const void*)v});
}

SIM_API void glVertexAttribI4uiv(GLuint index, const GLuint* v)
{
    GlEntry entry("glVertexAttribI4uiv", {index, (const void*)v});
}

SIM_API void glGetUniformuiv(GLuint program, GLint location, GLuint* params)
{
    GlEntry entry("glGetUniformuiv", {program, location, (const void*)params});
}

SIM_API GLint glGetFragDataLocation(GLuint program, const GLchar* name)
{
    GlEntry entry("glGetFragDataLocation", {program, name});
    return {};
}

SIM_API void glUniform1ui(GLint location, GLuint v0)
{
    GlEntry entry("glUniform1ui", {location, v0});
}

SIM_API void glUniform2ui(GLint location, GLuint v0, GLuint v1)
{
    GlEntry entry("glUniform2ui", {location, v0, v1});
}

SIM_API void glUniform3ui(GLint location, GLuint v0, GLuint v1, GLuint v2)
{
    GlEntry entry("glUniform3ui", {location, v0, v1, v2});
}

SIM_API void glUniform4ui(GLint location, GLuint v0, GLuint v1, GLuint v2, GLuint v3)
{
    GlEntry entry("glUniform4ui", {location, v0, v1, v2, v3});
}

SIM_API void glUniform1uiv(GLint location, GLsizei count, const GLuint* value)
{
    GlEntry entry("glUniform1uiv", {location, count, (const void*)value});
}

SIM_API void glUniform2uiv(GLint location, GLsizei count, const GLuint* value)
{
    GlEntry entry("glUniform2uiv", {location, count, (const void*)value});
}

SIM_API void glUniform3uiv(GLint location, GLsizei count, const GLuint* value)
{
    GlEntry entry("glUniform3uiv", {location, count, (const void*)value});
}

SIM_API void glUniform4uiv(GLint location, GLsizei count, const GLuint* value)
{
    GlEntry entry("glUniform4uiv", {location, count, (const void*)value});
}

SIM_API void glClearBufferiv(GLenum buffer, GLint drawbuffer, const GLint* value)
{
    GlEntry entry("glClearBufferiv", {buffer, drawbuffer, (const void*)value});
}

SIM_API void glClearBufferuiv(GLenum buffer, GLint drawbuffer, const GLuint* value)
{
    GlEntry entry("glClearBufferuiv", {buffer, drawbuffer, (const void*)value});
}

SIM_API void glClearBufferfv(GLenum buffer, GLint drawbuffer, const GLfloat* value)
{
    GlEntry entry("glClearBufferfv", {buffer, drawbuffer, (const void*)value});
}

SIM_API void glClearBufferfi(GLenum buffer, GLint drawbuffer, GLfloat depth, GLint stencil)
{
    GlEntry entry("glClearBufferfi", {buffer, drawbuffer, depth, stencil});
}

SIM_API void glCopyBufferSubData(GLenum readTarget, GLenum writeTarget, GLintptr readOffset,
                                 GLintptr writeOffset, GLsizeiptr size)
{
    GlEntry entry("glCopyBufferSubData", {readTarget, writeTarget, readOffset, writeOffset, size});
}

SIM_API void glGetUniformIndices(GLuint program, GLsizei uniformCount,
                                 const GLchar* const* uniformNames, GLuint* uniformIndices)
{
    GlEntry entry("glGetUniformIndices",
                  {program, uniformCount, (const void*)uniformNames, (const void*)uniformIndices});
}

SIM_API void glGetActiveUniformsiv(GLuint program, GLsizei uniformCount,
                                   const GLuint* uniformIndices, GLenum pname, GLint* params)
{
    GlEntry entry("glGetActiveUniformsiv",
                  {program, uniformCount, (const void*)uniformIndices, pname, (const void*)params});
}

SIM_API GLuint glGetUniformBlockIndex(GLuint program, const GLchar* uniformBlockName)
{
    GlEntry entry("glGetUniformBlockIndex", {program, (const void*)uniformBlockName});
    return {};
}

SIM_API void glGetActiveUniformBlockiv(GLuint program, GLuint uniformBlockIndex, GLenum pname,
                                       GLint* params)
{
    GlEntry entry("glGetActiveUniformBlockiv",
                  {program, uniformBlockIndex, pname, (const void*)params});
}

SIM_API void glGetActiveUniformBlockName(GLuint program, GLuint uniformBlockIndex, GLsizei bufSize,
                                         GLsizei* length, GLchar* uniformBlockName)
{
    GlEntry entry(
        "glGetActiveUniformBlockName",
        {program, uniformBlockIndex, bufSize, (const void*)length, (const void*)uniformBlockName});
}

SIM_API void glUniformBlockBinding(GLuint program, GLuint uniformBlockIndex,
                                   GLuint uniformBlockBinding)
{
    GlEntry entry("glUniformBlockBinding", {program, uniformBlockIndex, uniformBlockBinding});
}

SIM_API void glDrawArraysInstanced(GLenum mode, GLint first, GLsizei count, GLsizei instancecount)
{
    GlEntry entry("glDrawArraysInstanced", {mode, first, count, instancecount});
}

SIM_API void glDrawElementsInstanced(GLenum mode, GLsizei count, GLenum type, const void* indices,
                                     GLsizei instancecount)
{
    GlEntry entry("glDrawElementsInstanced",
                  {mode, count, type, (const void*)indices, instancecount});
}

SIM_API GLsync glFenceSync(GLenum condition, GLbitfield flags)
{
    GlEntry entry("glFenceSync", {condition, flags});
    return {};
}

SIM_API GLboolean glIsSync(GLsync sync)
{
    GlEntry entry("glIsSync", {sync});
    return {};
}

SIM_API void glDeleteSync(GLsync sync)
{
    GlEntry entry("glDeleteSync", {sync});
}

SIM_API GLenum glClientWaitSync(GLsync sync, GLbitfield flags, GLuint64 timeout)
{
    GlEntry entry("glClientWaitSync", {sync, flags, timeout});
    return {};
}

SIM_API void glWaitSync(GLsync sync, GLbitfield flags, GLuint64 timeout)
{
    GlEntry entry("glWaitSync", {sync, flags, timeout});
}

SIM_API void glGetSynciv(GLsync sync, GLenum pname, GLsizei count, GLsizei* length, GLint* values)
{
    GlEntry entry("glGetSynciv", {sync, pname, count, (const void*)length, (const void*)values});
}

SIM_API void glGetInteger64i_v(GLenum target, GLuint index, GLint64* data)
{
    GlEntry entry("glGetInteger64i_v", {target, index, (const void*)data});
}

SIM_API void glGetBufferParameteri64v(GLenum target, GLenum pname, GLint64* params)
{
    GlEntry entry("glGetBufferParameteri64v", {target, pname, (const void*)params});
}

SIM_API void glGenSamplers(GLsizei count, GLuint* samplers)
{
    GlEntry entry("glGenSamplers", {count, (const void*)samplers});
    static GLuint last = 0;
    for (GLsizei i = 0; i < count; ++i)
        samplers[i] = entry ? ++last : 0;
}

SIM_API void glDeleteSamplers(GLsizei count, const GLuint* samplers)
{
    GlEntry entry("glDeleteSamplers", {count, (const void*)samplers});
}

SIM_API GLboolean glIsSampler(GLuint sampler)
{
    GlEntry entry("glIsSampler", {sampler});
    return {};
}

SIM_API void glBindSampler(GLuint unit, GLuint sampler)
{
    GlEntry entry("glBindSampler", {unit, sampler});
}

SIM_API void glSamplerParameteri(GLuint sampler, GLenum pname, GLint param)
{
    GlEntry entry("glSamplerParameteri", {sampler, pname, param});
}

SIM_API void glSamplerParameteriv(GLuint sampler, GLenum pname, const GLint* param)
{
    GlEntry entry("glSamplerParameteriv", {sampler, pname, (const void*)param});
}

SIM_API void glSamplerParameterf(GLuint sampler, GLenum pname, GLfloat param)
{
    GlEntry entry("glSamplerParameterf", {sampler, pname, param});
}

SIM_API void glSamplerParameterfv(GLuint sampler, GLenum pname, const GLfloat* param)
{
    GlEntry entry("glSamplerParameterfv", {sampler, pname, (const void*)param});
}

SIM_API void glGetSamplerParameteriv(GLuint sampler, GLenum pname, GLint* params)
{
    GlEntry entry("glGetSamplerParameteriv", {sampler, pname, (const void*)params});
}

SIM_API void glGetSamplerParameterfv(GLuint sampler, GLenum pname, GLfloat* params)
{
    GlEntry entry("glGetSamplerParameterfv", {sampler, pname, (const void*)params});
}

SIM_API void glVertexAttribDivisor(GLuint index, GLuint divisor)
{
    GlEntry entry("glVertexAttribDivisor", {index, divisor});
}

SIM_API void glBindTransformFeedback(GLenum target, GLuint id)
{
    GlEntry entry("glBindTransformFeedback", {target, id});
}

SIM_API void glDeleteTransformFeedbacks(GLsizei n, const GLuint* ids)
{
    GlEntry entry("glDeleteTransformFeedbacks", {n, (const void*)ids});
}

SIM_API void glGenTransformFeedbacks(GLsizei n, GLuint* ids)
{
    GlEntry entry("glGenTransformFeedbacks", {n, (const void*)ids});
    static GLuint last = 0;
    for (GLsizei i = 0; i < n; ++i)
        ids[i] = entry ? ++last : 0;
}

SIM_API GLboolean glIsTransformFeedback(GLuint id)
{
    GlEntry entry("glIsTransformFeedback", {id});
    return {};
}

SIM_API void glPauseTransformFeedback(void)
{
    GlEntry entry("glPauseTransformFeedback", {});
}

SIM_API void glResumeTransformFeedback(void)
{
    GlEntry entry("glResumeTransformFeedback", {});
}

SIM_API void glGetProgramBinary(GLuint program, GLsizei bufSize, GLsizei* length,
                                GLenum* binaryFormat, void* binary)
{
    GlEntry entry("glGetProgramBinary", {program, bufSize, (const void*)length,
                                         (const void*)binaryFormat, (const void*)binary});
}

SIM_API void glProgramBinary(GLuint program, GLenum binaryFormat, const void* binary,
                             GLsizei length)
{
    GlEntry entry("glProgramBinary", {program, binaryFormat, (const void*)binary, length});
}

SIM_API void glProgramParameteri(GLuint program, GLenum pname, GLint value)
{
    GlEntry entry("glProgramParameteri", {program, pname, value});
}

SIM_API void glInvalidateFramebuffer(GLenum target, GLsizei numAttachments,
                                     const GLenum* attachments)
{
    GlEntry entry("glInvalidateFramebuffer", {target, numAttachments, (const void*)attachments});
}

SIM_API void glInvalidateSubFramebuffer(GLenum target, GLsizei numAttachments,
                                        const GLenum* attachments, GLint x, GLint y, GLsizei width,
                                        GLsizei height)
{
    GlEntry entry("glInvalidateSubFramebuffer",
                  {target, numAttachments, (const void*)attachments, x, y, width, height});
}

SIM_API void glTexStorage2D(GLenum target, GLsizei levels, GLenum internalformat, GLsizei width,
                            GLsizei height)
{
    GlEntry entry("glTexStorage2D", {target, levels, internalformat, width, height});
}

SIM_API void glTexStorage3D(GLenum target, GLsizei levels, GLenum internalformat, GLsizei width,
                            GLsizei height, GLsizei depth)
{
    GlEntry entry("glTexStorage3D", {target, levels, internalformat, width, height, depth});
}

SIM_API void glGetInternalformativ(GLenum target, GLenum internalformat, GLenum pname,
                                   GLsizei count, GLint* params)
{
    GlEntry entry("glGetInternalformativ",
                  {target, internalformat, pname, count, (const void*)params});
}

namespace Sim
{
bool IsCapability(GLenum)
{
    return false;
}
VertexArray& CurrentVertexArray(GlState& gl)
{
    return gl.defaultVertexArray;
}
const VertexArray& CurrentVertexArray(const GlState& gl)
{
    return gl.defaultVertexArray;
}
void FlushContext(Context&) {}
} // namespace Sim
