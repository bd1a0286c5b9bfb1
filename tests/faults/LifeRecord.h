#ifndef NIB_TESTS_FAULTS_LIFE_RECORD_H
#define NIB_TESTS_FAULTS_LIFE_RECORD_H

#include "faults/ForkedRun.h"
#include "sim/SimDriver.h"

#include <map>
#include <string>
#include <vector>

/// What is done to one life.
struct Fault
{
    enum Kind
    {
        None,
        Refused,     ///< the call does nothing and fails
        ContextLost, ///< every context is lost from that call on
    };

    Kind kind = None;
    std::size_t call = 0; ///< which EGL or GL call of the life, from 1
    std::string name;     ///< the function that is called there
};

/// What one life did, as far as it is compared with another.
struct LifeRecord
{
    RunResult run;
    std::vector<std::string> calls;   ///< names of the functions, in order
    std::vector<SimPicture> pictures; ///< what became visible or was exported, in order
    std::vector<std::string> log;     ///< warnings and errors; addresses are left out
    std::vector<std::string> notes;   ///< what the application was told otherwise
    std::vector<std::string> misuses; ///< rules of GL and EGL that were broken
    std::map<std::string, int> left;  ///< objects of the driver that are there at the end
};

enum class LifeKind
{
    Windows, ///< DrawingLife
    Guest,   ///< GuestLife
};

/// Lives a life on @p gpu in a process of its own, with the toolkit's cache directory @p sdkFolder;
/// with one of its own when that is empty.
LifeRecord LiveOnce(const SimGpu& gpu, const Fault& fault, const std::string& sdkFolder = "",
                    LifeKind kind = LifeKind::Windows);

#endif
