// Playing a scenario. Map of a run:
//   reset the client's world -> apply "world" -> set up the engine -> load the module
//   -> each step: act, gather what happened (engine records, platform calls), check
//   -> quit: IsQuitting set, the module's threads joined -> unload -> summary
// Everything runs on this thread except the module's own threads, whose platform
// calls and log lines are gathered at the next step boundary or frame.
#include "run/Runner.h"

#include <chrono>
#include <cstdlib>
#include <iostream>
#include <map>
#include <thread>

#include <simclient/World.h>

#include "frame/ExtensionModule.h"
#include "run/Base64.h"
#include "run/EngineSession.h"
#include "run/Expectations.h"
#include "run/Records.h"

namespace steamext::run {

using nlohmann::json;

namespace {

class Player {
public:
    Player(const Scenario& scenario, const RunOptions& options, Timeline& timeline)
        : scenario_(scenario), options_(options), timeline_(timeline), world_(simclient::GetWorld())
    {
    }

    int Play()
    {
        world_.Reset();
        for (const auto& edit : scenario_.world)
            edit.apply(world_);
        platformMark_ = world_.JournalMark();
        EngineSession engine(scenario_.engine);
        engine_ = &engine;
        // The client's scheduled changes in engine time follow this engine's clock.
        world_.SetTimeSource([&engine] { return uint64_t{engine.NowMs()}; });
        // The module's threads that only poll the platform count as settled (EngineSession.h).
        world_.SetCallObserver(&EngineSession::NotePlatformCall);
        struct ClientRelease {
            simclient::World& world;
            ~ClientRelease()
            {
                world.SetTimeSource({});
                world.SetCallObserver({});
            }
        } clientRelease{world_};
        mainThread_ = simclient::ThisThreadSerial();

        timeline_.Begin(scenario_.name, scenario_.description, options_.modulePath);
        ExtensionModule* module = engine.LoadModule(options_.modulePath);
        target_ = CallTarget{module, engine.Table()};
        timeline_.Phase(Now(), "module loaded");
        Gather();
        stepRecords_.clear();

        for (const Step& step : scenario_.steps)
            PlayStep(step);

        currentStep_ = 0;
        timeline_.Phase(Now(), "end of run: IsQuitting set, the module's threads joined");
        std::vector<std::string> stuck = engine.Quit();
        Gather();
        for (const auto& name : stuck)
            Fail(0, "the module's thread \"" + name + "\" did not end after IsQuitting turned true");
        summary_.end = Now();
        if (!stuck.empty()) {
            // The module's code is still running on that thread: it can be
            // neither joined nor unloaded, so the process ends here.
            timeline_.End(summary_);
            std::cout.flush();
            std::_Exit(1);
        }
        engine.UnloadModule();
        timeline_.End(summary_);
        engine_ = nullptr;
        return summary_.failed == 0 ? 0 : 1;
    }

private:
    Moment Now() const { return Moment{frame_, engine_->NowMs()}; }

    void PlayStep(const Step& step)
    {
        stepRecords_.clear();
        currentStep_ = step.index;
        std::optional<CallResult> result;
        switch (step.kind) {
        case StepKind::Note:
            timeline_.Step(Now(), step.index, "check", step.note, {{"action", "check"}});
            break;
        case StepKind::Call:
            result = Call(step);
            engine_->SettleThreads();
            break;
        case StepKind::Frames:
            timeline_.Step(Now(), step.index, "pump " + std::to_string(step.frames) + " frame(s)", step.note,
                           {{"action", "frames"}, {"frames", step.frames}});
            for (uint32_t i = 0; i < step.frames; ++i)
                Frame();
            break;
        case StepKind::Advance:
            timeline_.Step(Now(), step.index,
                           "advance the clock by " + std::to_string(step.advanceMs) + " ms", step.note,
                           {{"action", "advance"}, {"ms", step.advanceMs}});
            engine_->Advance(step.advanceMs);
            break;
        case StepKind::Wait:
            Wait(step);
            break;
        case StepKind::Read:
            result = Read(step);
            break;
        case StepKind::FailAllocations:
            timeline_.Step(Now(), step.index,
                           "the engine's next " + std::to_string(step.failAllocations) +
                               " Allocate call(s) give null",
                           step.note, {{"action", "fail_allocations"}, {"count", step.failAllocations}});
            engine_->FailAllocations(step.failAllocations);
            break;
        case StepKind::World: {
            std::string what;
            for (const auto& edit : step.world)
                what += (what.empty() ? "" : "; ") + edit.description;
            timeline_.Step(Now(), step.index, "world: " + what, step.note,
                           {{"action", "world"}, {"changes", what}});
            for (const auto& edit : step.world)
                edit.apply(world_);
            engine_->SettleThreads();
            break;
        }
        }
        Gather();
        for (const auto& outcome : Evaluate(step.expect, result, stepRecords_)) {
            if (outcome.passed) {
                ++summary_.passed;
                timeline_.Check(step.index, true, outcome.text);
            } else {
                Fail(step.index, "step #" + std::to_string(step.index) + " (" + step.place + "): expected " +
                                     outcome.text);
            }
        }
    }

