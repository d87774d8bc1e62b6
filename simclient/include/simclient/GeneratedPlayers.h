// Players and rows made up from a count and a seed, so that a test or a scenario can ask
// for a board of 150 or 100,000 rows without listing them.
//
// Player i (from 0) has the id GeneratedPlayerId(i) whatever the seed, so boards generated
// with different seeds share their players (a friends list can name them), and a name
// that depends on the id alone. The seed chooses the scores and the details:
// - scores from -(count / 4 + 1) to count / 2, so that a board holds negative scores and,
//   from a handful of rows on, ties;
// - 0 to 64 details, each from -1000 to 999 (short enough to read in a timeline).
// Names: mostly "Player <i>"; every fifth "Zoë <i>" (two-byte letter), every fifth "東京 <i>"
// (three-byte letters), and every fiftieth a name of 80 bytes (beyond the 63 a row keeps).
#ifndef SIMCLIENT_GENERATED_PLAYERS_H
#define SIMCLIENT_GENERATED_PLAYERS_H

#include <string>
#include <vector>

#include "simclient/World.h"

namespace simclient {

constexpr uint64 kGeneratedPlayerBase = 76561198100000000ull;

inline uint64 GeneratedPlayerId(int index)
{
    return kGeneratedPlayerBase + static_cast<uint64>(index);
}
std::string GeneratedPlayerName(int index);

struct GeneratedPlayers {
    std::vector<LeaderboardRow> rows;  // in player order, not ranked
    std::vector<std::string> names;    // names[i] is the name of rows[i]'s player
};

// Deterministic for a (count, seed) pair, on every platform. A count below 1 gives nothing.
GeneratedPlayers GeneratePlayers(int count, uint64 seed);

}  // namespace simclient

#endif  // SIMCLIENT_GENERATED_PLAYERS_H
