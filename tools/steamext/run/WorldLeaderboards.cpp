#include "run/WorldLeaderboards.h"

#include <optional>

#include <simclient/GeneratedPlayers.h>
#include <simclient/World.h>

namespace steamext::run {

using nlohmann::json;
using simclient::World;

namespace {

template <class T> struct Word {
    const char* text;
    T value;
};

const Word<ELeaderboardSortMethod> kSorts[] = {
    {"descending", k_ELeaderboardSortMethodDescending},
    {"ascending", k_ELeaderboardSortMethodAscending},
    {"none", k_ELeaderboardSortMethodNone},
};
const Word<ELeaderboardDisplayType> kDisplays[] = {
    {"numeric", k_ELeaderboardDisplayTypeNumeric},
    {"seconds", k_ELeaderboardDisplayTypeTimeSeconds},
    {"milliseconds", k_ELeaderboardDisplayTypeTimeMilliSeconds},
    {"none", k_ELeaderboardDisplayTypeNone},
};

template <class T, std::size_t N>
T PickWord(const ScenarioFile& r, const json& value, const std::string& at, const Word<T> (&words)[N])
{
    const std::string text = r.String(value, at);
    std::string list;
    for (const Word<T>& word : words) {
        if (text == word.text)
            return word.value;
        list += std::string(list.empty() ? "" : ", ") + word.text;
    }
    r.Fail(at, "unknown word \"" + text + "\"; expected one of: " + list);
}

// A player: an id (number or decimal text), or {"generated": i} for player i of the
// generated boards.
uint64 PlayerId(const ScenarioFile& r, const json& value, const std::string& at)
{
    if (value.is_object()) {
        r.OnlyKeys(value, at, {"generated"});
        if (!value.contains("generated"))
            r.Fail(at, "a player is an id, or {\"generated\": n} for generated player n");
        return simclient::GeneratedPlayerId(
            r.Int(value["generated"], ScenarioFile::Child(at, "generated"), 0));
    }
    return r.UInt64(value, at);
}

// How a name arrives: {"pumps": n}, {"ms": n} (engine milliseconds) or "never".
// nullopt inside: never.
std::optional<simclient::Delay> Arrival(const ScenarioFile& r, const json& value, const std::string& at)
{
    if (value.is_string()) {
        if (value.get_ref<const std::string&>() != "never")
            r.Fail(at,
                   "expected {\"pumps\": n}, {\"ms\": n} or \"never\", got " + ScenarioFile::Describe(value));
        return std::nullopt;
    }
    r.Object(value, at);
    r.OnlyKeys(value, at, {"pumps", "ms"});
    if (value.size() != 1)
        r.Fail(at, "expected {\"pumps\": n}, {\"ms\": n} or \"never\"");
    if (value.contains("pumps"))
        return simclient::Delay::Pumps(
            static_cast<uint64_t>(r.Int(value["pumps"], ScenarioFile::Child(at, "pumps"), 1, 1000000)));
    return simclient::Delay::EngineMs(
        static_cast<uint64_t>(r.Int(value["ms"], ScenarioFile::Child(at, "ms"), 0, INT32_MAX)));
}

std::string Shown(const json& value)
{
    std::string text = value.dump(-1, ' ', false, json::error_handler_t::replace);
    return text.size() > 160 ? text.substr(0, 157) + "..." : text;
}

}  // namespace

WorldEdit ParseLeaderboards(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    struct Board {
        std::string name;
        ELeaderboardSortMethod sort = k_ELeaderboardSortMethodDescending;
        ELeaderboardDisplayType display = k_ELeaderboardDisplayTypeNumeric;
        std::vector<simclient::LeaderboardRow> rows;
        int generatedCount = 0;
        uint64 seed = 1;
    };
    std::vector<Board> boards;
    r.Array(value, pointer);
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string at = ScenarioFile::Child(pointer, i);
        const json& entry = r.Object(value[i], at);
        r.OnlyKeys(entry, at, {"name", "sort", "display", "rows", "generated"});
        if (!entry.contains("name"))
            r.Fail(at, "a leaderboard needs \"name\"");
        Board board;
        board.name = r.Bytes(entry["name"], ScenarioFile::Child(at, "name"));
        if (entry.contains("sort"))
            board.sort = PickWord(r, entry["sort"], ScenarioFile::Child(at, "sort"), kSorts);
        if (entry.contains("display"))
            board.display = PickWord(r, entry["display"], ScenarioFile::Child(at, "display"), kDisplays);
        if (entry.contains("rows")) {
            const std::string rowsAt = ScenarioFile::Child(at, "rows");
            r.Array(entry["rows"], rowsAt);
            for (std::size_t k = 0; k < entry["rows"].size(); ++k) {
                const std::string rowAt = ScenarioFile::Child(rowsAt, k);
                const json& row = r.Object(entry["rows"][k], rowAt);
                r.OnlyKeys(row, rowAt, {"steam_id", "score", "details"});
                if (!row.contains("steam_id") || !row.contains("score"))
                    r.Fail(rowAt, "a row needs \"steam_id\" and \"score\"");
                simclient::LeaderboardRow made;
                made.steamId = PlayerId(r, row["steam_id"], ScenarioFile::Child(rowAt, "steam_id"));
                made.score = r.Int(row["score"], ScenarioFile::Child(rowAt, "score"));
                if (row.contains("details")) {
                    const std::string detailsAt = ScenarioFile::Child(rowAt, "details");
                    r.Array(row["details"], detailsAt);
                    if (row["details"].size() > k_cLeaderboardDetailsMax)
                        r.Fail(detailsAt, "at most 64 details");
                    for (std::size_t d = 0; d < row["details"].size(); ++d)
                        made.details.push_back(r.Int(row["details"][d], ScenarioFile::Child(detailsAt, d)));
                }
                board.rows.push_back(std::move(made));
            }
        }
        if (entry.contains("generated")) {
            const std::string genAt = ScenarioFile::Child(at, "generated");
            const json& generated = r.Object(entry["generated"], genAt);
            r.OnlyKeys(generated, genAt, {"count", "seed"});
            if (!generated.contains("count"))
                r.Fail(genAt, "generated rows need \"count\"");
            board.generatedCount =
                r.Int(generated["count"], ScenarioFile::Child(genAt, "count"), 0, 10000000);
            if (generated.contains("seed"))
                board.seed = r.UInt64(generated["seed"], ScenarioFile::Child(genAt, "seed"));
        }
        boards.push_back(std::move(board));
    }
    return {"leaderboards " + Shown(value), [boards](World& w) {
                for (const Board& board : boards)
                    w.AddGeneratedLeaderboard(board.name, board.sort, board.display, board.generatedCount,
                                              board.seed, board.rows);
            }};
}

