#ifndef NIB_GLES_BINARY_SHADER_READER_H
#define NIB_GLES_BINARY_SHADER_READER_H

#include "gles/BinaryShaderFile.h"

#include <memory>

namespace Nib
{

/// What keeps a binary shader file from being whole; the first of them.
enum class ShaderFileFault
{
    None,
    Header,     ///< cut short, another magic, or no program
    Size,       ///< a program or names larger than any that is read
    Program,    ///< cut short
    Attributes, ///< cut short
    Names,      ///< not as many as the header says, or the last one without its end
    NoSum,      ///< cut short
    Sum,        ///< another one than that of the bytes
};

/// Reads one binary shader file from its beginning to its end, and believes nothing in it before it
/// was checked: sizes before memory is taken, the sum before the record is handed out. Large: keep
/// it on the stack.
class BinaryShaderReader
{
public:
    /// @param file  open at its beginning
    explicit BinaryShaderReader(File& file);

    /// The record, without its key; null when the file is not whole.
    std::unique_ptr<ShaderProgramCache::BinaryShader> Read();

    /// Of a Read that gave nothing.
    ShaderFileFault Fault() const { return m_fault; }

    /// Writes the ERROR line of that fault.
    /// @param path      names the file
    /// @param function  the signature that the line carries
    void LogFault(const char* path, const char* function) const;

private:
    bool Take(void* out, std::size_t size);
    bool ReadHeader();
    bool ReadProgram();
    bool ReadAttributes();
    bool CheckSum();
    bool Fail(ShaderFileFault fault);

    // The beginning of a file, mostly all of it, comes in one system call.
    static constexpr std::size_t kFirstRead = 16384;

    File& m_file;
    unsigned char m_first[kFirstRead];
    std::size_t m_firstSize; ///< bytes of it that came
    std::size_t m_taken = 0; ///< bytes of those that were handed out
    BinaryShaderHeader m_header{};
    std::uint64_t m_crc = 0;
    std::uint64_t m_storedCrc = 0;
    std::unique_ptr<ShaderProgramCache::BinaryShader> m_shader;
    ShaderFileFault m_fault = ShaderFileFault::None;
    int m_errno = 0; ///< at the fault
};

} // namespace Nib

#endif
