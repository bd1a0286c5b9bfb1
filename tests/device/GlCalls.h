#ifndef NIB_TESTS_DEVICE_GLCALLS_H
#define NIB_TESTS_DEVICE_GLCALLS_H

#include "sim/SimDriver.h"

#include <cstdio>
#include <string>
#include <vector>

/// The recorded calls by name and first argument, "glGetIntegerv 0x0D33": what a query asks for,
/// whatever the address to which the answer goes.
inline std::vector<std::string> Queries(const SimDriver& driver)
{
    std::vector<std::string> texts;
    for (const SimCall& call : driver.Calls())
    {
        std::string text = call.name;
        if (!call.args.empty() && call.args[0].GetKind() == SimValue::Kind::Text)
        {
            text += " " + call.args[0].Text();
        }
        else if (!call.args.empty())
        {
            char number[32];
            std::snprintf(number, sizeof(number), " 0x%04llX", call.Arg(0));
            text += number;
        }
        texts.push_back(text);
    }
    return texts;
}

#endif
