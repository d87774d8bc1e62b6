// "steamext data scramble IN OUT" and "steamext data unscramble IN OUT": the
// envelope the module reads, written and undone for the game's makers.
#include <cinttypes>
#include <cstdio>
#include <iostream>

#include "data/DataTool.h"
#include "data/ScrambledEnvelope.h"

namespace datatool {

namespace {

void PutLittleEndian(std::string& out, size_t offset, uint32_t value)
{
    for (int i = 0; i < 4; ++i)
        out[offset + static_cast<size_t>(i)] = static_cast<char>((value >> (8 * i)) & 0xFF);
}

struct ConvertOptions {
    std::string input;
    std::string output;
};

int RunConvert(const char* name, const ConvertOptions& options, bool scramble)
{
    std::string in;
    std::string out;
    std::string error;
    const bool ok = ReadFile(options.input, in, error) &&
                    (scramble ? ScrambleText(in, out, error) : UnscrambleText(in, out, error)) &&
                    WriteFile(options.output, out, error);
    if (!ok) {
        std::cerr << "steamext data " << name << ": " << error << "\n";
        return 1;
    }
    return 0;
}

}  // namespace

bool ScrambleText(const std::string& plain, std::string& envelopeBytes, std::string& error)
{
    if (plain.size() > static_cast<size_t>(INT32_MAX - envelope::kHeaderSize)) {
        error = "input of " + std::to_string(plain.size()) + " bytes is too large for an envelope";
        return false;
    }
    const int32_t length = static_cast<int32_t>(plain.size());
    envelopeBytes.assign(static_cast<size_t>(envelope::kHeaderSize) + plain.size(), '\0');
    std::copy(envelope::kMagic, envelope::kMagic + envelope::kMagicSize, envelopeBytes.begin());
    const uint32_t checksum =
        envelope::Scramble(reinterpret_cast<const unsigned char*>(plain.data()), length,
                           reinterpret_cast<unsigned char*>(&envelopeBytes[envelope::kHeaderSize]));
    PutLittleEndian(envelopeBytes, 14, static_cast<uint32_t>(length));
    PutLittleEndian(envelopeBytes, 18, checksum);
    return true;
}

bool UnscrambleText(const std::string& envelopeBytes, std::string& plain, std::string& error)
{
    const auto* bytes = reinterpret_cast<const unsigned char*>(envelopeBytes.data());
    const int64_t size = static_cast<int64_t>(envelopeBytes.size());
    if (!envelope::HasMagic(bytes, size)) {
        error = size < envelope::kHeaderSize
                    ? "not a scrambled file: " + std::to_string(size) + " bytes, an envelope has at least 22"
                    : std::string("not a scrambled file: it does not begin with the envelope's magic");
        return false;
    }
    const int32_t length = envelope::PayloadLength(bytes);
    if (size != int64_t{envelope::kHeaderSize} + length) {
        error = "length mismatch: the header says " + std::to_string(length) +
                " bytes of payload, the file has " + std::to_string(size - envelope::kHeaderSize);
        return false;
    }
    plain.assign(static_cast<size_t>(length), '\0');
    const uint32_t sum = envelope::Descramble(bytes + envelope::kHeaderSize, length,
                                              reinterpret_cast<unsigned char*>(&plain[0]));
    const uint32_t stored = envelope::PayloadChecksum(bytes);
    if (sum != stored) {
        char text[96];
        std::snprintf(text, sizeof text,
                      "checksum mismatch: the header says 0x%08" PRIx32 ", the payload gives 0x%08" PRIx32,
                      stored, sum);
        error = text;
        plain.clear();
        return false;
    }
    return true;
}

void AddScrambleCommands(CLI::App& data, SubcommandAction& action)
{
    auto scrambleOptions = std::make_shared<ConvertOptions>();
    CLI::App* scramble = data.add_subcommand("scramble", "Write a data file inside the scrambled envelope");
    scramble->add_option("input", scrambleOptions->input, "Plain data file")->required();
    scramble->add_option("output", scrambleOptions->output, "Envelope to write")->required();
    scramble->callback([scrambleOptions, &action] {
        action = [scrambleOptions] { return RunConvert("scramble", *scrambleOptions, true); };
    });

    auto unscrambleOptions = std::make_shared<ConvertOptions>();
    CLI::App* unscramble =
        data.add_subcommand("unscramble", "Take a data file out of its scrambled envelope");
    unscramble->add_option("input", unscrambleOptions->input, "Envelope")->required();
    unscramble->add_option("output", unscrambleOptions->output, "Plain data file to write")->required();
    unscramble->callback([unscrambleOptions, &action] {
        action = [unscrambleOptions] { return RunConvert("unscramble", *unscrambleOptions, false); };
    });
}

}  // namespace datatool
