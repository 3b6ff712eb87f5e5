#pragma once

// The UMTS set log (0x417A) as its four sections read it: the cells and their
// energy blocks through bounded accessors, and the walk of the three sections
// that read the record but list none of its cells.

#include <string_view>

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class CellSetLog {
 public:
  // The cells of a record: the count at 15, 15 bytes a cell from 16.
  static BoundedList cells(const PacketView& packet);
  // Their energy blocks, 44 bytes each, right behind the last cell; bounded
  // by the same count.
  static BoundedList energyBlocks(const PacketView& packet);
  // A cell's Ec/Io from its energy block: the first of its three values that
  // is not 0, or 0.
  static std::uint32_t energy(const PacketView& packet, std::size_t block);
};

// "Detected Set", "Monitored Set" and "Virtual Active Set": each walks the
// cells of every set log and reads their set type, but builds no row, so its
// list shows empty after any record. The walk stays, bounded accessors and
// all: it is what these sections do with the record.
class UnlistedCellSet : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

 protected:
  explicit UnlistedCellSet(std::string_view trace) : trace_(trace) {}

 private:
  std::string_view trace_;
};

}  // namespace corvane
