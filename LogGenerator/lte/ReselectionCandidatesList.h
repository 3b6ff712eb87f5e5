#pragma once

// "Reselection Candidates List": the cells, of any radio technology, that the
// baseband would reselect to from the serving cell of "Reselection Candidates",
// one row per candidate.
//
// Candidates begin 4 bytes apart although a candidate's fields reach up to 12
// bytes from its start: candidates overlap. That is the layout the baseband
// sends, and the list reads it so.

#include "LogGenerator/logcode/Base.h"
#include "LogGenerator/lte/records/ReselectionCandidatesRecord.h"

namespace corvane {

class ReselectionCandidatesList final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  struct LteFields {
    std::uint32_t earfcn;
    std::uint32_t cellId;
  };
  struct UtranFields {
    std::uint32_t uarfcn;
    std::uint32_t psc;
  };
  struct GeranFields {
    std::uint32_t arfcn;
    std::uint32_t band;
    std::uint32_t bsicId;
  };
  // 1xRTT and HRPD candidates share one layout.
  struct CdmaFields {
    std::uint32_t band;
    std::uint32_t channel;
    std::uint32_t pilot;
  };

  // One candidate, read where it begins.
  class Candidate {
   public:
    static constexpr std::uint32_t kLte = ::corvane::lte::reselection::kLte;
    static constexpr std::uint32_t kUtran = ::corvane::lte::reselection::kUtran;
    static constexpr std::uint32_t kGeran = ::corvane::lte::reselection::kGeran;
    static constexpr std::uint32_t kCdma1xRtt = ::corvane::lte::reselection::kCdma1xRtt;
    static constexpr std::uint32_t kCdmaHrpd = ::corvane::lte::reselection::kCdmaHrpd;
    // The header: priority and technology.
    static constexpr std::size_t kHeaderSize = ::corvane::lte::reselection::kHeaderSize;

    Candidate(const PacketView& packet, std::size_t offset) : packet_(packet), offset_(offset) {}
    std::size_t offset() const { return offset_; }
    std::uint32_t priority() const { return ::corvane::lte::reselection::kPriority.raw(packet_, offset_); }
    std::uint32_t technology() const { return ::corvane::lte::reselection::kTechnology.raw(packet_, offset_); }
    // How far from the candidate's start its fields reach: the header alone for
    // a technology the list does not know.
    std::size_t extent() const;

    // The fields of the candidate's own technology. Asking for those of another
    // technology throws ArrayOutOfBoundsException.
    LteFields lte() const;
    UtranFields utran() const;
    GeranFields geran() const;
    CdmaFields cdma() const;

   private:
    void require(bool ownTechnology) const;

    PacketView packet_;
    std::size_t offset_;
  };

  // The candidates of a record: the 16-bit count at 19, a candidate every
  // 4 bytes from 21.
  class Candidates {
   public:
    explicit Candidates(const PacketView& packet)
        : packet_(packet), entries_(::corvane::lte::reselection::kCount.raw(packet), ::corvane::lte::reselection::kCandidates) {}
    // The whole 16-bit count, which bounds the accessor.
    std::size_t count() const { return entries_.count(); }
    // Only the low byte of the count says how many candidates the list shows.
    std::uint8_t listedCount() const { return static_cast<std::uint8_t>(entries_.count() & 0xFF); }
    // Throws ArrayOutOfBoundsException for i at or beyond count().
    Candidate candidate(std::size_t i) const { return Candidate(packet_, entries_.entryOffset(i)); }

   private:
    PacketView packet_;
    BoundedList entries_;
  };
};

}  // namespace corvane
