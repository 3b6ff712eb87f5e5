#pragma once

// The simulator's IFX scenario: a phone camped on a GSM 900 cell of the test
// network 001-01, with six neighbours. Every measurement period the levels
// take a random-walk step; quality follows level, and when a neighbour stays
// clearly stronger than the serving cell the phone hands over to it.
//
// Each packet is a binary property list of dictionaries, arrays and strings
// only, as the IFX baseband reports them. Arrays start with a title string,
// which the IFX decoder leaves out when it displays them.
//
// The sequence of packets depends only on the seed and the packet interval:
// packet n is the report of the measurement period that contains n × interval.

#include <chrono>
#include <cstdint>
#include <vector>

#include "telephonyd/PacketSource.h"
#include "telephonyd/SeededRandom.h"

namespace corvane::telephonyd {

class IFXSimulator final : public PacketSource {
 public:
  // GSM reports measurements once per SACCH multiframe period.
  static constexpr std::chrono::milliseconds kMeasurementPeriod{480};
  static constexpr std::size_t kNeighbourCount = 6;

  IFXSimulator(std::uint64_t seed, std::chrono::nanoseconds packetInterval);

  std::string_view technology() const override;
  SourcePacket nextPacket() override;

  // The report of the current measurement period.
  Value report() const;
  std::uint64_t measurementPeriod() const { return period_; }

 private:
  struct Cell {
    int lac = 0;
    int cellId = 0;
    int arfcn = 0;
    int ncc = 0;
    int bcc = 0;
    int rxLev = 0;            // 0..63, -110 dBm + value
    int strongerPeriods = 0;  // consecutive periods clearly above the serving cell
  };

  void advance();
  int uniform(int low, int high) { return random_.uniform(low, high); }
  Dictionary cellFields(const Cell& cell) const;

  SeededRandom random_;
  std::chrono::nanoseconds packetInterval_;
  std::uint64_t packetIndex_ = 0;
  std::uint64_t period_ = 0;
  Cell serving_;
  std::vector<Cell> neighbours_;
  int rxQual_ = 0;
  int timingAdvance_ = 0;
  std::uint64_t handovers_ = 0;
  std::shared_ptr<const Bytes> cached_;  // the serialised report of period_
};

}  // namespace corvane::telephonyd
