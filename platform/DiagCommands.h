#pragma once

// The commands of a baseband's diagnostic port that the service uses, inside
// the frames of platform/DiagFrames.h. Numbers are little-endian.
//
// Log packets, sent by the baseband for the codes its log mask holds:
//   0x10, a reserved byte, u16 length of the record, then the record as a DLF
//   stores it (u16 length, u16 code, u64 timestamp, payload); the lengths agree.
//
// Log configuration (0x73): a request is 0x73, three zero bytes, u32 operation,
// then the operation's fields; the reply echoes 0x73, the three bytes and the
// operation, followed by a u32 status (0 = success) and the operation's answer.
//   operation 0  disable logging (no fields)
//   operation 1  retrieve id ranges (no fields); answered by sixteen u32: the
//                number of mask bits of equipment ids 0 to 15
//   operation 3  set mask: u32 equipment id (log code >> 12), u32 number of
//                mask bits, then the mask bytes, bit (code & 0xFFF) of the id
//                least significant bit first
//
// A second subscription (0x98): 0x98, a subscription byte, two reserved bytes,
// then a command as it would stand alone; the log packets it carries are
// taken as any others.

#include <array>
#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <span>
#include <vector>

namespace corvane::diag {

inline constexpr std::uint8_t kLogCommand = 0x10;
inline constexpr std::uint8_t kLogConfigCommand = 0x73;
inline constexpr std::uint8_t kSubscriptionCommand = 0x98;
inline constexpr std::size_t kSubscriptionHeaderSize = 4;
inline constexpr std::size_t kLogFrameHeaderSize = 4;
inline constexpr std::size_t kRecordHeaderSize = 12;
inline constexpr std::size_t kEquipmentIds = 16;

enum class LogConfigOperation : std::uint32_t { Disable = 0, RetrieveIdRanges = 1, SetMask = 3 };

// The number of mask bits of each equipment id, as the baseband gave them.
using IdRanges = std::array<std::uint32_t, kEquipmentIds>;

std::vector<std::uint8_t> disableLoggingRequest();
std::vector<std::uint8_t> retrieveIdRangesRequest();
std::vector<std::uint8_t> setMaskRequest(std::uint32_t equipmentId, std::uint32_t bits,
                                         std::span<const std::uint8_t> mask);

// The mask of each equipment id in `ranges` (ids with no bits are left out),
// with the bits of the codes given; codes beyond their id's range, or of an
// id beyond 15, go to `outOfRange` and are not set.
std::map<std::uint32_t, std::vector<std::uint8_t>> logMasks(const std::set<std::uint32_t>& codes,
                                                             const IdRanges& ranges,
                                                             std::set<std::uint32_t>& outOfRange);

struct LogConfigReply {
  LogConfigOperation operation = LogConfigOperation::Disable;
  std::uint32_t status = 0;
  IdRanges ranges{};  // retrieve id ranges only
};

// A log-configuration reply frame (without its CRC); nothing for another
// command or a reply too short for its operation.
std::optional<LogConfigReply> parseLogConfigReply(std::span<const std::uint8_t> frame);

// The log-configuration request a frame holds, as a baseband reads it:
// the operation, and for set mask the id, the bits and the mask.
struct LogConfigRequest {
  LogConfigOperation operation = LogConfigOperation::Disable;
  std::uint32_t equipmentId = 0;
  std::uint32_t bits = 0;
  std::vector<std::uint8_t> mask;
};
std::optional<LogConfigRequest> parseLogConfigRequest(std::span<const std::uint8_t> frame);
std::vector<std::uint8_t> logConfigReply(LogConfigOperation operation, std::uint32_t status,
                                         const IdRanges* ranges = nullptr);

// The record a log frame carries; nothing for another command or a frame
// whose lengths disagree.
std::optional<std::span<const std::uint8_t>> logRecordOfFrame(std::span<const std::uint8_t> frame);
// The log frame of a record.
std::vector<std::uint8_t> logFrame(std::span<const std::uint8_t> record);

// The command a second-subscription frame wraps; nothing for another command
// or a frame too short to wrap one.
std::optional<std::span<const std::uint8_t>> unwrapSubscription(std::span<const std::uint8_t> frame);

}  // namespace corvane::diag
