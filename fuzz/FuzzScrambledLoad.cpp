// Wraps arbitrary text in a valid envelope, so the descrambled text reaches the
// reader; a first byte of 0xFF instead passes the rest as a raw, possibly broken,
// envelope header and payload.
#include <vector>

#include "FuzzHost.h"
#include "data/Database.h"
#include "data/ScrambledEnvelope.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    std::vector<uint8_t> file;
    if (size > 0 && data[0] == 0xFF) {
        file.assign(envelope::kMagic, envelope::kMagic + envelope::kMagicSize);
        file.insert(file.end(), data + 1, data + size);
    } else {
        file.resize(envelope::kHeaderSize + size);
        std::copy(envelope::kMagic, envelope::kMagic + envelope::kMagicSize, file.begin());
        const uint32_t sum =
            envelope::Scramble(data, static_cast<int32_t>(size), file.data() + envelope::kHeaderSize);
        for (int i = 0; i < 4; ++i) {
            file[14 + i] = static_cast<uint8_t>(size >> (8 * i));
            file[18 + i] = static_cast<uint8_t>(sum >> (8 * i));
        }
    }
    fuzzhost::Install(file.data(), file.size());
    Database database;
    database.Load("fuzz.dat");
    return 0;
}
