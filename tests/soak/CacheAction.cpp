#include "Action.h"
#include "Failure.h"
#include "Family.h"

#include <filesystem>
#include <fstream>
#include <system_error>

namespace Soak
{

namespace
{

namespace fs = std::filesystem;

/// As a system does that needs room, or a disk that fails: files go, or are cut, while others write
/// and read them.
class CacheAction : public Action
{
public:
    const char* Name() const override { return "cache"; }

    void Run(Family& family, Random& random) const override
    {
        Random lots = random.Fork(); // as many as there are files
        std::error_code gone;        // another family clears, too
        for (const fs::directory_entry& entry :
             fs::directory_iterator(family.Shared().cacheFolder, gone))
        {
            if (entry.path().extension() != ".dat")
                continue;
            if (lots.OneIn(2))
                fs::remove(entry.path(), gone);
            else if (lots.OneIn(4))
                fs::resize_file(entry.path(), static_cast<std::uintmax_t>(lots.Below(500)), gone);
        }
    }
};

} // namespace

std::unique_ptr<Action> MakeCacheAction()
{
    return std::make_unique<CacheAction>();
}

} // namespace Soak
