#include <nib/base.h>

namespace Nib
{

bool String::Construct(const char* text)
{
    m_text = text ? text : "";
    return text != nullptr;
}

} // namespace Nib
