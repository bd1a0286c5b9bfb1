#ifndef NIB_TOOLS_DRAW_OPTIONS_H
#define NIB_TOOLS_DRAW_OPTIONS_H

#include "BrushStyle.h"

#include <optional>
#include <string>
#include <vector>

/// The options of `nib draw`, as they were typed.
struct DrawOptions
{
    std::vector<std::string> files;
    std::string output;
    std::string size = "1280x800";
    std::string scale = "fit";
    std::string brush = "pen";
    std::optional<std::string> colour; ///< else the brush's own
    std::optional<std::string> width;  ///< else the brush's own
    std::string paper = "white";
    std::optional<std::string>
        speed;               ///< else the recorded one in a window, and no frames elsewhere
    std::string json;        ///< "-": standard output; a file; empty: none
    std::string loseContext; ///< "every:N"
    std::string trace;       ///< a file; empty: none
    int exportedPages = 0;
    bool window = false;
    bool live = false;
    bool keep = false;
    bool frontBuffer = false;
};

struct PageSize
{
    int width;
    int height;
};

/// "WIDTHxHEIGHT". Throws UserError.
PageSize ParseSize(const std::string& text);

/// Times the recorded speed; 0 for "max". Throws UserError.
double ParseSpeed(const std::string& text);

/// "every:N"; 0 for an empty text. Throws UserError.
int ParseLoseContext(const std::string& text);

/// The brush with its colour and width, or its own where these are not given. Throws UserError.
Ink::BrushStyle StyleOf(const DrawOptions& options);

/// A colour, given to @p option. Throws UserError.
Ink::Colour ParseColourOption(const std::string& option, const std::string& text);

#endif
