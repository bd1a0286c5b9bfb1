#ifndef NIB_SHADER_H
#define NIB_SHADER_H

/// @file
/// Shader programs and the bindings through which their uniforms are set.

#include <nib/export.h>

#include <cstdint>

// X11's headers define Bool as a macro.
#pragma push_macro("Bool")
#undef Bool

namespace Nib
{

/// The kind of value that a binding carries. GL types without a row here (integer and boolean
/// vectors, 2x2 and 3x3 matrices, external-image, unsigned and integer samplers) are Undefined.
enum class BindingType : int32_t
{
    Undefined = 0,    ///< carries nothing
    Bool = 1,         ///< GL_BOOL: one byte, false when 0
    Matrix4 = 2,      ///< GL_FLOAT_MAT4: 16 floats, column after column
    Vector2 = 3,      ///< GL_FLOAT_VEC2: 2 floats
    Vector3 = 4,      ///< GL_FLOAT_VEC3: 3 floats
    Vector4 = 5,      ///< GL_FLOAT_VEC4: 4 floats
    Float = 6,        ///< GL_FLOAT: 1 float
    Int = 7,          ///< GL_INT: int32_t
    Sampler = 8,      ///< any plain sampler: int32_t, the texture unit
    UniformBlock = 9, ///< a uniform block: int32_t, the binding point
};

/// A uniform of one program, with a copy of its value on the client's side.
///
/// Owner    the caller, from IShaderProgram::GetBindingIntf; ends with Release(). It must not
///          outlive its program.
/// Threads  the render thread whose context made the program.
/// Failure  InvalidArgumentException, after its message was written as an ERROR line.
class NIB_EXPORT IParameterBinding
{
public:
    explicit IParameterBinding(BindingType type); ///< kept for GetType
    IParameterBinding(const IParameterBinding&) = delete;
    IParameterBinding& operator=(const IParameterBinding&) = delete;

    /// Copies a value of the binding's type from @p value and sends it to GL. The program must be
    /// the active one. An Undefined binding ignores the call and reads nothing.
    virtual void SetValue(const void* value) = 0;
    virtual void Release() = 0; ///< deletes the binding
    virtual ~IParameterBinding();

    const BindingType& GetType() const { return m_type; } ///< what the binding was made as

    /// The address of the value last set: zero at first, the identity for a Matrix4. Valid as long
    /// as the binding. Throws for an Undefined binding, although setting one is ignored.
    const void* GetValue() const;

protected:
    const BindingType m_type;      ///< what the binding was made as
    unsigned char m_boolValue = 0; ///< the byte as it was given: GL takes any but 0 for true
    int32_t m_intValue = 0;        ///< of Int, Sampler and UniformBlock
    float m_floatValue = 0.0f;     ///< of a float
    float m_vector2Value[2] = {};  ///< of a vector
    float m_vector3Value[3] = {};  ///< of a vector
    float m_vector4Value[4] = {};  ///< of a vector
    float m_matrixValue[16] = {1, 0, 0, 0, 0, 1, 0, 0,
                               0, 0, 1, 0, 0, 0, 0, 1}; ///< of a matrix, column after column
};

/// One GL program, made from a vertex and a fragment source by
/// RendererFactory::CreateShaderProgram.
///
/// The program outlives the loss of its context: the GL name goes with the context and the program
/// is built again in the next one, from its binary where the shader cache holds one.
///
/// Attribute locations follow the order of the declarations `attribute TYPE NAME` in the vertex
/// source, from 0. That scan knows no comments, no qualifier between `attribute` and the type, and
/// no `in` of newer shading languages; there, give locations with layout(location = n).
///
/// Owner    the caller; ends with Release(). The source texts are not copied: they must live as
///          long as the program.
/// Threads  the render thread whose context made it.
/// Failure  building throws InvalidArgumentException with the driver's log (up to 1023 characters).
class NIB_EXPORT IShaderProgram
{
public:
    virtual ~IShaderProgram();
    virtual void Activate() = 0;   ///< makes the program current; builds it if it is not built
    virtual void Deactivate() = 0; ///< makes no program current
    virtual void PreDraw() = 0;    ///< does nothing
    virtual void Release() = 0;    ///< deletes the program

    /// A new binding of the uniform or uniform block @p name; "u_array[2]" names one element of an
    /// array. A name that the program does not have gives an Undefined binding, so that a variant
    /// of a shader may leave a uniform out. Throws InvalidArgumentException when the uniform is
    /// active but has neither a location nor a block.
    virtual IParameterBinding* GetBindingIntf(const char* name) = 0;
};

} // namespace Nib

#pragma pop_macro("Bool")

#endif
