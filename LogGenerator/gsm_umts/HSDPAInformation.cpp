#include "LogGenerator/gsm_umts/HSDPAInformation.h"

#include "LogGenerator/gsm_umts/records/HsdpaStatisticsRecord.h"
#include "LogGenerator/logcode/Rows.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace gsm_umts::hsdpa_statistics;

constexpr RowField kRows[] = {
    {"Version", kVersion},
    {"Sub Frames", kSubFrames},
    {"Carrier Info", kCarrier},
};
constexpr RowField kProcessRows[] = {
    {"Process ID", kProcessId},
    {"No Rx Bits", kReceivedBits},
    {"New Tx", kNewTransmissions},
    {"Block Errors", kBlockErrors},
};
const RowShape kProcessRow(kProcessRows);

// The processes are the value of one row, set anew (not a section list).
Array processRows(const PacketView& packet, const BoundedList& processes) {
  return rowsOfEntries(packet, processes, kEntrySize, [&](std::size_t entry) {
    RowWriter row = kProcessRow.makeRow();
    writeRows<kProcessRows>(row, packet, entry);
    return row.value();
  });
}

}  // namespace

BoundedList HSDPAInformation::primaryProcesses(const PacketView& packet) {
  return BoundedList(kPrimaryCount.raw(packet), kPrimaryEntries);
}

BoundedList HSDPAInformation::secondaryProcesses(const PacketView& packet) {
  return BoundedList(kSecondaryCount.raw(packet), secondaryEntries(kPrimaryCount.raw(packet)));
}

void HSDPAInformation::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "HSDPA Info");
  // Another code is dropped as a short record is, without a message.
  const PacketView packet(data);
  if (logCode != kCode || packet.size() < kMinimumLength) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, packet);
  // A carrier without processes in this record keeps the list the last one set.
  const BoundedList primary = primaryProcesses(packet);
  if (primary.count() > 0) setRow("Primary HARQ Process", Value(processRows(packet, primary)));
  const BoundedList secondary = secondaryProcesses(packet);
  if (secondary.count() > 0) setRow("Secondary HARQ Process", Value(processRows(packet, secondary)));
}

}  // namespace corvane
