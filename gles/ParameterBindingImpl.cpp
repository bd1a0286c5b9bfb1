#include "gles/ParameterBindingImpl.h"

#include "gles/OpenGLShaderProgram.h"
#include "gles/Throw.h"

#include <nib/exceptions.h>

#include <GLES3/gl3.h>

#include <cstring>

namespace Nib
{

IParameterBinding::IParameterBinding(BindingType type) : m_type(type) {}

IParameterBinding::~IParameterBinding() = default;

const void* IParameterBinding::GetValue() const
{
    switch (m_type)
    {
    case BindingType::Bool: return &m_boolValue;
    case BindingType::Matrix4: return m_matrixValue;
    case BindingType::Vector2: return m_vector2Value;
    case BindingType::Vector3: return m_vector3Value;
    case BindingType::Vector4: return m_vector4Value;
    case BindingType::Float: return &m_floatValue;
    case BindingType::Int:
    case BindingType::Sampler:
    case BindingType::UniformBlock: return &m_intValue;
    case BindingType::Undefined: break;
    }
    GLES::Throw<InvalidArgumentException>(
        "ParameterBindingImpl::GetValue: type of binding is undefined");
}

} // namespace Nib

namespace Nib::GLES
{

namespace
{

constexpr GLsizei kOneElement = 1;

// Copies from what may be the binding's own field, as GetValue gives it.
template <typename T>
void Store(T& field, const void* value)
{
    std::memmove(&field, value, sizeof(field));
}

} // namespace

ParameterBindingImpl::ParameterBindingImpl(BindingType type, OpenGLShaderProgram* program)
    : IParameterBinding(type), m_program(program)
{
}

ParameterBindingImpl::~ParameterBindingImpl() = default;

void ParameterBindingImpl::SetLocation(int32_t location, bool activeUniform)
{
    m_location = location;
    m_activeUniform = activeUniform;
}

void ParameterBindingImpl::SetValue(const void* value)
{
    switch (m_type)
    {
    case BindingType::Undefined: return;
    case BindingType::Bool: Store(m_boolValue, value); return glUniform1i(m_location, m_boolValue);
    case BindingType::Matrix4:
        if (value != m_matrixValue)
            Store(m_matrixValue, value);
        return glUniformMatrix4fv(m_location, kOneElement, GL_FALSE, m_matrixValue);
    case BindingType::Vector2:
        Store(m_vector2Value, value);
        return glUniform2fv(m_location, kOneElement, m_vector2Value);
    case BindingType::Vector3:
        Store(m_vector3Value, value);
        return glUniform3fv(m_location, kOneElement, m_vector3Value);
    case BindingType::Vector4:
        Store(m_vector4Value, value);
        return glUniform4fv(m_location, kOneElement, m_vector4Value);
    case BindingType::Float:
        Store(m_floatValue, value);
        return glUniform1f(m_location, m_floatValue);
    case BindingType::Int:
    case BindingType::Sampler: Store(m_intValue, value); return glUniform1i(m_location, m_intValue);
    case BindingType::UniformBlock:
        Store(m_intValue, value);
        return glUniformBlockBinding(m_program->GetShaderId(), static_cast<GLuint>(m_location),
                                     static_cast<GLuint>(m_intValue));
    }
    Throw<InvalidArgumentException>("ParameterBindingImpl::SetValue: type of binding is undefined");
}

void ParameterBindingImpl::Release()
{
    delete this;
}

} // namespace Nib::GLES
