#pragma once

// "Reselection Candidates": the serving cell that the reselection candidate
// list of the same record ("Reselection Candidates List") refers to.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ReselectionCandidatesMisc final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
  std::string getSectionName() const override { return "Reselection Candidates"; }
  std::vector<std::uint32_t> getLogCodeArray() const override { return {0xB186}; }
};

}  // namespace corvane
