#ifndef NIB_SIM_TOKENS_H
#define NIB_SIM_TOKENS_H

#include <map>
#include <string>
#include <vector>

namespace Sim
{

/// The words and marks of a shader's source, without comments, after the preprocessor.
struct TokenList
{
    std::string error; ///< text of the first #error that is reached, as a compiler words it
    std::vector<std::string> words;
    std::map<std::string, std::string> defines; ///< #define NAME VALUE; not replaced in the words
};

/// Understands #define, #undef, #ifdef, #ifndef, #if 0, #if 1, #if defined(NAME), #else, #endif and
/// #error; other conditions count as true.
TokenList Tokenize(const std::string& source);

} // namespace Sim

#endif
