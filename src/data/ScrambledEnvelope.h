// The scrambled envelope a data file may be shipped in.
//
//   offset 0   14 bytes  magic: "MORVEN_STRATA" and a zero byte
//   offset 14   4 bytes  payload length, signed, little-endian
//   offset 18   4 bytes  checksum of the stored payload bytes, little-endian
//   offset 22   length   the scrambled text; nothing may follow it
//
// A file is recognised by its content alone, never by its name. The module only
// reads envelopes; the inverse lives with the tools.
#pragma once

#include <cstdint>

namespace envelope {

// The magic without its terminator is also the scrambling key.
constexpr char kMagic[] = "MORVEN_STRATA";
constexpr int32_t kKeyLength = 13;
constexpr int32_t kMagicSize = kKeyLength + 1;  // the terminator is compared too
constexpr int32_t kHeaderSize = 22;

// True if `bytes` start with the magic and its terminator and there are at least
// kHeaderSize of them; anything else is read as a plain file.
bool HasMagic(const unsigned char* bytes, int64_t byteCount);

// The two header fields of an envelope (HasMagic must hold).
int32_t PayloadLength(const unsigned char* bytes);
uint32_t PayloadChecksum(const unsigned char* bytes);

// Descrambles `length` stored bytes into `plain` and returns the checksum of the
// stored bytes: the wrapping sum of signed byte times index.
uint32_t Descramble(const unsigned char* stored, int32_t length, unsigned char* plain);

// The exact inverse of Descramble: scrambles `length` plain bytes into `stored`
// and returns the checksum to write into the header.
uint32_t Scramble(const unsigned char* plain, int32_t length, unsigned char* stored);

}  // namespace envelope
