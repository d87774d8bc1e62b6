// The 72-byte record the module fills and posts to the engine.
//
// Every event starts with `type` and `status`; the other 64 bytes are laid out
// per type. Each poster declares a view of its own type below and checks its
// offsets here, since the engine reads them by position.
#pragma once

#include <cstddef>
#include <cstdint>

struct HostEvent {
    int32_t type;
    int32_t status;
    alignas(8) unsigned char payload[64];
};
static_assert(sizeof(HostEvent) == 72, "the engine reads 72-byte events");
static_assert(offsetof(HostEvent, payload) == 8, "payload follows type and status");

// Event types the module posts.
enum HostEventType : int32_t {
    kEventSteamStartup = 17,
    kEventLeaderboardScores = 19,
    kEventStoreStarted = 32,
    kEventStoreItemState = 33,
    kEventStorePurchaseOutcome = 34,
    kEventWorkshopPublished = 42,
};

// Type 17: the outcome of the start-up.
struct StartupEvent {
    int32_t type;
    int32_t status;
    const char* PlayerId;
    const char* ErrorText;
    unsigned char reserved[48];
};
static_assert(sizeof(StartupEvent) == sizeof(HostEvent), "a view covers the whole event");
static_assert(offsetof(StartupEvent, PlayerId) == 8, "PlayerId at 8");
static_assert(offsetof(StartupEvent, ErrorText) == 16, "ErrorText at 16");
