#include "Expect.h"

#include <nib/shader_cache.h>

namespace
{

using Names = std::vector<std::string>;

// A name begins at the start and behind every NUL but the last; the block ends with a NUL.
bool ReadNames(const uint8_t* data, size_t size, Names* names)
{
    std::string name;
    for (size_t i = 0; i < size; ++i)
    {
        if (data[i] != 0)
        {
            name += static_cast<char>(data[i]);
            continue;
        }
        names->push_back(name);
        name.clear();
    }
    return size == 0 || data[size - 1] == 0;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    Names expected;
    const bool isBlock = ReadNames(data, size, &expected);
    Names names;
    const bool accepted = Nib::ShaderProgramCache::ParseShaderAttributes(
        data, static_cast<unsigned int>(size), names);
    Nib::Expect(accepted == isBlock, "whether the block is well formed");
    Nib::Expect(names == expected, "the names of the block");
    return 0;
}
