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

/// A life, and what it is to show when nothing goes wrong.
struct Scene
{
    LifeKind life;
    const char* name;
    std::size_t pictures;
};

// four frames, two exports, two frames in a front buffer
constexpr Scene kWindows{LifeKind::Windows, "a life", 9};
// eight frames, two exports
constexpr Scene kGuest{LifeKind::Guest, "a life inside a UI's frames", 10};

void Sweep(Fault::Kind kind, const SimGpu& gpu, const Scene& scene)
{
    const LifeRecord whole = LiveOnce(gpu, {}, "", scene.life);
    ASSERT_EQ(whole.run.end, "") << whole.run.messages << whole.run.stuck;
    ASSERT_GT(whole.calls.size(), 500u);
    ASSERT_EQ(whole.pictures.size(), scene.pictures);
    ASSERT_EQ(whole.notes, std::vector<std::string>{});
    Account account;
    for (std::size_t n = 1; n <= whole.calls.size(); n += Stride())
    {
        const Fault fault{kind, n, whole.calls[n - 1]};
        if (kind == Fault::ContextLost && fault.name.rfind("egl", 0) != 0)
            continue;
        const FaultVerdict verdict = Judge(whole, LiveOnce(gpu, fault, "", scene.life), fault);
        account.Add(verdict);
        for (const std::string& complaint : verdict.complaints)
            ADD_FAILURE() << "call " << n << ", " << fault.name << ": " << complaint;
    }
    const std::string of = std::string(" of ") + scene.name + " (" + gpu.renderer + ")";
    account.Print(kind == Fault::Refused
                      ? "each EGL and GL call" + of + " refused once" + StrideText()
                      : "all contexts lost at each EGL call" + of + StrideText());
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
    Sweep(Fault::Refused, WithDamage(), kWindows);
}

TEST(FaultSweep, EachCallIsRefusedOnceWithoutProgramBinaries)
{
    Sweep(Fault::Refused, WithoutBinaries(), kWindows);
}

TEST(FaultSweep, ContextsAreLostAtEachEglCall)
{
    Sweep(Fault::ContextLost, WithDamage(), kWindows);
}

TEST(FaultSweep, ContextsAreLostAtEachEglCallWithoutProgramBinaries)
{
    Sweep(Fault::ContextLost, WithoutBinaries(), kWindows);
}

TEST(FaultSweep, EachCallOfAGuestIsRefusedOnce)
{
    Sweep(Fault::Refused, WithDamage(), kGuest);
}

TEST(FaultSweep, EachCallOfAGuestIsRefusedOnceWithoutProgramBinaries)
{
    Sweep(Fault::Refused, WithoutBinaries(), kGuest);
}

TEST(FaultSweep, ContextsAreLostAtEachEglCallOfAGuest)
{
    Sweep(Fault::ContextLost, WithDamage(), kGuest);
}

TEST(FaultSweep, ContextsAreLostAtEachEglCallOfAGuestWithoutProgramBinaries)
{
    Sweep(Fault::ContextLost, WithoutBinaries(), kGuest);
}
