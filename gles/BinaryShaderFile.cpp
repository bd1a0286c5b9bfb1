#include "gles/BinaryShaderFile.h"

#include "gles/Crc32.h"

namespace Nib
{

namespace
{

/// Writes one piece after the other and keeps the sums that the file ends with.
class CheckedWriter
{
public:
    explicit CheckedWriter(File& file) : m_file(file) {}

    void Write(const void* data, std::size_t size)
    {
        m_written += m_file.Write(data, 1, size);
        m_expected += size;
        m_crc = ContinueCrc(m_crc, data, size);
    }

    std::uint64_t Crc() const { return m_crc; }
    bool IsComplete() const { return m_written == m_expected; }

private:
    File& m_file;
    std::uint64_t m_crc = 0;
    std::size_t m_written = 0;
    std::size_t m_expected = 0;
};

} // namespace

BinaryShaderHeader MakeHeader(const ShaderProgramCache::BinaryShader& shader)
{
    std::uint64_t attributeSize = 0;
    for (const std::string& name : shader.attributes)
        attributeSize += name.size() + 1;
    return {kBinaryShaderMagic, shader.format,
            static_cast<std::uint64_t>(std::int64_t{shader.length}), attributeSize,
            shader.attributes.size()};
}

bool WriteBinaryShader(File& file, const ShaderProgramCache::BinaryShader& shader)
{
    if (shader.length < 0)
        return false;
    const BinaryShaderHeader header = MakeHeader(shader);
    CheckedWriter writer(file);
    writer.Write(&header, sizeof header);
    if (shader.length != 0)
        writer.Write(shader.bytes, static_cast<std::size_t>(shader.length));
    for (const std::string& name : shader.attributes)
        writer.Write(name.c_str(), name.size() + 1);
    const std::uint64_t crc = writer.Crc();
    writer.Write(&crc, sizeof crc);
    return writer.IsComplete();
}

} // namespace Nib
