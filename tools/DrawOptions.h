#ifndef NIB_TOOLS_DRAW_OPTIONS_H
#define NIB_TOOLS_DRAW_OPTIONS_H

#include <string>
#include <vector>

/// The options of `nib draw`, as they were typed.
struct DrawOptions
{
    std::vector<std::string> files;
    std::string output;
    std::string size = "1280x800";
    std::string scale = "fit";
    std::string speed = "1";
    std::string loseContext; ///< "every:N"
    int exportedPages = 0;
    bool window = false;
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

#endif
