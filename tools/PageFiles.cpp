#include "PageFiles.h"

#include "UserError.h"

#include <ctime>
#include <filesystem>

PageFiles FilesFor(const std::string& picture)
{
    const std::string ink = std::filesystem::path(picture).replace_extension(".inkml");
    if (ink == picture)
        throw UserError("-o: '" + picture +
                        "' is the name for the ink beside the picture; say "
                        "PAGE.png");
    return {picture, ink};
}

PageFiles FilesOfNow()
{
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    char name[64];
    std::strftime(name, sizeof name, "nib-%Y%m%d-%H%M%S.png", &local);
    return FilesFor(name);
}
