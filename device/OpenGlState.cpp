#include <nib/device.h>

#include <GLES3/gl3.h>

namespace Nib
{

namespace
{

GLint GetInteger(GLenum name)
{
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

bool GetBoolean(GLenum name)
{
    GLboolean value = GL_FALSE;
    glGetBooleanv(name, &value);
    return value != GL_FALSE;
}

GLint GetVertexAttribute(GLuint index, GLenum name)
{
    GLint value = 0;
    glGetVertexAttribiv(index, name, &value);
    return value;
}

void Switch(GLenum capability, bool on)
{
    if (on)
        glEnable(capability);
    else
        glDisable(capability);
}

} // namespace

void OpenGLRenderer::OpenGlState::store()
{
    reportAndResetAllGLErrors("OpenGlState::store()");
    m_stored = true;
    StoreBindings();
    StoreTextureUnits();
    StoreVertexAttributes();
}

void OpenGLRenderer::OpenGlState::StoreBindings()
{
    m_program = GetInteger(GL_CURRENT_PROGRAM);
    m_arrayBuffer = GetInteger(GL_ARRAY_BUFFER_BINDING);
    m_activeTexture = GetInteger(GL_ACTIVE_TEXTURE);
    m_blend = GetBoolean(GL_BLEND);
    m_depthTest = GetBoolean(GL_DEPTH_TEST);
    m_depthWriteMask = GetBoolean(GL_DEPTH_WRITEMASK);
    m_cullFace = GetBoolean(GL_CULL_FACE);
    m_scissorTest = GetBoolean(GL_SCISSOR_TEST);
    m_stencilTest = GetBoolean(GL_STENCIL_TEST);
    m_blendSrcAlpha = GetInteger(GL_BLEND_SRC_ALPHA);
    m_blendDstAlpha = GetInteger(GL_BLEND_DST_ALPHA);
    m_renderbuffer = GetInteger(GL_RENDERBUFFER_BINDING);
    m_framebuffer = GetInteger(GL_FRAMEBUFFER_BINDING);
    glGetIntegerv(GL_VIEWPORT, m_viewport);
    glGetIntegerv(GL_SCISSOR_BOX, m_scissorBox);
    m_elementArrayBuffer = GetInteger(GL_ELEMENT_ARRAY_BUFFER_BINDING);
}

void OpenGLRenderer::OpenGlState::StoreTextureUnits()
{
    const bool samplers = isSupportSampler();
    for (int unit = 0; unit < kTextureUnits; ++unit)
    {
        glActiveTexture(GL_TEXTURE0 + static_cast<GLenum>(unit));
        m_texture2D[unit] = GetInteger(GL_TEXTURE_BINDING_2D);
        if (samplers)
            m_sampler[unit] = GetInteger(GL_SAMPLER_BINDING);
    }
}

void OpenGLRenderer::OpenGlState::StoreVertexAttributes()
{
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    for (int i = 0; i < kVertexAttributes; ++i)
    {
        const GLuint index = static_cast<GLuint>(i);
        m_attributeEnabled[i] = GetVertexAttribute(index, GL_VERTEX_ATTRIB_ARRAY_ENABLED);
        m_attributeBuffer[i] = GetVertexAttribute(index, GL_VERTEX_ATTRIB_ARRAY_BUFFER_BINDING);
        m_attributeSize[i] = GetVertexAttribute(index, GL_VERTEX_ATTRIB_ARRAY_SIZE);
        m_attributeType[i] = GetVertexAttribute(index, GL_VERTEX_ATTRIB_ARRAY_TYPE);
        m_attributeNormalized[i] = GetVertexAttribute(index, GL_VERTEX_ATTRIB_ARRAY_NORMALIZED);
        m_attributeStride[i] = GetVertexAttribute(index, GL_VERTEX_ATTRIB_ARRAY_STRIDE);
        glGetVertexAttribPointerv(index, GL_VERTEX_ATTRIB_ARRAY_POINTER, &m_attributePointer[i]);
    }
}

void OpenGLRenderer::OpenGlState::restore()
{
    if (!m_stored)
        return;
    RestoreTextureUnits();
    RestoreVertexAttributes();
    glUseProgram(static_cast<GLuint>(m_program));
    glActiveTexture(static_cast<GLenum>(m_activeTexture));
    RestoreSwitches();
    RestoreBindings();
    reportAndResetAllGLErrors("OpenGlState::restore()");
}

void OpenGLRenderer::OpenGlState::RestoreTextureUnits() const
{
    const bool samplers = isSupportSampler();
    for (int i = 0; i < kTextureUnits; ++i)
    {
        const GLuint unit = static_cast<GLuint>(i);
        const GLuint texture = static_cast<GLuint>(m_texture2D[i]);
        glActiveTexture(GL_TEXTURE0 + unit);
        const bool alive = glIsTexture(texture) != GL_FALSE;
        glBindTexture(GL_TEXTURE_2D, alive ? texture : 0);
        if (samplers)
            glBindSampler(unit, alive ? static_cast<GLuint>(m_sampler[i]) : 0);
    }
}

void OpenGLRenderer::OpenGlState::RestoreVertexAttributes() const
{
    for (int i = 0; i < kVertexAttributes; ++i)
    {
        const GLuint index = static_cast<GLuint>(i);
        if (m_attributeEnabled[i] != 0)
            glEnableVertexAttribArray(index);
        else
            glDisableVertexAttribArray(index);
        glBindBuffer(GL_ARRAY_BUFFER, static_cast<GLuint>(m_attributeBuffer[i]));
        glVertexAttribPointer(index, m_attributeSize[i], static_cast<GLenum>(m_attributeType[i]),
                              static_cast<GLboolean>(m_attributeNormalized[i] != 0),
                              m_attributeStride[i], m_attributePointer[i]);
    }
}

void OpenGLRenderer::OpenGlState::RestoreSwitches() const
{
    Switch(GL_BLEND, m_blend);
    Switch(GL_DEPTH_TEST, m_depthTest);
    Switch(GL_CULL_FACE, m_cullFace);
    Switch(GL_SCISSOR_TEST, m_scissorTest);
    Switch(GL_STENCIL_TEST, m_stencilTest);
    glBlendFunc(static_cast<GLenum>(m_blendSrcAlpha), static_cast<GLenum>(m_blendDstAlpha));
}

void OpenGLRenderer::OpenGlState::RestoreBindings() const
{
    glBindRenderbuffer(GL_RENDERBUFFER, static_cast<GLuint>(m_renderbuffer));
    glBindFramebuffer(GL_FRAMEBUFFER, static_cast<GLuint>(m_framebuffer));
    glBindBuffer(GL_ARRAY_BUFFER, static_cast<GLuint>(m_arrayBuffer));
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, static_cast<GLuint>(m_elementArrayBuffer));
    glViewport(m_viewport[0], m_viewport[1], m_viewport[2], m_viewport[3]);
    glScissor(m_scissorBox[0], m_scissorBox[1], m_scissorBox[2], m_scissorBox[3]);
    glDepthMask(m_depthWriteMask ? GL_TRUE : GL_FALSE);
}

} // namespace Nib
