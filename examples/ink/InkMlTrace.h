#ifndef INK_INKML_TRACE_H
#define INK_INKML_TRACE_H

#include "Recording.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace Ink
{

/// One channel of an InkML trace format.
struct Channel
{
    std::string name;
    std::string units;
    double min = 0.0;
    double max = 0.0; ///< equal to min where the file states no range
    bool isBoolean = false;
    bool isReversed = false; ///< orientation="-ve": grows upward, or to the left
};

/// The order of the values within a point.
struct TraceFormat
{
    std::vector<Channel> channels;
    std::vector<Channel> intermittent; ///< may be missing at the end of a point

    bool Has(std::string_view name) const;
    static TraceFormat Plain(); ///< X and Y, which holds where a file states nothing
};

/// Decodes the text of one <trace>: points between commas, a value a channel, each explicit ("!"),
/// a first difference ("'") or a second difference ("\""); a prefix holds until the next one.
class TraceDecoder
{
public:
    explicit TraceDecoder(const TraceFormat& format);

    /// Appends the points of @p text to @p stroke, @p most at most. False, with the reason in
    /// @p problem, when the text is not a trace of this format.
    bool Decode(std::string_view text, std::size_t most, Stroke& stroke, std::string& problem);

private:
    enum class Encoding
    {
        Explicit,
        FirstDifference,
        SecondDifference
    };
    struct ChannelState
    {
        Encoding encoding = Encoding::Explicit;
        double value = 0.0;
        double velocity = 0.0;
    };

    bool DecodePoint(std::string_view text, std::string& problem);
    bool DecodeValue(std::string_view& text, std::size_t channel, std::string& problem);
    void Accept(ChannelState& state, double number) const;
    Sample ToSample() const;

    std::vector<Channel> m_channels;
    std::size_t m_required;
    std::vector<ChannelState> m_states;
};

} // namespace Ink

#endif
