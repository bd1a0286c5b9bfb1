#ifndef NIB_TESTS_FUZZ_RECORDING_FUZZER_H
#define NIB_TESTS_FUZZ_RECORDING_FUZZER_H

#include "Expect.h"

#include "Recording.h"

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

// What holds for every recording that a reader gives, whatever the file says. A refusal is a
// ReadError; anything else that is thrown ends the fuzzer.

namespace Nib
{

inline void CheckSample(const Ink::Sample& sample)
{
    Expect(std::isfinite(sample.time), "the time is finite");
    Expect(std::isfinite(sample.x) && std::isfinite(sample.y), "the place is finite");
    Expect(sample.pressure >= 0.0f && sample.pressure <= 1.0f, "the pressure is 0 to 1");
    Expect(sample.altitude >= 0.0f && sample.altitude <= 90.0f, "the altitude is 0 to 90");
    Expect(sample.azimuth >= 0.0f && sample.azimuth <= 360.0f, "the azimuth is 0 to 360");
}

inline void CheckRuns(const std::vector<Ink::Stroke>& runs)
{
    const Ink::Sample* before = nullptr;
    for (const Ink::Stroke& run : runs)
    {
        Expect(!run.empty(), "a run has a sample");
        for (const Ink::Sample& sample : run)
        {
            CheckSample(sample);
            Expect(!before || before->time <= sample.time, "the time does not decrease");
            before = &sample;
        }
    }
}

/// Whether a file that is accepted may hold no stroke: InkML can describe the traces of an empty
/// page, in the other formats such a file is a mistake.
enum class EmptyPage
{
    Refused,
    Accepted
};

/// Reads @p data as a file, which may be refused.
inline int FuzzReader(Ink::Recording (*read)(const std::string&, const std::string&),
                      const std::uint8_t* data, std::size_t size,
                      EmptyPage emptyPage = EmptyPage::Refused)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    try
    {
        const Ink::Recording recording = read("file", text);
        Expect(emptyPage == EmptyPage::Accepted || !recording.strokes.empty(),
               "something was written");
        CheckRuns(recording.strokes);
        CheckRuns(recording.hovers);
    }
    catch (const Ink::ReadError& error)
    {
        const std::string what = error.what();
        Expect(what.rfind("file:", 0) == 0, "the error names the file");
        Expect(what.size() > 5 && what[5] >= '1' && what[5] <= '9', "the error names a line");
        Expect(what.find(": ") + 2 < what.size(), "the error says what is wrong");
    }
    return 0;
}

} // namespace Nib

#endif
