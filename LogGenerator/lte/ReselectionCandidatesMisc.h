#pragma once

// "Reselection Candidates": the serving cell that the reselection candidate
// list of the same record ("Reselection Candidates List") refers to.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ReselectionCandidatesMisc final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
