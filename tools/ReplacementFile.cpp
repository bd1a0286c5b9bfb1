#include "ReplacementFile.h"

#include "UserError.h"

#include <cerrno>
#include <cstring>
#include <sys/stat.h>
#include <unistd.h>

ReplacementFile::ReplacementFile(const std::string& path) : m_path(path), m_name(path + ".XXXXXX")
{
    const int descriptor = mkstemp(m_name.data());
    if (descriptor < 0)
        Fail();
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(descriptor, 0666 & ~mask); // mkstemp makes files that only the owner reads
    m_file = fdopen(descriptor, "wb");
    if (!m_file)
        Fail();
}

ReplacementFile::~ReplacementFile()
{
    if (m_file)
        std::fclose(m_file);
    if (!m_isInPlace)
        unlink(m_name.c_str());
}

void ReplacementFile::TakePlace()
{
    std::FILE* const file = m_file;
    m_file = nullptr;
    if (std::fclose(file) != 0 || std::rename(m_name.c_str(), m_path.c_str()) != 0)
        Fail();
    m_isInPlace = true;
}

void ReplacementFile::Fail() const
{
    throw UserError(m_path + ":1: cannot be written: " + std::strerror(errno));
}

void WriteTextFile(const std::string& path, const std::string& text)
{
    ReplacementFile file(path);
    errno = 0;
    if (std::fwrite(text.data(), 1, text.size(), file.Stream()) != text.size())
        file.Fail();
    file.TakePlace();
}
