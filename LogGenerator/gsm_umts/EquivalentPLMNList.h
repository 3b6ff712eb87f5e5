#pragma once

// "Equivalent PLMN List": the networks that the phone may treat as its own
// registered network, one row per network.

#include <optional>

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class EquivalentPLMNList final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // Where network i of a record begins; nothing, rather than an exception,
  // for i at or beyond the record's count.
  static std::optional<std::size_t> network(const PacketView& packet, std::size_t i);
};

}  // namespace corvane