    std::optional<CallResult> Call(const Step& step)
    {
        std::string shownArgs;
        if (step.argsShown.is_object()) {
            for (const auto& item : step.argsShown.items())
                shownArgs += (shownArgs.empty() ? "" : ", ") + item.key() + ": " + Compact(item.value());
        } else {
            for (const auto& arg : step.argsShown)
                shownArgs += (shownArgs.empty() ? "" : ", ") + Compact(arg);
        }
        const std::string call = step.operation->name + "(" + shownArgs + ")";
        Moment at = Now();
        CallResult result;
        try {
            result = step.operation->invoke(target_, step.args);
        } catch (const CallFailure& failure) {
            timeline_.Step(at, step.index, call, step.note,
                           {{"action", "call"}, {"operation", step.operation->name}});
            Fail(step.index, "step #" + std::to_string(step.index) + " (" + step.place +
                                 "): could not call " + step.operation->name + ": " + failure.what());
            return std::nullopt;
        }
        if (step.operation->result == ResultType::Record) {
            result.value = result.record != nullptr ? DecodeRecord(*step.operation->layout, result.record)
                                                    : json(nullptr);
            if (!step.keepAs.empty())
                kept_.Keep(step.keepAs, *step.operation->layout, result.record);
        }
        std::string shown = ShowResult(result, step.operation->result);
        json detail = {{"action", "call"}, {"operation", step.operation->name}, {"args", step.argsShown}};
        if (step.operation->result != ResultType::None)
            detail["result"] = result.bytes ? json{{"size", result.bytes->size()},
                                                   {"bytes_base64", EncodeBase64(*result.bytes)}}
                                            : result.value;
        timeline_.Step(at, step.index, shown.empty() ? call : call + " -> " + shown, step.note, detail);
        return result;
    }

    // A record kept by an earlier call, read again where the module keeps it.
    std::optional<CallResult> Read(const Step& step)
    {
        CallResult result;
        result.value = kept_.Read(step.readName);
        timeline_.Step(Now(), step.index, "read " + step.readName + " -> " + Compact(result.value), step.note,
                       {{"action", "read"}, {"record", step.readName}, {"result", result.value}});
        return result;
    }

    // One frame of the engine: the module's Update, then the clock moves on.
    void Frame()
    {
        target_.module->Update();
        ++frame_;
        engine_->Advance(scenario_.engine.frameMs);
        Gather();
    }

