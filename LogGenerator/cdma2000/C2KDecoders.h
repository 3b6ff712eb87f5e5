#pragma once

// The decoders of the CDMA2000 log codes. Each takes one packet (its 0x81
// prefix dropped), the state and the lookup dictionary (nothing when there is
// no display); it checks the packet's length, reads its fields through the
// record layouts of records/ and writes texts with SetLookupValue. The 1x
// frame-error rate and the EV-DO data rates keep what they need in the state.

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

#include "LogGenerator/logcode/PacketView.h"
#include "platform/Value.h"

namespace corvane::c2k {

using Packet = std::span<const std::uint8_t>;
using Decoder = void (*)(Packet packet, const Dictionary& state, const Dictionary* lookup);

// State entries kept between packets.
inline constexpr std::string_view kTrafficFER = "TrafficFER";
inline constexpr std::string_view kFLDataSeqNum = "FLDataSeqNum";
inline constexpr std::string_view kFLDataSent = "FLDataSent";
inline constexpr std::string_view kRLDataSeqNum = "RLDataSeqNum";
inline constexpr std::string_view kRLDataSent = "RLDataSent";

void decodeEvdoStatus(Packet packet, const Dictionary& state, const Dictionary* lookup);         // 0x1183
void decodeEvdoPilots(Packet packet, const Dictionary& state, const Dictionary* lookup);         // 0x12b6
void decodeFingers(Packet packet, const Dictionary& state, const Dictionary* lookup);            // 0x108a
void decode1xStatus(Packet packet, const Dictionary& state, const Dictionary* lookup);           // 0x119c
void decode1xSystem(Packet packet, const Dictionary& state, const Dictionary* lookup);           // 0x134f
void decodeForwardLinkRate(Packet packet, const Dictionary& state, const Dictionary* lookup);     // 0x1192
void decodeReverseLinkRate(Packet packet, const Dictionary& state, const Dictionary* lookup);    // 0x127e
void decode1xTrafficFER(Packet packet, const Dictionary& state, const Dictionary* lookup);       // 0x119d

struct CodeDecoder {
  std::uint16_t code;
  Decoder decoder;
};
// In the order of the start command.
extern const CodeDecoder kDecoders[8];
// The decoder of a code, or nullptr.
Decoder decoderFor(std::uint32_t code);

// The start of sub-packet `id` in a 1x sub-packet record of length
// `length`, or nothing (a bad size is logged).
std::optional<std::size_t> FindSubpacket(const PacketView& packet, std::uint8_t id, std::size_t length);

// 10 log10(raw / 512): pilot and finger energies in dB.
double energyDb(std::uint32_t raw);
// The Ec/Io of a 1x active-set pilot, in dB (floor -50 dB).
double activeSetEcIo(std::uint32_t n, std::uint32_t g, std::uint32_t x, std::uint32_t e);
// The bit totals of the data-rate records.
std::int64_t forwardBitTotal(const PacketView& packet);
std::int64_t reverseBitTotal(const PacketView& packet);

}  // namespace corvane::c2k
