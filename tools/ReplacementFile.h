#ifndef NIB_TOOLS_REPLACEMENT_FILE_H
#define NIB_TOOLS_REPLACEMENT_FILE_H

#include <cstdio>
#include <string>

/// A new file beside the one that it will replace; removed unless it took that one's place. So a
/// file appears whole or not at all. Every operation throws UserError when the system refuses.
class ReplacementFile
{
public:
    explicit ReplacementFile(const std::string& path);
    ~ReplacementFile();

    ReplacementFile(const ReplacementFile&) = delete;
    ReplacementFile& operator=(const ReplacementFile&) = delete;

    std::FILE* Stream() const { return m_file; } ///< for writing; stays this object's

    void TakePlace(); ///< closes the stream and renames the file; once, at the end

    [[noreturn]] void Fail() const; ///< with what errno says

private:
    std::string m_path;
    std::string m_name;
    std::FILE* m_file = nullptr;
    bool m_isInPlace = false;
};

/// Writes @p text as the whole of the file @p path.
void WriteTextFile(const std::string& path, const std::string& text);

#endif
