#include "simclient/GeneratedPlayers.h"

#include <random>

namespace simclient {

std::string GeneratedPlayerName(int index)
{
    const std::string number = std::to_string(index);
    if (index % 50 == 49)
        return "Long-named player " + number + " " + std::string(80 - 19 - number.size(), 'x');
    if (index % 5 == 1)
        return "Zo\xC3\xAB " + number;
    if (index % 5 == 3)
        return "\xE6\x9D\xB1\xE4\xBA\xAC " + number;
    return "Player " + number;
}

GeneratedPlayers GeneratePlayers(int count, uint64 seed)
{
    GeneratedPlayers players;
    if (count < 1)
        return players;
    // mt19937_64's sequence is fixed by the standard; the distributions are not, so
    // values are taken by modulo.
    std::mt19937_64 random(seed);
    const int64_t low = -(count / 4 + 1);
    const int64_t width = count / 2 - low + 1;
    const auto span = static_cast<uint64>(width);
    players.rows.reserve(static_cast<std::size_t>(count));
    players.names.reserve(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i) {
        LeaderboardRow row;
        row.steamId = GeneratedPlayerId(i);
        row.score = static_cast<int32>(low + static_cast<int64_t>(random() % span));
        row.details.resize(random() % (k_cLeaderboardDetailsMax + 1));
        for (int32& value : row.details)
            value = static_cast<int32>(random() % 2000) - 1000;
        players.rows.push_back(std::move(row));
        players.names.push_back(GeneratedPlayerName(i));
    }
    return players;
}

}  // namespace simclient
