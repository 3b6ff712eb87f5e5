#pragma once

// The payloads of the extra codes that the telephony service adds to the
// baseband's log codes: a serialised property list behind the usual 13-byte
// record header. 0xFF0000 carries the SIM files (a dictionary), 0xFF0001 the
// cell-monitor cell list (an array), 0xFF0002 the PDP contexts (an array).
// A record shorter than its header has an empty payload, which does not parse.

#include <cstdint>
#include <exception>
#include <optional>
#include <span>
#include <string_view>

#include "platform/Value.h"

namespace corvane {

inline constexpr std::uint32_t kExtraCodeBase = 0xFF0000;
inline constexpr std::uint32_t kExtraCodeSimFiles = 0xFF0000;
inline constexpr std::uint32_t kExtraCodeCellList = 0xFF0001;
inline constexpr std::uint32_t kExtraCodePDPContexts = 0xFF0002;
inline constexpr std::size_t kLogRecordHeaderSize = 13;

// The SIM-file dictionary. A payload that does not parse as a dictionary is
// logged ("SIM File dictionary data could not be constructed") and thrown.
class LogCode_0xFF0000 {
 public:
  struct UnknownDataException : std::exception {};

  explicit LogCode_0xFF0000(std::span<const std::uint8_t> packet);
  // The value under the key, or a null value.
  Value valueForKey(std::string_view key) const;

 private:
  Dictionary dictionary_;
};

// The cell-monitor cell list, held for the length of one decode. A payload that
// does not parse is logged ("Cell Info Array data could not be constructed")
// and the holder holds nothing; one that parses to something other than an
// array holds nothing too.
class CellInfoArray {
 public:
  explicit CellInfoArray(std::span<const std::uint8_t> packet);
  const Array* array() const { return array_ ? &*array_ : nullptr; }

  // A number of a cell dictionary as a signed 32-bit integer; nothing when the
  // key is missing or its value is not a number.
  static std::optional<std::int32_t> integerValue(const Dictionary& cell, std::string_view key);

 private:
  std::optional<Array> array_;
};

// The PDP context list: the payload when it parses to an array, else nothing,
// without a message.
class LogCode_0xFF0002 {
 public:
  explicit LogCode_0xFF0002(std::span<const std::uint8_t> packet);
  const Array* array() const { return array_ ? &*array_ : nullptr; }

 private:
  std::optional<Array> array_;
};

}  // namespace corvane
