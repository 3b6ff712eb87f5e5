#pragma once

// How the UTRAN sections take a packet: each traces its own line, at its own
// priority, on every call; a packet of another code, or one shorter than the
// record, is then dropped without a further message and the section's values
// stay as they were.

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

#include "LogGenerator/logcode/PacketView.h"
#include "platform/Log.h"

namespace corvane::utran {

inline std::optional<PacketView> acceptPacket(int priority, std::string_view trace, std::span<const std::uint8_t> data,
                                              std::uint32_t logCode, std::uint32_t ownCode,
                                              std::size_t minimumLength) {
  log::write(priority, trace);
  if (logCode != ownCode || data.size() < minimumLength) return std::nullopt;
  return PacketView(data);
}

}  // namespace corvane::utran
