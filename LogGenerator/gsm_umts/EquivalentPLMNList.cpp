#include "LogGenerator/gsm_umts/EquivalentPLMNList.h"

#include <vector>

#include "LogGenerator/gsm_umts/records/EquivalentPlmnRecord.h"
#include "LogGenerator/logcode/Rows.h"

namespace corvane {

namespace {

using namespace gsm_umts::equivalent_plmn;

const RowShape kNetworkRow = {"Mobile Country Code", "Mobile Network Code"};

// A three-digit code from its digit bytes, kept to 16 bits unsigned.
Text codeText(const records::Field& hundreds, const records::Field& tens, const records::Field& units,
              const PacketView& packet, std::size_t network) {
  return decimalText(static_cast<std::uint16_t>(100 * hundreds.raw(packet, network) + 10 * tens.raw(packet, network) +
                                                units.raw(packet, network)));
}

}  // namespace

std::optional<std::size_t> EquivalentPLMNList::network(const PacketView& packet, std::size_t i) {
  if (i >= kCount.raw(packet)) return std::nullopt;
  return kNetworks.first + kNetworks.entrySize * i;
}

void EquivalentPLMNList::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Equivalent PLMN List", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const std::uint32_t count = kCount.raw(*packet);
  if (count == 0) return;
  std::vector<Value> rows;
  rows.reserve(count);
  for (std::uint8_t i = 0; i < count; ++i) {
    const auto at = network(*packet, i);
    // Each network reads 6 bytes although the next begins 3 bytes on.
    if (!at || !entryInside(*packet, *at, kNetworkExtent)) break;
    RowWriter row = kNetworkRow.makeRow();
    row.set("Mobile Country Code", codeText(kMccHundreds, kMccTens, kMccUnits, *packet, *at));
    row.set("Mobile Network Code", codeText(kMncHundreds, kMncTens, kMncUnits, *packet, *at));
    rows.push_back(row.value());
  }
  list.install(Array(std::move(rows)));
}

}  // namespace corvane
