// Service 3: achievements and statistics.
#include "run/Operations.h"
#include "services/achievements/AchievementImplementation.h"

namespace steamext::run {

namespace {

AchievementImplementation* Achievements(const CallTarget& target)
{
    return ServiceAs<AchievementImplementation>(target, kServiceAchievements, "achievements");
}

}  // namespace

void RegisterAchievementOperations(OperationTable& table)
{
    using Args = std::vector<ArgValue>;
    AddBaseOperations(table, "achievements", kServiceAchievements);
    table.Add({"achievements.UnlockAchievement",
               {{"reserved", ArgType::Int, nlohmann::json(0)}, {"name", ArgType::Text}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Achievements(t)->UnlockAchievement(a[0].number, TextArg(a[1]));
                   return NoResult();
               }});
    table.Add({"achievements.ReservedAction1", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Achievements(t)->ReservedAction1();
                   return NoResult();
               }});
    table.Add({"achievements.ReservedQuery", {}, ResultType::Bool, [](const CallTarget& t, const Args&) {
                   return BoolResult(Achievements(t)->ReservedQuery());
               }});
    table.Add({"achievements.ReservedAction2", {}, ResultType::None, [](const CallTarget& t, const Args&) {
                   Achievements(t)->ReservedAction2();
                   return NoResult();
               }});
    table.Add({"achievements.SetStatistic",
               {{"name", ArgType::Text}, {"value", ArgType::Int}},
               ResultType::None,
               [](const CallTarget& t, const Args& a) {
                   Achievements(t)->SetStatistic(TextArg(a[0]), a[1].number);
                   return NoResult();
               }});
    table.Add({"achievements.GetStatistic",
               {{"name", ArgType::Text}},
               ResultType::Int,
               [](const CallTarget& t, const Args& a) {
                   return IntResult(Achievements(t)->GetStatistic(TextArg(a[0])));
               }});
}

}  // namespace steamext::run
