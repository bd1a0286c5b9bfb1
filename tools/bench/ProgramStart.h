#ifndef NIB_TOOLS_BENCH_PROGRAM_START_H
#define NIB_TOOLS_BENCH_PROGRAM_START_H

#include "bench/Stopwatch.h"

#include <nib/render_thread.h>

#include <string>
#include <vector>

/// What it takes to have a shader program; microseconds.
struct ProgramStart
{
    std::vector<float> fromSource; ///< compiled, linked, and kept in the cache
    std::vector<float> fromFile;   ///< from the cache's file; none where programs cannot be kept
    std::vector<float> fromMemory; ///< once more in the same process; none as above
};

/// A cache folder of this run alone, and of its own for the driver. Removed at the end; to be made
/// before the first program.
class BenchCache
{
public:
    BenchCache(); ///< throws UserError
    ~BenchCache();
    BenchCache(const BenchCache&) = delete;
    BenchCache& operator=(const BenchCache&) = delete;

    /// The file of the program of @p key.
    std::string FileOf(unsigned long long key) const;

private:
    std::string m_folder;
    std::string m_sdkFolder;
};

/// Measures for 0.25 of the time, on @p thread.
ProgramStart MeasureProgramStart(Nib::RenderThreadGL& thread, const BenchCache& cache,
                                 Stopwatch& stopwatch);

#endif
