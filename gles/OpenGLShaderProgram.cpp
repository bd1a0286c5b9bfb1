#include "gles/OpenGLShaderProgram.h"

#include "gles/AttributeScanner.h"
#include "gles/CacheFileNames.h"
#include "gles/ParameterBindingImpl.h"
#include "gles/Throw.h"
#include "gles/UniformName.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"

#include <nib/exceptions.h>
#include <nib/trace.h>

#include <algorithm>

namespace Nib
{

IShaderProgram::~IShaderProgram() = default;

} // namespace Nib

namespace Nib::GLES
{

namespace
{

constexpr GLsizei kInfoLogSize = 1024;
constexpr GLsizei kOneString = 1;

// Desktop GL's; drivers that also serve that may report them.
constexpr GLenum kSampler1D = 0x8B5D;
constexpr GLenum kSampler1DShadow = 0x8B61;

// What the driver has to say about a shader or a program; longer texts are cut.
struct InfoLog
{
    template <typename Getter>
    InfoLog(Getter getter, GLuint name)
    {
        getter(name, kInfoLogSize, nullptr, text);
    }

    char text[kInfoLogSize] = {};
};

bool Compile(GLuint shader, const char* source)
{
    glShaderSource(shader, kOneString, &source, nullptr);
    glCompileShader(shader);
    GLint status = GL_FALSE;
    glGetShaderiv(shader, GL_COMPILE_STATUS, &status);
    return status == GL_TRUE;
}

GLint LinkStatus(GLuint program)
{
    GLint status = GL_FALSE;
    glGetProgramiv(program, GL_LINK_STATUS, &status);
    return status;
}

// Attribute i of the list gets location i.
void BindAttributes(GLuint program, const std::vector<std::string>& attributes)
{
    for (std::size_t i = 0; i < attributes.size(); ++i)
        glBindAttribLocation(program, static_cast<GLuint>(i), attributes[i].c_str());
}

} // namespace

// ---- life ---------------------------------------------------------------------------------------

OpenGLShaderProgram::OpenGLShaderProgram(const char* vs, const char* fs)
{
    CreateShader(vs, fs);
}

OpenGLShaderProgram::~OpenGLShaderProgram()
{
    Unregister();
    glDeleteProgram(m_program);
}

void OpenGLShaderProgram::CreateShader(const char* vs, const char* fs)
{
    m_vertexSource = vs;
    m_fragmentSource = fs;
    createShader();
    Register();
}

void OpenGLShaderProgram::Release()
{
    delete this;
}

void OpenGLShaderProgram::ReleaseGLObject()
{
    glDeleteProgram(m_program);
    m_program = kNotCreated;
}

void OpenGLShaderProgram::RestoreGLObject()
{
    createShader();
}

// ---- use ----------------------------------------------------------------------------------------

void OpenGLShaderProgram::Activate()
{
    NIB_FUNCTION("virtual void Nib::GLES::OpenGLShaderProgram::Activate()");
    if (m_program == kNotCreated)
    {
        NIB_LOG_WARN("%s - Warning shader was not created, m_Shader: %d, this: %p", function,
                     static_cast<int>(m_program), static_cast<void*>(this));
        createShader();
    }
    glUseProgram(m_program);
}

void OpenGLShaderProgram::Deactivate()
{
    glUseProgram(0);
}

void OpenGLShaderProgram::PreDraw() {}

void OpenGLShaderProgram::activateUniform(const char* name, unsigned int value) const
{
    glUniform1i(glGetUniformLocation(m_program, name), static_cast<GLint>(value));
}

// ---- building -----------------------------------------------------------------------------------

void OpenGLShaderProgram::createShader()
{
    NIB_FUNCTION("void Nib::GLES::OpenGLShaderProgram::createShader()");
    // 0 for a program that holds a binary: when that is refused, the new one is stored under 0, and
    // the next build, which holds none, replaces the refused one.
    ShaderProgramCache::BinaryShaderKey key = 0;
    std::shared_ptr<const BinaryShader> binary = HeldBinary();
    if (!binary)
    {
        key = ShaderProgramCache::GetShaderKey(m_vertexSource, m_fragmentSource);
        binary = ShaderProgramCache::GetInstance()->HoldBinaryShader(key);
        m_cachedBinary = binary;
    }
    if (binary)
    {
        NIB_LOG_INFO("%s - Binary shader exists in cache", function);
        if (LoadFromBinary(binary.get()))
            return Label();
        NIB_LOG_ERROR("%s - cached binary shader is not valid. Need to recreate it in cache",
                      function);
        m_cachedBinary.reset();
        binary.reset();
    }
    std::vector<std::string> attributes;
    createShaderFromSource(attributes);
    SaveToCache(key, attributes);
    Label();
}

/// For a GL debugger: the program's file in the cache.
void OpenGLShaderProgram::Label() const
{
    if (!GlDebugOutput::IsOn())
        return;
    const auto key = ShaderProgramCache::GetShaderKey(m_vertexSource, m_fragmentSource);
    GlDebugOutput::Label(GL_PROGRAM_KHR, m_program, ShaderFileName(key).c_str());
}

// The binary that an earlier build found, unless the cache has replaced it since.
std::shared_ptr<const ShaderProgramCache::BinaryShader> OpenGLShaderProgram::HeldBinary() const
{
    std::shared_ptr<const BinaryShader> binary = m_cachedBinary.lock();
    if (binary && !ShaderProgramCache::GetInstance()->IsCurrent(binary.get()))
        binary.reset();
    return binary;
}

bool OpenGLShaderProgram::LoadFromBinary(const BinaryShader* binary)
{
    const TraceScope trace("program", "load program", {{"bytes", binary->length}});
    const GLuint program = glCreateProgram();
    glProgramBinary(program, binary->format, binary->bytes, binary->length);
    if (LinkStatus(program) == GL_FALSE)
        return false; // the name stays allocated until the context goes
    BindAttributes(program, binary->attributes);
    m_program = program;
    return true;
}

void OpenGLShaderProgram::createShaderFromSource(std::vector<std::string>& attributes)
{
    const TraceScope trace("program", "compile program");
    if (!m_vertexSource || !m_fragmentSource)
        Throw<InvalidArgumentException>(
            "OpenGLRenderer::createShader: no shader source code provided.");

    const GLuint vertex = glCreateShader(GL_VERTEX_SHADER);
    if (!Compile(vertex, m_vertexSource))
    {
        const InfoLog log(glGetShaderInfoLog, vertex);
        NIB_LOG_INFO("VS error = %s", log.text);
        glDeleteShader(vertex);
        Throw<InvalidArgumentException>(
            std::string("OpenGLRenderer::createShader: failed to compile vertex shader.\n"
                        "Details:\n") +
            log.text);
    }

    const GLuint fragment = glCreateShader(GL_FRAGMENT_SHADER);
    if (!Compile(fragment, m_fragmentSource))
    {
        const InfoLog log(glGetShaderInfoLog, fragment);
        NIB_LOG_INFO("FS error = %s", log.text);
        glDeleteShader(vertex);
        glDeleteShader(fragment);
        Throw<InvalidArgumentException>(
            std::string("OpenGLRenderer::createShader: failed to compile fragment shader.\n"
                        "Details:\n") +
            log.text);
    }
    LinkShaders(vertex, fragment, attributes);
}

// Links both into a new program; they are deleted in either case.
void OpenGLShaderProgram::LinkShaders(GLuint vertex, GLuint fragment,
                                      std::vector<std::string>& attributes)
{
    const GLuint program = glCreateProgram();
    glAttachShader(program, vertex);
    glAttachShader(program, fragment);
    parseShaderFromSource(attributes);
    BindAttributes(program, attributes);
    glLinkProgram(program);
    if (LinkStatus(program) != GL_TRUE)
    {
        const InfoLog log(glGetProgramInfoLog, program);
        glDeleteShader(vertex);
        glDeleteShader(fragment);
        glDeleteProgram(program);
        Throw<InvalidArgumentException>(
            std::string("OpenGLRenderer::createShader: failed to link program.\nDetails:\n") +
            log.text);
    }
    m_program = program;
    glDetachShader(program, vertex);
    glDetachShader(program, fragment);
    glDeleteShader(vertex);
    glDeleteShader(fragment);
}

void OpenGLShaderProgram::parseShaderFromSource(std::vector<std::string>& attributes) const
{
    GLint limit = 0; // asked for, but not a limit here: the driver refuses what is too many
    glGetIntegerv(GL_MAX_VERTEX_ATTRIBS, &limit);

    AttributeScanner scanner(m_vertexSource);
    for (std::string_view name = scanner.Next(); !name.empty(); name = scanner.Next())
    {
        attributes.emplace_back(name);
        NIB_LOG_INFO("attribute = %s", attributes.back().c_str());
    }
}

bool OpenGLShaderProgram::SaveToCache(ShaderProgramCache::BinaryShaderKey key,
                                      const std::vector<std::string>& attributes) const
{
    NIB_FUNCTION("bool Nib::GLES::OpenGLShaderProgram::SaveToCache("
                 "ShaderProgramCache::BinaryShaderKey, const std::vector<std::string> &)");
    const TraceScope trace("program", "save program");
    BinaryShader record;
    record.key = key;
    record.attributes = attributes;
    glGetProgramiv(m_program, GL_PROGRAM_BINARY_LENGTH, &record.length);
    record.bytes = new unsigned char[static_cast<std::size_t>(std::max(record.length, 0))]();
    glGetProgramBinary(m_program, record.length, nullptr, &record.format, record.bytes);
    if (ShaderProgramCache::GetInstance()->SetBinaryShader(record))
        return true;
    NIB_LOG_ERROR("%s - Failed to store sghader into cache", function);
    return false;
}

// ---- bindings -----------------------------------------------------------------------------------

BindingType OpenGLShaderProgram::convertGLBindingType(GLenum type)
{
    switch (type)
    {
    case GL_BOOL: return BindingType::Bool;
    case GL_FLOAT_MAT4: return BindingType::Matrix4;
    case GL_FLOAT_VEC2: return BindingType::Vector2;
    case GL_FLOAT_VEC3: return BindingType::Vector3;
    case GL_FLOAT_VEC4: return BindingType::Vector4;
    case GL_FLOAT: return BindingType::Float;
    case GL_INT: return BindingType::Int;
    case kSampler1D:
    case GL_SAMPLER_2D:
    case GL_SAMPLER_3D:
    case GL_SAMPLER_CUBE:
    case kSampler1DShadow:
    case GL_SAMPLER_2D_SHADOW:
    case GL_SAMPLER_2D_ARRAY: return BindingType::Sampler;
    default: return BindingType::Undefined;
    }
}

IParameterBinding* OpenGLShaderProgram::GetBindingIntf(const char* name)
{
    BindingType type = BindingType::Undefined;
    const bool active = FindActiveUniform(name, &type);
    GLint location =
        active ? glGetUniformLocation(m_program, name) : ParameterBindingImpl::kNoLocation;
    if (location < 0)
    {
        const auto block = static_cast<GLint>(glGetUniformBlockIndex(m_program, name));
        if (block >= 0)
        {
            type = BindingType::UniformBlock;
            location = block;
        }
        else if (active)
        {
            Throw<InvalidArgumentException>(
                std::string("OpenGLShaderProgram::GetBindingIntf: failed to find uniform with "
                            "given name(") +
                name + ")");
        }
    }
    auto* const binding = new ParameterBindingImpl(type, this);
    binding->SetLocation(location, active);
    return binding;
}

// Whether @p name is an active uniform, or an element of one; if so, what it is bound as.
bool OpenGLShaderProgram::FindActiveUniform(const char* name, BindingType* bindingType) const
{
    constexpr GLsizei kBufferSize = 63; // with the NUL: longer names are not found
    const UniformName request(name);
    GLint count = 0;
    glGetProgramiv(m_program, GL_ACTIVE_UNIFORMS, &count);
    for (GLint i = 0; i < count; ++i)
    {
        char active[kBufferSize] = {};
        GLsizei length = 0;
        GLint size = 0;
        GLenum type = 0;
        glGetActiveUniform(m_program, static_cast<GLuint>(i), kBufferSize, &length, &size, &type,
                           active);
        if (request.Matches(active, size))
        {
            *bindingType = convertGLBindingType(type);
            return true;
        }
    }
    return false;
}

} // namespace Nib::GLES
