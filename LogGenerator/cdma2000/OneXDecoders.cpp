// The 1x decoders: status with its sub-packets (0x119c), traffic frame-error
// rate (0x119d) and system (0x134f).

#include <cmath>

#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "LogGenerator/cdma2000/C2KText.h"
#include "LogGenerator/cdma2000/records/OneXSystemRecord.h"
#include "LogGenerator/cdma2000/records/SubpacketRecord.h"
#include "platform/Log.h"

namespace corvane::c2k {

namespace {

constexpr std::string_view kNotApplicable = "N/A";
// The weight of a new frame in the filtered frame-error rate, and of the past.
constexpr float kNewFrameWeight = 0.015625f;
constexpr float kPastWeight = 0.984375f;
// The Ec/Io floor: 10 log10(0.00001) = -50 dB.
constexpr double kEcIoFloor = 0.00001;

PrintedText rxAgcText(std::int32_t raw) { return PrintedText("%+.2f dBm", raw * 334.0 / 1000.0 - 63.248); }
PrintedText txAgcText(std::int32_t raw) { return PrintedText("%+.2f dBm", raw / 10.0); }

// A number kept in the state, or nothing.
std::optional<double> stateNumber(const Dictionary& state, std::string_view key) {
  const Value* v = state.find(key);
  if (!v) return std::nullopt;
  if (const double* r = v->asReal()) return *r;
  if (const std::int64_t* i = v->asInteger()) return static_cast<double>(*i);
  return std::nullopt;
}

// The active-set list of sub-packet 3 at `at`. A pilot record that the packet
// does not wholly hold ends the list.
Dictionary activeSetList(const PacketView& p, std::size_t at) {
  using namespace records::onex_status;
  Dictionary list;
  list.set(kSortedMarker, Value(kSortedMarker));
  const std::uint32_t n = kTotalEnergyN.raw(p, at);
  const std::uint32_t g = kGainG.raw(p, at);
  const std::uint32_t x = kExponentX.raw(p, at);
  const std::uint32_t count = kPilotCount.raw(p, at);
  const std::uint32_t m = kPilotM.raw(p, at);
  const std::uint32_t referencePn = kReferencePn.raw(p, at);
  const std::size_t stride = pilotStride(m);
  const records::Field energy = pilotEnergy(m);
  for (std::size_t i = 0; i < count; ++i) {
    const std::size_t record = at + kFirstPilot + stride * i;
    if (!p.covers(record, energy.end())) break;
    const std::uint32_t pn = kPilotPn.raw(p, record);
    const double ecIo = activeSetEcIo(n, g, x, energy.raw(p, record));
    const PrintedText key("%d;%d", static_cast<int>(i), static_cast<int>(pn));
    list.set(key, Value(pn == referencePn ? std::string_view(PrintedText("(ref pilot) %+.2f dB", ecIo))
                                          : std::string_view(PrintedText("%+.2f dB", ecIo))));
  }
  return list;
}

}  // namespace

double activeSetEcIo(std::uint32_t n, std::uint32_t g, std::uint32_t x, std::uint32_t e) {
  const double nd = n;
  const double linear = std::exp2(2.0 * x - 3.0) * e / (9.0 * g * nd * nd) - 1.0 / nd;
  // fmax: a NaN (G or N of zero) gives the floor.
  return 10.0 * std::log10(std::fmax(linear, kEcIoFloor));
}

std::optional<std::size_t> FindSubpacket(const PacketView& packet, std::uint8_t id, std::size_t length) {
  using namespace records::subpackets;
  const std::uint32_t count = kCount.raw(packet);
  if (count == 0) return std::nullopt;
  std::size_t start = kFirst;
  for (std::uint32_t index = 0;;) {
    const std::uint32_t size = kSize.raw(packet, start);
    const std::size_t next = start + size;
    // The bound counts the length from the first sub-packet, not from the packet's start.
    if (next >= kFirst + length) {
      log::printf(log::kError, "Log code error in subpkt#%d: bad size (%d).", static_cast<int>(index),
                  static_cast<int>(size));
      return std::nullopt;
    }
    if (kId.raw(packet, start) == id) return start;
    if (++index == count) return std::nullopt;
    start = next;
  }
}

void decode1xStatus(Packet bytes, const Dictionary& state, const Dictionary* lookup) {
  using namespace records::onex_status;
  if (bytes.size() < records::subpackets::kMinimumSize) {
    log::printf(log::kError, "Log code 0x119c is %u bytes long but must be at least %lu bytes.",
                static_cast<unsigned>(bytes.size()), static_cast<unsigned long>(records::subpackets::kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  const auto system = FindSubpacket(p, kSystemStateId, bytes.size());
  const auto radio = FindSubpacket(p, kRadioId, bytes.size());
  const auto activeSet = FindSubpacket(p, kActiveSetId, bytes.size());
  const auto fingers = FindSubpacket(p, kFingerId, bytes.size());
  if (!system || !radio || !activeSet || !fingers) {
    log::printf(log::kWarning, "Log code 0x119c: missing subpacket (ss=%d,rf=%d,ai=%d,fi=%d).", system ? 1 : 0,
                radio ? 1 : 0, activeSet ? 1 : 0, fingers ? 1 : 0);
    return;
  }
  const std::uint32_t s = kDeviceState.raw(p, *system);
  const bool traffic = s == kTrafficState;
  const std::size_t r = *radio;
  SetLookupValue("k1xDeviceState", tableText(kDeviceState, s), lookup);
  SetLookupValue("k1xRx0BandClass", tableText(kRx0BandClass, kRx0BandClass.raw(p, r)), lookup);
  SetLookupValue("k1xRx0ChanNum", PrintedText("%d", static_cast<int>(kRx0Channel.raw(p, r))), lookup);
  SetLookupValue("k1xRxAGC0", rxAgcText(kRxAgc0.number(p, r)), lookup);
  SetLookupValue("k1xRx1BandClass",
                 traffic ? std::string_view(tableText(kRx1BandClass, kRx1BandClass.raw(p, r))) : kNotApplicable,
                 lookup);
  SetLookupValue("k1xRx1ChanNum",
                 traffic ? std::string_view(PrintedText("%d", static_cast<int>(kRx1Channel.raw(p, r))))
                         : kNotApplicable,
                 lookup);
  SetLookupValue("k1xRxAGC1", traffic ? std::string_view(rxAgcText(kRxAgc1.number(p, r))) : kNotApplicable, lookup);
  SetLookupValue("k1xTxAGC", traffic ? std::string_view(txAgcText(kTxAgc.number(p, r))) : kNotApplicable, lookup);
  SetLookupValue("k1xActiveSetInfo", Value(activeSetList(p, *activeSet)), lookup);

  if (!traffic) {
    if (const auto fer = stateNumber(state, kTrafficFER)) {
      SetLookupValue("k1xTrafficFER", PrintedText("%.02f%% (old)", static_cast<float>(*fer) * 100.0f), lookup);
      // The next traffic period starts its filter afresh.
      state.remove(kTrafficFER);
    }
  }
}

void decode1xTrafficFER(Packet bytes, const Dictionary& state, const Dictionary* lookup) {
  using namespace records::onex_traffic;
  if (bytes.size() < records::subpackets::kMinimumSize) {
    log::printf(log::kError, "Log code 0x119d is %d bytes long but must be at least %ld bytes.",
                static_cast<int>(bytes.size()), static_cast<long>(records::subpackets::kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  const auto demod = FindSubpacket(p, kTrafficDemodId, bytes.size());
  if (!demod) {
    log::printf(log::kWarning, "Log code 0x119d: missing traffic demod subpacket.");
    return;
  }
  const float error = kFrameError.raw(p, *demod) != 0 ? 1.0f : 0.0f;
  float filtered = error * kNewFrameWeight;
  if (const auto previous = stateNumber(state, kTrafficFER)) filtered += static_cast<float>(*previous) * kPastWeight;
  state.set(kTrafficFER, Value::real(filtered));
  SetLookupValue("k1xTrafficFER", PrintedText("%.02f%%", filtered * 100.0f), lookup);
}

void decode1xSystem(Packet bytes, const Dictionary& /*state*/, const Dictionary* lookup) {
  using namespace records::onex_system;
  if (bytes.size() < kMinimumSize) {
    log::printf(log::kError, "Log code 0x134f is %d bytes long but must be at least %lu bytes.",
                static_cast<int>(bytes.size()), static_cast<unsigned long>(kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  const std::uint32_t version = kVersion.raw(p);
  if (version < kFirstVersion) {
    log::printf(log::kError, "Log code 0x134f has version=%d; only version 2 or higher expected; dropping.",
                static_cast<int>(version));
    return;
  }
  // A negative indicator matches no line of the table and shows as negative.
  SetLookupValue("k1xRoamingHome", tableText(kRoamingIndicator, kRoamingIndicator.raw(p)), lookup);
  const std::uint32_t systemType = kSystemType.raw(p);
  const bool known = systemType == kSystemTypeIs95;
  const PrintedText unknown("(unknown system type %d)", static_cast<int>(systemType));
  SetLookupValue("kSystemId", known ? std::string_view(PrintedText("%d", static_cast<int>(kSid.raw(p)))) : unknown,
                 lookup);
  SetLookupValue("kNetworkId", known ? std::string_view(PrintedText("%d", static_cast<int>(kNid.raw(p)))) : unknown,
                 lookup);
  SetLookupValue("kPacketZoneId", PrintedText("%d", static_cast<int>(kPacketZone.raw(p))), lookup);
  // Beyond the length checked above: a shorter record reads it as zero.
  SetLookupValue("kBaseId", PrintedText("%d", static_cast<int>(kBaseId.raw(p))), lookup);
  SetLookupValue("kProtocolRevision", PrintedText("%d", static_cast<int>(kProtocolRevision.raw(p))), lookup);
}

}  // namespace corvane::c2k
