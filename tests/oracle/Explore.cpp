#include "oracle/Explore.h"

#include "oracle/Shrink.h"

#include <cstdlib>

namespace Oracle
{

namespace
{

std::uint32_t FromEnvironment(const char* name, std::uint32_t usual)
{
    const char* const text = std::getenv(name);
    return text != nullptr ? static_cast<std::uint32_t>(std::strtoul(text, nullptr, 10)) : usual;
}

} // namespace

Scenario ShortestOf(Player& player, const Scenario& scenario)
{
    return Shrunk(scenario, [&player](const Scenario& s) { return !player.Play(s).empty(); });
}

std::string Judge(Player& player, const Scenario& scenario, const std::string& name)
{
    if (player.Play(scenario).empty())
        return "";
    const Scenario shortest = ShortestOf(player, scenario);
    return "\n" + player.ToTest(shortest, name) + "// " + player.Play(shortest) + "\n";
}

std::string Explore(Player& player, const Space& space)
{
    const std::uint32_t first = FromEnvironment("NIB_ORACLE_SEED", 1);
    const std::uint32_t runs = FromEnvironment("NIB_ORACLE_RUNS", 150);
    for (std::uint32_t seed = first; seed < first + runs; ++seed)
    {
        const Scenario scenario = RandomScenario(seed).Make(space);
        const std::string found = Judge(player, scenario, "Seed" + std::to_string(seed));
        if (!found.empty())
            return found;
    }
    return "";
}

} // namespace Oracle
