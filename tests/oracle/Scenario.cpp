#include "oracle/Scenario.h"

#include <cmath>
#include <cstdio>
#include <cstdlib>

namespace Oracle
{

namespace
{

// As few digits as give the same float again.
std::string Number(float value)
{
    if (std::fabs(value) < 1e6F && std::trunc(value) == value)
        return std::to_string(static_cast<int>(value));
    char text[32];
    for (int digits = 1; digits <= 9; ++digits)
    {
        std::snprintf(text, sizeof text, "%.*gF", digits, static_cast<double>(value));
        if (std::strtof(text, nullptr) == value)
            break;
    }
    return text;
}

std::string RectangleText(const Nib::RectF& rect)
{
    return "RectF(" + Number(rect.left) + ", " + Number(rect.top) + ", " + Number(rect.right) +
           ", " + Number(rect.bottom) + ")";
}

std::string FrameText(const Frame& frame)
{
    std::string text = "        {" + std::to_string(frame.age) + ", {";
    for (std::size_t i = 0; i < frame.dirty.size(); ++i)
        text += (i != 0 ? ", " : "") + RectangleText(frame.dirty[i]);
    return text + "}},\n";
}

std::string Assignment(const char* field, int value, int usual)
{
    if (value == usual)
        return "";
    return "    scenario." + std::string(field) + " = " + std::to_string(value) + ";\n";
}

std::string Assignment(const char* field, bool value)
{
    return value ? "    scenario." + std::string(field) + " = true;\n" : "";
}

} // namespace

std::string ToStatements(const Scenario& scenario)
{
    const Scenario usual;
    std::string text = "    Scenario scenario;\n";
    text += Assignment("width", scenario.width, usual.width);
    text += Assignment("height", scenario.height, usual.height);
    text += Assignment("buffers", scenario.buffers, usual.buffers);
    text += Assignment("panelRotation", scenario.panelRotation, usual.panelRotation);
    text += Assignment("rotation", scenario.rotation, usual.rotation);
    text += Assignment("lostIsZero", scenario.lostIsZero);
    text += Assignment("damageIsAHint", scenario.damageIsAHint);
    text += "    scenario.frames = {\n";
    for (const Frame& frame : scenario.frames)
        text += FrameText(frame);
    return text + "    };\n";
}

} // namespace Oracle
