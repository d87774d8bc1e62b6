#include "simengine/Clock.h"

#include <cmath>

namespace simengine {

void Clock::UseManual(uint32_t startMs)
{
    std::lock_guard<std::mutex> lock(mutex_);
    WakeAllLocked();
    manual_ = true;
    manualNowMs_ = startMs;
    sleepCalls_.clear();
}

void Clock::UseScaled(double timeScale)
{
    std::lock_guard<std::mutex> lock(mutex_);
    WakeAllLocked();
    manual_ = false;
    timeScale_ = timeScale > 0.0 ? timeScale : 1.0;
    scaledStart_ = std::chrono::steady_clock::now();
    sleepCalls_.clear();
}

bool Clock::IsManual() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return manual_;
}

double Clock::ScaledNowLocked() const
{
    std::chrono::duration<double, std::milli> real = std::chrono::steady_clock::now() - scaledStart_;
    return real.count() * timeScale_;
}

uint32_t Clock::NowMs() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    // The engine's clock is 32 bits wide and wraps; callers use differences only.
    if (manual_)
        return static_cast<uint32_t>(manualNowMs_);
    return static_cast<uint32_t>(static_cast<uint64_t>(ScaledNowLocked()));
}

void Clock::Advance(uint32_t milliseconds)
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (!manual_)
        return;
    manualNowMs_ += milliseconds;
    for (Sleeper& sleeper : sleepers_)
        if (sleeper.wakeMs <= manualNowMs_)
            sleeper.woken = true;
    changed_.notify_all();
}

void Clock::WakeAllLocked()
{
    for (Sleeper& sleeper : sleepers_)
        sleeper.woken = true;
    changed_.notify_all();
}

void Clock::SetQuitting(bool quitting)
{
    std::lock_guard<std::mutex> lock(mutex_);
    quitting_ = quitting;
    if (quitting)
        WakeAllLocked();
}

void Clock::Sleep(uint32_t milliseconds, const std::string& threadName)
{
    std::unique_lock<std::mutex> lock(mutex_);
    ++sleepCalls_[threadName];
    if (quitting_)
        return;

    if (manual_) {
        if (milliseconds == 0)
            return;
        auto self =
            sleepers_.insert(sleepers_.end(), Sleeper{threadName, manualNowMs_ + milliseconds, false});
        changed_.notify_all();  // a test may be waiting for this thread to sleep
        changed_.wait(lock, [&] { return self->woken; });
        sleepers_.erase(self);
        return;
    }

    auto self = sleepers_.insert(sleepers_.end(), Sleeper{threadName, 0, false});
    changed_.notify_all();
    auto realDuration = std::chrono::duration<double, std::milli>(milliseconds / timeScale_);
    changed_.wait_for(lock, realDuration, [&] { return self->woken; });
    sleepers_.erase(self);
}

int Clock::SleepingLocked(const std::string& threadName) const
{
    int count = 0;
    for (const Sleeper& sleeper : sleepers_)
        count += (!sleeper.woken && sleeper.name == threadName) ? 1 : 0;
    return count;
}

bool Clock::WaitUntilSleeping(const std::string& threadName, std::chrono::milliseconds timeout)
{
    std::unique_lock<std::mutex> lock(mutex_);
    return changed_.wait_for(lock, timeout, [&] { return SleepingLocked(threadName) > 0; });
}

int Clock::SleepingCount(const std::string& threadName) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return SleepingLocked(threadName);
}

uint64_t Clock::SleepCalls(const std::string& threadName) const
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto found = sleepCalls_.find(threadName);
    return found != sleepCalls_.end() ? found->second : 0;
}

}  // namespace simengine
