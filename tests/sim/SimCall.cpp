#include "SimCall.h"

#include <cstdint>
#include <ostream>
#include <sstream>

long long SimValue::Integer() const
{
    switch (m_kind)
    {
    case Kind::Integer: return m_integer;
    case Kind::Real: return static_cast<long long>(m_real);
    default: return static_cast<long long>(reinterpret_cast<std::uintptr_t>(m_pointer));
    }
}

double SimValue::Real() const
{
    return m_kind == Kind::Real ? m_real : static_cast<double>(Integer());
}

std::string SimValue::ToString() const
{
    std::ostringstream out;
    switch (m_kind)
    {
    case Kind::Integer: out << m_integer; break;
    case Kind::Real: out << m_real; break;
    case Kind::Text: out << '"' << m_text << '"'; break;
    case Kind::Pointer:
        if (m_pointer)
            out << m_pointer;
        else
            out << "null";
        break;
    }
    return out.str();
}

bool operator==(const SimValue& a, const SimValue& b)
{
    using Kind = SimValue::Kind;
    if (a.m_kind == Kind::Text && b.m_kind == Kind::Text)
        return a.m_text == b.m_text;
    if (a.m_kind == Kind::Real || b.m_kind == Kind::Real)
        return a.Real() == b.Real();
    return a.Integer() == b.Integer();
}

std::ostream& operator<<(std::ostream& out, const SimValue& value)
{
    return out << value.ToString();
}

long long SimCall::Arg(std::size_t index) const
{
    return index < args.size() ? args[index].Integer() : -1;
}

std::string SimCall::ToString() const
{
    std::string text = name + "(";
    for (std::size_t i = 0; i < args.size(); ++i)
        text += (i ? ", " : "") + args[i].ToString();
    return text + ")";
}

bool operator==(const SimCall& a, const SimCall& b)
{
    return a.name == b.name && a.args == b.args;
}

std::ostream& operator<<(std::ostream& out, const SimCall& call)
{
    return out << call.ToString();
}
