#ifndef NIB_GLES_UNPACKSTATE_H
#define NIB_GLES_UNPACKSTATE_H

#include <GLES3/gl3.h>

namespace Nib::GLES
{

/// Sets the row length of uploads, unless it is 0, until the end of the scope.
class UnpackRowLength
{
public:
    explicit UnpackRowLength(int rowLength) : m_set(rowLength != 0)
    {
        if (!m_set)
            return;
        glGetIntegerv(GL_UNPACK_ROW_LENGTH, &m_previous);
        glPixelStorei(GL_UNPACK_ROW_LENGTH, rowLength);
    }
    ~UnpackRowLength()
    {
        if (m_set)
            glPixelStorei(GL_UNPACK_ROW_LENGTH, m_previous);
    }
    UnpackRowLength(const UnpackRowLength&) = delete;
    UnpackRowLength& operator=(const UnpackRowLength&) = delete;

private:
    const bool m_set;
    GLint m_previous = 0;
};

inline void SetUnpackSkips(int pixels, int rows)
{
    glPixelStorei(GL_UNPACK_SKIP_PIXELS, pixels);
    glPixelStorei(GL_UNPACK_SKIP_ROWS, rows);
}

} // namespace Nib::GLES

#endif
