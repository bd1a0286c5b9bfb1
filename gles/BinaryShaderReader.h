#ifndef NIB_GLES_BINARY_SHADER_READER_H
#define NIB_GLES_BINARY_SHADER_READER_H

#include "gles/BinaryShaderFile.h"

#include <memory>

namespace Nib
{

/// Reads one binary shader file from its beginning to its end, and believes nothing in it before it
/// was checked: sizes before memory is taken, the sum before the record is handed out. Each step
/// that fails writes its own ERROR line.
class BinaryShaderReader
{
public:
    /// @param file      open at its beginning
    /// @param path      names the file in the log
    /// @param function  the signature that the log lines carry
    BinaryShaderReader(File& file, const char* path, const char* function);

    /// The record, without its key; null when the file is not whole.
    std::unique_ptr<ShaderProgramCache::BinaryShader> Read();

private:
    bool ReadHeader();
    bool ReadProgram();
    bool ReadAttributes();
    bool CheckSum();

    File& m_file;
    const char* const m_path;
    const char* const m_function;
    BinaryShaderHeader m_header{};
    std::uint64_t m_crc = 0;
    std::unique_ptr<ShaderProgramCache::BinaryShader> m_shader;
};

} // namespace Nib

#endif
