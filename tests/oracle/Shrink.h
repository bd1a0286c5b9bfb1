#ifndef NIB_TESTS_ORACLE_SHRINK_H
#define NIB_TESTS_ORACLE_SHRINK_H

#include "oracle/Scenario.h"

#include <algorithm>
#include <cstddef>
#include <functional>
#include <vector>

namespace Oracle
{

/// What is left of @p list when everything was taken out without which it still fails: no single
/// element can go. Halves are tried first, then ever smaller pieces. @p list itself fails.
template <typename T, typename Fails>
std::vector<T> ShortestFailing(std::vector<T> list, const Fails& fails)
{
    for (std::size_t piece = std::max<std::size_t>(list.size() / 2, 1); !list.empty();)
    {
        bool isShorter = false;
        for (std::size_t start = 0; start < list.size();)
        {
            std::vector<T> rest(list.begin(), list.begin() + static_cast<std::ptrdiff_t>(start));
            const std::size_t end = std::min(start + piece, list.size());
            rest.insert(rest.end(), list.begin() + static_cast<std::ptrdiff_t>(end), list.end());
            if (fails(rest))
            {
                list = std::move(rest);
                isShorter = true;
            }
            else
            {
                start = end;
            }
        }
        if (piece == 1 && !isShorter)
            break;
        piece = std::max<std::size_t>(piece / 2, 1);
    }
    return list;
}

/// The shortest scenario that still fails: no frame and no rectangle can go, no number be nearer to
/// zero. Ages stay such as the buffers can have. @p scenario itself fails.
Scenario Shrunk(Scenario scenario, const std::function<bool(const Scenario&)>& fails);

} // namespace Oracle

#endif
