// The EV-DO status (0x1183), EV-DO active-set pilots (0x12b6) and finger C/I
// (0x108a) decoders.

#include <cmath>

#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "LogGenerator/cdma2000/C2KText.h"
#include "LogGenerator/cdma2000/records/EvdoPilotsRecord.h"
#include "LogGenerator/cdma2000/records/EvdoStatusRecord.h"
#include "LogGenerator/cdma2000/records/FingerRecord.h"
#include "platform/Log.h"

namespace corvane::c2k {

namespace {

constexpr std::string_view kNotApplicable = "N/A";
constexpr std::string_view kNone = "(none)";

PrintedText evdoAgcText(std::int32_t dbm) { return PrintedText("%+d dBm", dbm); }
PrintedText energyText(std::uint32_t raw) { return PrintedText("%+.2f dB", energyDb(raw)); }

// A per-pilot list: "_sorted", then "index;PN" → text for each pilot.
Dictionary pilotList() {
  Dictionary list;
  list.set(kSortedMarker, Value(kSortedMarker));
  return list;
}
void addPilot(const Dictionary& list, std::size_t index, std::uint32_t pn, std::string_view text) {
  list.set(PrintedText("%d;%d", static_cast<int>(index), static_cast<int>(pn)), Value(text));
}

}  // namespace

double energyDb(std::uint32_t raw) { return 10.0 * std::log10(raw / 512.0); }

void decodeEvdoStatus(Packet bytes, const Dictionary& /*state*/, const Dictionary* lookup) {
  using namespace records::evdo_status;
  if (bytes.size() != kSize) {
    log::printf(log::kError, "Log code 0x1183 is %u bytes long but should be %lu bytes.",
                static_cast<unsigned>(bytes.size()), static_cast<unsigned long>(kSize));
    return;
  }
  const PacketView p(bytes);
  const std::uint32_t state = kDeviceState.raw(p);
  const bool transmitting = state >= kFirstTransmittingState;
  SetLookupValue("kChannel", PrintedText("%d", static_cast<int>(kChannelLow.raw(p) | kChannelHigh.raw(p) << 8)),
                 lookup);
  SetLookupValue("k1xEVDODeviceState", tableText(kDeviceState, state), lookup);
  SetLookupValue("kBandClass", tableText(kBandClass, kBandClass.raw(p)), lookup);
  SetLookupValue("kRxAGC0", evdoAgcText(kRxAgc0.number(p)), lookup);
  SetLookupValue("kRxAGC1", transmitting ? std::string_view(evdoAgcText(kRxAgc1.number(p))) : kNotApplicable, lookup);
  SetLookupValue("kTxAGC", transmitting ? std::string_view(evdoAgcText(kTxAgc.number(p))) : kNotApplicable, lookup);
  const std::uint32_t pn = kPnOffset.raw(p);
  SetLookupValue("kServingPNOffset",
                 pn == kInvalidPnOffset ? PrintedText("Invalid Value")
                                        : PrintedText("%d \xC3\x97 64chips", static_cast<int>(pn)),
                 lookup);
  SetLookupValue("kSessionState", tableText(kSessionState, kSessionState.raw(p)), lookup);
  SetLookupValue("kUATI24", PrintedText("0x%06x", kUatiLow.raw(p) | kUatiHigh.raw(p) << 16), lookup);
  SetLookupValue("kColorCode", PrintedText("%d", static_cast<int>(kColorCode.raw(p))), lookup);
}

void decodeEvdoPilots(Packet bytes, const Dictionary& /*state*/, const Dictionary* lookup) {
  using namespace records::evdo_pilots;
  if (bytes.size() < kMinimumSize) {
    log::printf(log::kError, "Log code 0x12b6 is %u bytes long but must be at least %lu bytes.",
                static_cast<unsigned>(bytes.size()), static_cast<unsigned long>(kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  const std::uint32_t n = kPilotCount.raw(p);
  if (bytes.size() < kPilots.first + kPilots.entrySize * n) {
    log::printf(log::kError, "Log code 0x12b6 is %u bytes long, but has %d substructs.",
                static_cast<unsigned>(bytes.size()), static_cast<int>(n));
    return;
  }
  if (n == 0) {
    SetLookupValue("kActiveSetPilots", kNone, lookup);
    return;
  }
  const Dictionary list = pilotList();
  for (std::size_t i = 0; i < n; ++i) {
    const std::size_t entry = kPilots.first + kPilots.entrySize * i;
    addPilot(list, i, kPilotPn.raw(p, entry), energyText(kPilotEnergy.raw(p, entry)));
  }
  SetLookupValue("kActiveSetPilots", Value(list), lookup);
}

void decodeFingers(Packet bytes, const Dictionary& /*state*/, const Dictionary* lookup) {
  using namespace records::finger;
  if (bytes.size() < kMinimumSize) {
    log::printf(log::kError, "Log code 0x108a is %u bytes long but must be at least %lu bytes.",
                static_cast<unsigned>(bytes.size()), static_cast<unsigned long>(kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  const std::uint32_t n = kFingerCount.raw(p);
  if (bytes.size() != kFingers.first + kFingers.entrySize * n) {
    // The message has always named the fixed part's size as the entry size.
    log::printf(log::kError, "Log code 0x108a has bad length of %u bytes, but has %d substructs (size=%lu).",
                static_cast<unsigned>(bytes.size()), static_cast<int>(n), static_cast<unsigned long>(kMinimumSize));
    return;
  }
  const Dictionary list = pilotList();
  bool anyFinger = false;
  for (std::size_t i = 0; i < n; ++i) {
    const std::size_t entry = kFingers.first + kFingers.entrySize * i;
    const std::uint32_t pn = kPilotPn.raw(p, entry);
    if (pn == kUnassignedPn) continue;
    addPilot(list, i, pn, energyText(kCarrierToInterference.raw(p, entry)));
    anyFinger = true;
  }
  if (anyFinger) {
    SetLookupValue("kFingerC2I", Value(list), lookup);
  } else {
    SetLookupValue("kFingerC2I", kNone, lookup);
  }
}

}  // namespace corvane::c2k
