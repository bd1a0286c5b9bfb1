#ifndef NIB_GLES_ATTRIBUTE_SCANNER_H
#define NIB_GLES_ATTRIBUTE_SCANNER_H

#include <cstddef>
#include <string_view>

namespace Nib::GLES
{

/// Finds the attribute declarations of a vertex source, in the order in which they stand.
///
/// A declaration is `attribute TYPE NAME`, at the start of a statement or of a line. It is found by
/// its words, not by a grammar: exactly one word is skipped between `attribute` and the name, only
/// the space character separates words, and comments are text like any other.
class AttributeScanner
{
public:
    /// @p source is borrowed.
    explicit AttributeScanner(std::string_view source) : m_source(source) {}

    /// The next name, or an empty view when there is none. A name that ends with the text is none.
    std::string_view Next();

private:
    bool BeginsStatement(std::size_t position) const;
    std::size_t SkipBlanks(std::size_t position) const;
    std::size_t SkipWord(std::size_t position) const;

    std::string_view m_source;
    std::size_t m_position = 0; ///< where the search goes on
};

} // namespace Nib::GLES

#endif
