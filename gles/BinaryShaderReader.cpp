#include "gles/BinaryShaderReader.h"

#include "base/Log.h"
#include "gles/Crc32.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstring>
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

BinaryShaderReader::BinaryShaderReader(File& file)
    : m_file(file), m_shader(std::make_unique<ShaderProgramCache::BinaryShader>())
{
    errno = 0; // a file that is merely too short sets none
    m_firstSize = file.ReadSome(m_first, sizeof m_first);
}

std::unique_ptr<ShaderProgramCache::BinaryShader> BinaryShaderReader::Read()
{
    if (!ReadHeader() || !ReadProgram() || !ReadAttributes() || !CheckSum())
        return nullptr;
    m_shader->format = static_cast<std::uint32_t>(m_header.format);
    return std::move(m_shader);
}

bool BinaryShaderReader::Fail(ShaderFileFault fault)
{
    m_errno = errno;
    m_fault = fault;
    return false;
}

/// The next @p size bytes of the file; false when there are fewer.
bool BinaryShaderReader::Take(void* out, std::size_t size)
{
    const std::size_t here = std::min(size, m_firstSize - m_taken);
    std::memcpy(out, m_first + m_taken, here);
    m_taken += here;
    const std::size_t rest = size - here;
    return rest == 0 || m_file.Read(static_cast<unsigned char*>(out) + here, 1, rest) == rest;
}

bool BinaryShaderReader::ReadHeader()
{
    if (!Take(&m_header, sizeof m_header) || m_header.magic != kBinaryShaderMagic ||
        m_header.programLength == 0)
        return Fail(ShaderFileFault::Header);
    if (m_header.programLength > kLongestProgram || m_header.attributeSize > kLargestAttributes)
        return Fail(ShaderFileFault::Size);
    m_crc = ContinueCrc(0, &m_header, sizeof m_header);
    return true;
}

bool BinaryShaderReader::ReadProgram()
{
    const auto length = static_cast<std::size_t>(m_header.programLength);
    m_shader->bytes = new unsigned char[length];
    m_shader->length = static_cast<std::int32_t>(length);
    if (!Take(m_shader->bytes, length))
        return Fail(ShaderFileFault::Program);
    m_crc = ContinueCrc(m_crc, m_shader->bytes, length);
    return true;
}

bool BinaryShaderReader::ReadAttributes()
{
    if (m_header.attributeSize == 0)
        return true; // the number of names is then not looked at
    const auto size = static_cast<std::size_t>(m_header.attributeSize);
    std::vector<unsigned char> rest; // of what did not come with the beginning of the file
    const unsigned char* block = m_first + m_taken;
    if (size <= m_firstSize - m_taken)
    {
        m_taken += size;
    }
    else
    {
        rest.resize(size);
        block = rest.data();
        if (!Take(rest.data(), size))
            return Fail(ShaderFileFault::Attributes);
    }
    m_crc = ContinueCrc(m_crc, block, size);
    const bool isParsed = ShaderProgramCache::ParseShaderAttributes(
        block, static_cast<unsigned int>(size), m_shader->attributes);
    if (isParsed && m_shader->attributes.size() == m_header.attributeCount)
        return true;
    return Fail(ShaderFileFault::Names);
}

bool BinaryShaderReader::CheckSum()
{
    if (!Take(&m_storedCrc, sizeof m_storedCrc))
        return Fail(ShaderFileFault::NoSum);
    return m_storedCrc == m_crc || Fail(ShaderFileFault::Sum);
}

void BinaryShaderReader::LogFault(const char* path, const char* function) const
{
    switch (m_fault)
    {
    case ShaderFileFault::None: break;
    case ShaderFileFault::Header:
        NIB_LOG_ERROR("%s File header read error Err=%d, File = %s", function, m_errno, path);
        break;
    case ShaderFileFault::Size:
        NIB_LOG_ERROR("%s Program size (%lu) OR Attribute size (%lu) is too big to allocate "
                      "memory. File = %s",
                      function, static_cast<unsigned long>(m_header.programLength),
                      static_cast<unsigned long>(m_header.attributeSize), path);
        break;
    case ShaderFileFault::Program:
        NIB_LOG_ERROR("%s File shader bin read error Err=%d, File = %s", function, m_errno, path);
        break;
    case ShaderFileFault::Attributes:
        NIB_LOG_ERROR("%s File attribs read error Err=%d, File = %s", function, m_errno, path);
        break;
    case ShaderFileFault::Names:
        ReportAttributeCount(function, m_header.attributeCount, m_shader->attributes.size());
        break;
    case ShaderFileFault::NoSum:
        NIB_LOG_ERROR("%s Filed to read CRC from file. Err=%d, File = %s", function, m_errno, path);
        break;
    case ShaderFileFault::Sum:
        NIB_LOG_ERROR("%s Invalid CRC, From file: %lu, Calculated: = %lu", function,
                      static_cast<unsigned long>(m_storedCrc), static_cast<unsigned long>(m_crc));
        break;
    }
}

} // namespace Nib
