#ifndef NIB_TESTS_FAULTS_FAULT_VERDICT_H
#define NIB_TESTS_FAULTS_FAULT_VERDICT_H

#include "faults/LifeRecord.h"

/// How a life with a fault compares with one without.
struct FaultVerdict
{
    bool isRight = false;   ///< every picture was shown or exported as without the fault
    bool isLogged = false;  ///< there are warnings or errors that are not there without it
    bool isNoted = false;   ///< an exception, null or false told the application
    bool isGlError = false; ///< nothing but GL's error flag tells, since the library asks for none

    /// What must not be, a line each; nothing when all is well.
    std::vector<std::string> complaints;
};

FaultVerdict Judge(const LifeRecord& whole, const LifeRecord& faulty, const Fault& fault);

#endif
