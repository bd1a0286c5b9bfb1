#include "TraceOption.h"

#include "UserError.h"

#include <nib/trace.h>

#include <cerrno>
#include <cstring>
#include <utility>

TraceOption::TraceOption(const std::string& file) : m_file(file), m_isOn(!file.empty())
{
    errno = 0;
    if (m_isOn && !Nib::Trace::StartFile(m_file.c_str()))
    {
        throw UserError("--trace: cannot write to '" + m_file +
                        (errno ? std::string("': ") + std::strerror(errno) : "'"));
    }
}

TraceOption::~TraceOption()
{
    if (m_isOn)
        Nib::Trace::Stop();
}

void TraceOption::Finish()
{
    if (std::exchange(m_isOn, false) && !Nib::Trace::Stop())
        throw UserError("--trace: '" + m_file + "' could not be written whole");
}
