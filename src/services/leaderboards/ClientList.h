// A list of score clients that one thread appends to while others scan it.
//
// The configuration thread adds clients one by one while the engine's thread may
// look them up at any moment. Clients sit in fixed chunks that never move, and
// the count is published last (release), so a reader that loads the count
// (acquire) sees every client below it fully built, with no lock and no copy.
#pragma once

#include <atomic>
#include <cstdint>

class SteamScoreClient;

class ClientList {
public:
    ClientList() = default;
    ~ClientList();
    ClientList(const ClientList&) = delete;
    ClientList& operator=(const ClientList&) = delete;

    // One writer only. Clients stay the caller's: the list never frees them.
    void Add(SteamScoreClient* client);

    int32_t Count() const { return count.load(std::memory_order_acquire); }

    // Calls `visit(client)` for the published clients in order until it answers true;
    // gives that client, or null.
    template <typename Visit> SteamScoreClient* FindFirst(Visit visit) const
    {
        int32_t remaining = Count();
        const Chunk* chunk = &first;
        while (remaining > 0) {
            const int32_t inChunk = remaining < kChunkSize ? remaining : kChunkSize;
            for (int32_t i = 0; i < inChunk; ++i) {
                if (visit(chunk->clients[i]))
                    return chunk->clients[i];
            }
            remaining -= inChunk;
            if (remaining > 0)
                chunk = chunk->next;  // linked before the count that reaches into it
        }
        return nullptr;
    }

private:
    static constexpr int32_t kChunkSize = 64;
    struct Chunk {
        SteamScoreClient* clients[kChunkSize] = {};
        Chunk* next = nullptr;
    };

    Chunk first;
    Chunk* last = &first;  // the writer's only
    std::atomic<int32_t> count{0};
};
