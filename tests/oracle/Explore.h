#ifndef NIB_TESTS_ORACLE_EXPLORE_H
#define NIB_TESTS_ORACLE_EXPLORE_H

#include "oracle/Player.h"
#include "oracle/RandomScenario.h"

#include <string>

namespace Oracle
{

/// Plays random scenarios, NIB_ORACLE_RUNS of them (150 when unset), from seed NIB_ORACLE_SEED (1
/// when unset) on. The first that fails, as a test to be pasted; else an empty text.
std::string Explore(Player& player, const Space& space);

/// Plays @p scenario. When it fails: the shortest form of it, as a test to be pasted.
std::string Judge(Player& player, const Scenario& scenario, const std::string& name);

/// The shortest form of a scenario that fails.
Scenario ShortestOf(Player& player, const Scenario& scenario);

} // namespace Oracle

#endif
