#ifndef NIB_TESTS_DEVICE_DEVICE_H
#define NIB_TESTS_DEVICE_DEVICE_H

#include "sim/SimDriver.h"

#include <utility>

/// A device with a context that is current, and no call or line recorded yet.
struct Device
{
    explicit Device(SimGpu gpu = SimGpu::Named("Mali-G72"))
        : driver(std::move(gpu)), context(driver)
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    SimDriver driver;
    SimContext context;
};

#endif