    void Wait(const Step& step)
    {
        timeline_.Step(Now(), step.index,
                       "wait for " + step.wait.description + ", up to " + std::to_string(step.timeoutMs) +
                           " ms",
                       step.note,
                       {{"action", "wait"},
                        {"for", step.wait.kind},
                        {"pattern", step.wait.pattern},
                        {"timeout_ms", step.timeoutMs}});
        const Moment start = Now();
        const auto realStart = std::chrono::steady_clock::now();
        std::size_t looked = 0;
        for (;;) {
            Gather();
            if (step.wait.kind == "threads_ended" &&
                engine_->RunningThreads(step.wait.pattern["name"]) == 0) {
                const Moment now = Now();
                timeline_.Outcome(now, "ended after " + std::to_string(now.frame - start.frame) +
                                           " frame(s), " + std::to_string(now.clockMs - start.clockMs) +
                                           " ms");
                return;
            }
            for (; looked < stepRecords_.size(); ++looked) {
                const json& record = stepRecords_[looked];
                if (record.value("kind", "") == step.wait.kind && MatchesPattern(record, step.wait.pattern)) {
                    Moment now = Now();
                    timeline_.Outcome(now, "arrived after " + std::to_string(now.frame - start.frame) +
                                               " frame(s), " + std::to_string(now.clockMs - start.clockMs) +
                                               " ms");
                    return;
                }
            }
            uint32_t waited = Now().clockMs - start.clockMs;
            double realWaited =
                std::chrono::duration<double>(std::chrono::steady_clock::now() - realStart).count();
            if (waited >= step.timeoutMs || realWaited >= options_.realTimeGuardSeconds) {
                Fail(step.index, "step #" + std::to_string(step.index) + " (" + step.place + "): waited " +
                                     std::to_string(waited) + " ms (" +
                                     std::to_string(Now().frame - start.frame) + " frames) for " +
                                     step.wait.description + ", it did not come");
                return;
            }
            Frame();
            // Let the module's threads run between frames; the engine's clock,
            // not this pause, decides the timeout.
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
    }

    // Everything that happened since the last gathering: platform calls first
    // (what the module asked of the client), then what reached the engine.
    void Gather()
    {
        const Moment now = Now();
        // Only what is new: a call repeated in a row since the last gathering comes back
        // as one record with its count.
        const simclient::Journal fresh = world_.JournalSince(platformMark_);
        for (const auto& entry : fresh.Entries()) {
            json record{{"kind", "platform_call"},
                        {"name", entry.name},
                        {"args", entry.args},
                        {"thread", ThreadLabel(entry.thread)}};
            if (entry.count > 1)
                record["count"] = entry.count;
            Publish(now, record);
        }
        for (auto& record : engine_->TakeRecords())
            Publish(now, record);
    }

    void Publish(const Moment& at, const json& record)
    {
        const std::string kind = record.value("kind", "");
        if (kind == "event")
            ++summary_.eventsByType[record.value("type", 0)];
        else if (kind == "log" && record.value("level", 0) == 1)
            ++summary_.warnings;
        else if (kind == "log" && record.value("level", 0) >= 2)
            ++summary_.errors;
        else if (kind == "platform_call")
            summary_.platformCalls += record.value("count", std::size_t{1});
        stepRecords_.push_back(record);
        timeline_.Record(at, record);
        if (kind == "engine_fault")
            Fail(currentStep_, "step #" + std::to_string(currentStep_) + ": " + DescribeRecord(record));
    }

    std::string ThreadLabel(simclient::ThreadSerial id)
    {
        if (id == mainThread_)
            return "main";
        std::string name = engine_->ThreadName(id);
        if (!name.empty())
            return name;
        auto found = otherThreads_.find(id);
        if (found == otherThreads_.end())
            found = otherThreads_.emplace(id, "thread " + std::to_string(otherThreads_.size() + 1)).first;
        return found->second;
    }

    void Fail(std::size_t step, const std::string& message)
    {
        ++summary_.failed;
        summary_.failures.push_back(message);
        timeline_.Check(step, false, message);
    }

    const Scenario& scenario_;
    const RunOptions& options_;
    Timeline& timeline_;
    simclient::World& world_;
    EngineSession* engine_ = nullptr;
    CallTarget target_;
    uint64_t frame_ = 0;
    std::size_t currentStep_ = 0;
    simclient::JournalMark platformMark_;
    simclient::ThreadSerial mainThread_ = 0;
    std::map<simclient::ThreadSerial, std::string> otherThreads_;
    std::vector<json> stepRecords_;
    KeptRecords kept_;
    RunSummary summary_;
};

}  // namespace

int PlayScenario(const Scenario& scenario, const RunOptions& options, Timeline& timeline)
{
    return Player(scenario, options, timeline).Play();
}

}  // namespace steamext::run