WorldEdit ParseFriends(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    r.Array(value, pointer);
    std::vector<uint64> ids;
    for (std::size_t i = 0; i < value.size(); ++i)
        ids.push_back(PlayerId(r, value[i], ScenarioFile::Child(pointer, i)));
    return {"friends " + Shown(value), [ids](World& w) { w.SetFriends(ids); }};
}

WorldEdit ParsePersonas(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    struct Persona {
        uint64 id = 0;
        std::string name;
        bool known = true;
        std::optional<simclient::Delay> delay;  // when not known now; nullopt: never
    };
    std::vector<Persona> personas;
    r.Array(value, pointer);
    for (std::size_t i = 0; i < value.size(); ++i) {
        const std::string at = ScenarioFile::Child(pointer, i);
        const json& entry = r.Object(value[i], at);
        r.OnlyKeys(entry, at, {"steam_id", "name", "arrives"});
        if (!entry.contains("steam_id"))
            r.Fail(at, "a player's name needs \"steam_id\"");
        Persona persona;
        persona.id = PlayerId(r, entry["steam_id"], ScenarioFile::Child(at, "steam_id"));
        if (entry.contains("name"))
            persona.name = r.Bytes(entry["name"], ScenarioFile::Child(at, "name"));
        else if (!entry.contains("arrives") || !entry["arrives"].is_string())
            r.Fail(at, "a player's name needs \"name\" (text or {\"base64\": ...}) unless it never arrives");
        if (entry.contains("arrives")) {
            persona.known = false;
            persona.delay = Arrival(r, entry["arrives"], ScenarioFile::Child(at, "arrives"));
        }
        personas.push_back(std::move(persona));
    }
    return {"personas " + Shown(value), [personas](World& w) {
                for (const Persona& p : personas) {
                    if (p.known)
                        w.SetPersonaName(p.id, p.name);
                    else if (p.delay)
                        w.SetPersonaNameArrives(p.id, p.name, *p.delay);
                    else
                        w.SetPersonaNameNever(p.id);
                }
            }};
}

WorldEdit ParseAllNames(const ScenarioFile& r, const json& value, const std::string& pointer)
{
    std::optional<simclient::Delay> delay = Arrival(r, value, pointer);
    return {"all_names_arrive " + Shown(value), [delay](World& w) {
                if (delay)
                    w.SetAllPersonaNamesArrive(*delay);
                else
                    w.SetAllPersonaNamesNever();
            }};
}

}  // namespace steamext::run
