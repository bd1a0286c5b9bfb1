#ifndef NIB_GLES_UNIFORM_NAME_H
#define NIB_GLES_UNIFORM_NAME_H

#include <cstdint>
#include <string_view>

namespace Nib::GLES
{

/// The name by which a binding is asked for: of a uniform, or of one element of an array,
/// "name[3]".
class UniformName
{
public:
    /// @p name is borrowed.
    explicit UniformName(std::string_view name);

    /// Whether the driver's active uniform @p active of @p size elements is meant. GL names an
    /// array by its element 0; "name" alone is not that array.
    bool Matches(std::string_view active, int32_t size) const;

private:
    std::string_view m_base;
    bool m_isElement;
    int32_t m_index = 0;
};

} // namespace Nib::GLES

#endif
