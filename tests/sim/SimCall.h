#ifndef NIB_SIM_CALL_H
#define NIB_SIM_CALL_H

#include <initializer_list>
#include <iosfwd>
#include <string>
#include <type_traits>
#include <vector>

/// One argument of a recorded call. It compares equal to any number of the same value, to a pointer
/// of the same address and to a text of the same characters.
class SimValue
{
public:
    enum class Kind
    {
        Integer,
        Real,
        Pointer,
        Text
    };

    template <typename T>
    requires std::is_integral_v<T> || std::is_enum_v<T> SimValue(T value)
        : m_integer(static_cast<long long>(value))
    {
    }
    template <typename T>
    requires std::is_floating_point_v<T> SimValue(T value) : m_kind(Kind::Real), m_real(value) {}
    SimValue(const char* text) : m_kind(Kind::Text), m_pointer(text), m_text(text ? text : "(null)")
    {
    }
    SimValue(const void* pointer) : m_kind(Kind::Pointer), m_pointer(pointer) {}
    SimValue(std::nullptr_t) : m_kind(Kind::Pointer) {}

    Kind GetKind() const { return m_kind; }
    /// The value as an integer; a real is truncated, a pointer gives its address.
    long long Integer() const;
    double Real() const;
    const void* Pointer() const { return m_pointer; }
    const std::string& Text() const { return m_text; }

    /// "12", "0.5", "0x7f00", "null" or "\"text\"".
    std::string ToString() const;

    friend bool operator==(const SimValue& a, const SimValue& b);

private:
    Kind m_kind = Kind::Integer;
    long long m_integer = 0;
    double m_real = 0;
    const void* m_pointer = nullptr;
    std::string m_text;
};

std::ostream& operator<<(std::ostream& out, const SimValue& value);

/// One recorded call of an EGL, GL or platform function.
struct SimCall
{
    std::string name;
    std::vector<SimValue> args;
    /// What a pointer argument pointed at, where the driver reads or fills it: attribute lists
    /// (without the final EGL_NONE), names generated or deleted, attachments, damage rectangles,
    /// and so on.
    std::vector<long long> list;
    unsigned thread = 0; ///< number of the calling thread, SimDriver::ThisThread() of that thread
    void* context = nullptr; ///< EGLContext that was current on the calling thread
    bool failed = false;     ///< refused by an injected failure

    /// The argument @p index as an integer; -1 where there is none.
    long long Arg(std::size_t index) const;
    /// "glScissor(0, 0, 100, 50)".
    std::string ToString() const;
};

/// Equal in name and arguments; thread, context and list do not count.
bool operator==(const SimCall& a, const SimCall& b);
std::ostream& operator<<(std::ostream& out, const SimCall& call);

/// An expected call: EXPECT_EQ(driver.Calls("glScissor"), Sequence({Call("glScissor", 0, 0, 8,
/// 8)})).
template <typename... Args>
SimCall Call(const char* name, const Args&... args)
{
    SimCall call;
    call.name = name;
    call.args = std::vector<SimValue>{SimValue(args)...};
    return call;
}

inline std::vector<SimCall> Sequence(std::initializer_list<SimCall> calls)
{
    return calls;
}

inline std::vector<std::string> Names(std::initializer_list<const char*> names)
{
    return {names.begin(), names.end()};
}

#endif
