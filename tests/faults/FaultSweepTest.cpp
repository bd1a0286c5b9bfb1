#include "faults/FaultVerdict.h"
#include "faults/Stride.h"

#include <gtest/gtest.h>

#include <iostream>

// One life of an application, again and again, each time with another call of the driver refused,
// or with all contexts lost at another call.

namespace
{

struct Account
{
    int runs = 0;
    int right = 0;
    int logged = 0;
    int noted = 0;
    int glError = 0;
    int lost = 0; ///< runs with a complaint

    void Add(const FaultVerdict& verdict)
    {
        ++runs;
        if (!verdict.complaints.empty())
            ++lost;
        else if (verdict.isRight)
            ++right;
        else if (verdict.isLogged)
            ++logged;
        else if (verdict.isNoted)
            ++noted;
        else
            ++glError;
    }

    void Print(const std::string& what) const
    {
        std::cout << "RELIABILITY | " << what << "; picture right " << right << ", else an error "
                  << "in the log " << logged << ", a result or exception " << noted
                  << ", GL's error flag " << glError << " | " << runs << " | " << lost << "\n";
    }
};

void Sweep(Fault::Kind kind, const SimGpu& gpu, const std::string& what)
{
    const LifeRecord whole = LiveOnce(gpu, {});
    ASSERT_EQ(whole.run.end, "") << whole.run.messages << whole.run.stuck;
    ASSERT_GT(whole.calls.size(), 500u);
    ASSERT_EQ(whole.pictures.size(), 9u); // four frames, two exports, two frames in a front buffer
    ASSERT_EQ(whole.notes, std::vector<std::string>{});
    Account account;
    for (std::size_t n = 1; n <= whole.calls.size(); n += Stride())
    {
        const Fault fault{kind, n, whole.calls[n - 1]};
        if (kind == Fault::ContextLost && fault.name.rfind("egl", 0) != 0)
            continue;
        const FaultVerdict verdict = Judge(whole, LiveOnce(gpu, fault), fault);
        account.Add(verdict);
        for (const std::string& complaint : verdict.complaints)
            ADD_FAILURE() << "call " << n << ", " << fault.name << ": " << complaint;
    }
    account.Print(what + " (" + gpu.renderer + ")");
}

SimGpu WithDamage()
{
    return SimGpu::Named("Mali-G72").WithFrontBuffer();
}

/// Every restore compiles here, and frames are drawn in tiles.
SimGpu WithoutBinaries()
{
    return SimGpu::Named("Adreno (TM) 540").WithFrontBuffer().WithoutProgramBinaries();
}

} // namespace

TEST(FaultSweep, EachCallIsRefusedOnce)
{
    Sweep(Fault::Refused, WithDamage(), "each EGL and GL call of a life refused once");
}

TEST(FaultSweep, EachCallIsRefusedOnceWithoutProgramBinaries)
{
    Sweep(Fault::Refused, WithoutBinaries(), "each EGL and GL call of a life refused once");
}

TEST(FaultSweep, ContextsAreLostAtEachEglCall)
{
    Sweep(Fault::ContextLost, WithDamage(), "all contexts lost at each EGL call of a life");
}

TEST(FaultSweep, ContextsAreLostAtEachEglCallWithoutProgramBinaries)
{
    Sweep(Fault::ContextLost, WithoutBinaries(), "all contexts lost at each EGL call of a life");
}
