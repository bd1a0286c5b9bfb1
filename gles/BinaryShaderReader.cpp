#include "gles/BinaryShaderReader.h"

#include "base/Log.h"

#include <cerrno>
#include <climits>
#include <vector>

namespace Nib
{

namespace
{

// The number in the file may be one that no int holds; the line then shows all of it.
void ReportAttributeCount(const char* function, std::uint64_t expected, std::size_t found)
{
    const int names = static_cast<int>(found);
    if (expected <= INT_MAX)
        NIB_LOG_ERROR("%s Filed to parse shader attributes. Expected=%d. Found = %d", function,
                      static_cast<int>(expected), names);
    else
        NIB_LOG_ERROR("%s Filed to parse shader attributes. Expected=%lu. Found = %d", function,
                      static_cast<unsigned long>(expected), names);
}

} // namespace

BinaryShaderReader::BinaryShaderReader(File& file, const char* path, const char* function)
    : m_file(file), m_path(path), m_function(function),
      m_shader(std::make_unique<ShaderProgramCache::BinaryShader>())
{
    errno = 0; // a file that is merely too short sets none
}

std::unique_ptr<ShaderProgramCache::BinaryShader> BinaryShaderReader::Read()
{
    if (!ReadHeader() || !ReadProgram() || !ReadAttributes() || !CheckSum())
        return nullptr;
    m_shader->format = static_cast<std::uint32_t>(m_header.format);
    return std::move(m_shader);
}

bool BinaryShaderReader::ReadHeader()
{
    if (m_file.Read(&m_header, 1, sizeof m_header) != sizeof m_header ||
        m_header.magic != kBinaryShaderMagic || m_header.programLength == 0)
    {
        NIB_LOG_ERROR("%s File header read error Err=%d, File = %s", m_function, errno, m_path);
        return false;
    }
    if (m_header.programLength > kLongestProgram || m_header.attributeSize > kLargestAttributes)
    {
        NIB_LOG_ERROR("%s Program size (%lu) OR Attribute size (%lu) is too big to allocate "
                      "memory. File = %s",
                      m_function, static_cast<unsigned long>(m_header.programLength),
                      static_cast<unsigned long>(m_header.attributeSize), m_path);
        return false;
    }
    m_crc = ContinueCrc(0, &m_header, sizeof m_header);
    return true;
}

bool BinaryShaderReader::ReadProgram()
{
    const auto length = static_cast<std::size_t>(m_header.programLength);
    m_shader->bytes = new unsigned char[length];
    m_shader->length = static_cast<std::int32_t>(length);
    if (m_file.Read(m_shader->bytes, 1, length) != length)
    {
        NIB_LOG_ERROR("%s File shader bin read error Err=%d, File = %s", m_function, errno, m_path);
        return false;
    }
    m_crc = ContinueCrc(m_crc, m_shader->bytes, length);
    return true;
}

bool BinaryShaderReader::ReadAttributes()
{
    if (m_header.attributeSize == 0)
        return true; // the number of names is then not looked at
    std::vector<unsigned char> block(static_cast<std::size_t>(m_header.attributeSize));
    if (m_file.Read(block.data(), 1, block.size()) != block.size())
    {
        NIB_LOG_ERROR("%s File attribs read error Err=%d, File = %s", m_function, errno, m_path);
        return false;
    }
    m_crc = ContinueCrc(m_crc, block.data(), block.size());
    const bool isParsed = ShaderProgramCache::ParseShaderAttributes(
        block.data(), static_cast<unsigned int>(block.size()), m_shader->attributes);
    if (isParsed && m_shader->attributes.size() == m_header.attributeCount)
        return true;
    ReportAttributeCount(m_function, m_header.attributeCount, m_shader->attributes.size());
    return false;
}

bool BinaryShaderReader::CheckSum()
{
    std::uint64_t stored = 0;
    if (m_file.Read(&stored, sizeof stored, 1) != 1)
    {
        NIB_LOG_ERROR("%s Filed to read CRC from file. Err=%d, File = %s", m_function, errno,
                      m_path);
        return false;
    }
    if (stored == m_crc)
        return true;
    NIB_LOG_ERROR("%s Invalid CRC, From file: %lu, Calculated: = %lu", m_function,
                  static_cast<unsigned long>(stored), static_cast<unsigned long>(m_crc));
    return false;
}

} // namespace Nib
