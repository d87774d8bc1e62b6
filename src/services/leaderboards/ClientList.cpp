#include "services/leaderboards/ClientList.h"

ClientList::~ClientList()
{
    Chunk* chunk = first.next;
    while (chunk != nullptr) {
        Chunk* next = chunk->next;
        delete chunk;
        chunk = next;
    }
}

void ClientList::Add(SteamScoreClient* client)
{
    const int32_t index = count.load(std::memory_order_relaxed);
    const int32_t slot = index % kChunkSize;
    if (index > 0 && slot == 0) {
        // The new chunk is linked before the count that reaches into it is published.
        last->next = new Chunk();
        last = last->next;
    }
    last->clients[slot] = client;
    count.store(index + 1, std::memory_order_release);
}
