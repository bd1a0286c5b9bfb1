#ifndef NIB_TOOLS_TRACE_OPTION_H
#define NIB_TOOLS_TRACE_OPTION_H

#include <string>

/// A trace file for as long as the object lives, unless its name is empty.
class TraceOption
{
public:
    explicit TraceOption(const std::string& file); ///< throws UserError when it cannot be opened
    ~TraceOption();

    TraceOption(const TraceOption&) = delete;
    TraceOption& operator=(const TraceOption&) = delete;

    /// Ends it; throws UserError when it could not be written whole.
    void Finish();

private:
    const std::string m_file;
    bool m_isOn;
};

#endif
