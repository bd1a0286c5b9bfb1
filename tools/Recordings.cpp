#include "Recordings.h"

#include <utility>

Ink::Recording ReadRecordings(const std::vector<std::string>& files)
{
    Ink::Recording all;
    double end = 0.0;
    for (const std::string& file : files)
    {
        Ink::Recording one = Ink::ReadRecording(file);
        if (one.strokes.empty())
            continue; // an empty page
        const double shift = end - one.strokes.front().front().time;
        for (Ink::Stroke& stroke : one.strokes)
        {
            for (Ink::Sample& sample : stroke)
                sample.time += shift;
            end = stroke.back().time;
            all.strokes.push_back(std::move(stroke));
        }
    }
    return all;
}
