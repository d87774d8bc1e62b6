// Service 2: leaderboards. Scores come back as events of type 19; a submission gives
// nothing back at all.
#include <cstddef>

#include "run/Operations.h"
#include "services/leaderboards/LeaderboardsImplementation.h"
#include "services/leaderboards/ScoreEntry.h"

namespace steamext::run {

namespace {

// The score record a scenario hands to SubmitScore, field by field:
//   {"score": 120, "details": [1, 2, 3], "detailsSize": 188, "userName": "Ann"}
constexpr RecordField kScoreEntryFields[] = {
    {"userId", offsetof(ScoreEntry, userId), FieldKind::FixedText, 64},
    {"userName", offsetof(ScoreEntry, userName), FieldKind::FixedText, 64},
    {"score", offsetof(ScoreEntry, score), FieldKind::Int32},
    {"rank", offsetof(ScoreEntry, rank), FieldKind::Int32},
    {"details", offsetof(ScoreEntry, details), FieldKind::Int32Array, kScoreDetailsCount},
    {"detailsSize", offsetof(ScoreEntry, detailsSize), FieldKind::Int32},
    {"reserved", offsetof(ScoreEntry, reserved), FieldKind::Int32},
};
static_assert(FieldsFit(kScoreEntryFields, sizeof(ScoreEntry)));
constexpr RecordLayout kScoreEntry = MakeLayout("score", sizeof(ScoreEntry), kScoreEntryFields);

LeaderboardsImplementation* Leaderboards(const CallTarget& target)
{
    return ServiceAs<LeaderboardsImplementation>(target, kServiceLeaderboards, "leaderboards");
}

}  // namespace

void RegisterLeaderboardOperations(OperationTable& table)
{
    using Args = std::vector<ArgValue>;
    AddBaseOperations(table, "leaderboards", kServiceLeaderboards);
    table.Add({"leaderboards.SubmitScore",
               {{"reserved", ArgType::Int, nlohmann::json(0)},
                {"record", ArgType::Record, std::nullopt, -1, &kScoreEntry},
                {"category", ArgType::Text}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Leaderboards(t)->SubmitScore(a[0].number, RecordArg<ScoreEntry>(a[1]), TextArg(a[2]));
                   return NoResult();
               }});
    table.Add({"leaderboards.RequestScores",
               {{"start", ArgType::Int},
                {"count", ArgType::Int},
                {"filter", ArgType::Int},
                {"category", ArgType::Text}},
               ResultType::Bool,
               [](const CallTarget& t, const Args& a) {
                   return BoolResult(
                       Leaderboards(t)->RequestScores(a[0].number, a[1].number, a[2].number, TextArg(a[3])));
               }});
    table.Add({"leaderboards.RequestScoresAroundUser",
               {{"reserved", ArgType::Int, nlohmann::json(0)},
                {"count", ArgType::Int},
                {"category", ArgType::Text}},
               ResultType::Bool,
               [](const CallTarget& t, const Args& a) {
                   return BoolResult(
                       Leaderboards(t)->RequestScoresAroundUser(a[0].number, a[1].number, TextArg(a[2])));
               }});
    table.Add({"leaderboards.GetUserId", {}, ResultType::Text, [](const CallTarget& t, const Args&) {
                   return TextResult(Leaderboards(t)->GetUserId());
               }});
    table.Add({"leaderboards.ReservedQueryA", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(Leaderboards(t)->ReservedQueryA());
               }});
    table.Add({"leaderboards.ReservedCommandA", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Leaderboards(t)->ReservedCommandA();
                   return NoResult();
               }});
    table.Add({"leaderboards.ReservedCommandB", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Leaderboards(t)->ReservedCommandB();
                   return NoResult();
               }});
    table.Add({"leaderboards.GetServiceState", {}, ResultType::Int, [](const CallTarget& t, const Args&) {
                   return IntResult(Leaderboards(t)->GetServiceState());
               }});
    table.Add({"leaderboards.ReservedQueryB", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(Leaderboards(t)->ReservedQueryB());
               }});
    table.Add({"leaderboards.ReservedCommandC", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Leaderboards(t)->ReservedCommandC();
                   return NoResult();
               }});
    table.Add({"leaderboards.GetFixedLimit", {}, ResultType::Int, [](const CallTarget& t, const Args&) {
                   return IntResult(Leaderboards(t)->GetFixedLimit());
               }});
}

}  // namespace steamext::run
