#ifndef NIB_TOOLS_PAGE_FILES_H
#define NIB_TOOLS_PAGE_FILES_H

#include <string>

/// The two files that a page is saved in: what it shows, and what was written on it.
struct PageFiles
{
    std::string picture; ///< PNG
    std::string ink;     ///< InkML
};

/// The files for a page that is to become @p picture: "page.png" gives page.inkml beside it.
/// Throws UserError when the picture has the other's name.
PageFiles FilesFor(const std::string& picture);

/// Files in the current folder that carry the moment in their names.
PageFiles FilesOfNow();

#endif
