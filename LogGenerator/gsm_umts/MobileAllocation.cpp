#include "LogGenerator/gsm_umts/MobileAllocation.h"

#include "LogGenerator/gsm_umts/records/MobileAllocationRecord.h"
#include "LogGenerator/logcode/Rows.h"

namespace corvane {

namespace {

using namespace gsm_umts::mobile_allocation;

constexpr RowField kRows[] = {{"HSN", kHsn}};

}  // namespace

BoundedList MobileAllocation::arfcns(const PacketView& packet) { return BoundedList(kCount.raw(packet), kArfcns); }

void MobileAllocation::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("MobileAllocation", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, *packet);
  // The row's value is a list of its own, replaced whole.
  const Array texts = rowsOfEntries(*packet, arfcns(*packet), kArfcns.entrySize, [&](std::size_t entry) {
    return Value(std::string(fieldText(kArfcn, *packet, entry).view()));
  });
  setRow("ARFCNs", Value(texts));
}

}  // namespace corvane
