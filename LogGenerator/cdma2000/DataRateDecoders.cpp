// The EV-DO forward-link (0x1192) and reverse-link (0x127e) data rates: each
// record's bit total against the previous record's, over the growth of the
// sequence value.

#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "LogGenerator/cdma2000/C2KText.h"
#include "LogGenerator/cdma2000/records/DataRateRecords.h"
#include "LogGenerator/LogGenerator.h"
#include "platform/Log.h"

namespace corvane::c2k {

namespace {

// What one link keeps and shows.
struct LinkKeys {
  std::string_view sequence;        // state: the last record's sequence value
  std::string_view sent;            // state: the last record's bit total
  std::string_view rate;            // lookup key of the rate
  std::string_view lastSequence;    // "ExtraInfo": this record's values
  std::string_view lastSent;
  std::string_view earlierSequence;  // "ExtraInfo": the previous record's values
  std::string_view earlierSent;
};

constexpr LinkKeys kForward{kFLDataSeqNum, kFLDataSent,     "kFLDataRate",  "FLDataSeqNum1",
                            "FLDataSent1", "FLDataSeqNum2", "FLDataSent2"};
constexpr LinkKeys kReverse{kRLDataSeqNum, kRLDataSent,     "kRLDataRate",  "RLDataSeqNum1",
                            "RLDataSent1", "RLDataSeqNum2", "RLDataSent2"};

// The steps of the sequence value are 1024 units of the bit total's time base.
constexpr double kUnitsPerStep = 1024.0;

std::optional<std::int64_t> integerIn(const Dictionary& state, std::string_view key) {
  const Value* v = state.find(key);
  const std::int64_t* i = v ? v->asInteger() : nullptr;
  return i ? std::optional<std::int64_t>(*i) : std::nullopt;
}

void updateRate(const LinkKeys& keys, std::uint32_t sequence, std::int64_t total, const Dictionary& state,
                const Dictionary* lookup) {
  // Handles and values of their own: setting entries of the state may move its values.
  const Value extra = state.get(kStateExtraInfo);
  const Dictionary* extraInfo = extra.asDictionary();
  const std::optional<std::int64_t> previousSequence = integerIn(state, keys.sequence);
  const std::optional<std::int64_t> previousTotal = integerIn(state, keys.sent);
  if (previousSequence && previousTotal) {
    const auto steps = static_cast<std::int32_t>(sequence - static_cast<std::uint32_t>(*previousSequence));
    if (steps >= 1) {
      const std::int64_t bits = static_cast<std::int64_t>(static_cast<std::uint64_t>(total) -
                                                          static_cast<std::uint64_t>(*previousTotal));
      SetLookupValue(keys.rate, PrintedText("%.2f kbps", static_cast<double>(bits) / (steps * kUnitsPerStep)),
                     lookup);
    }
    if (extraInfo) {
      extraInfo->set(keys.earlierSequence, Value::integer(*previousSequence));
      extraInfo->set(keys.earlierSent, Value::integer(*previousTotal));
    }
  } else {
    SetLookupValue(keys.rate, std::string_view(), lookup);
  }
  const auto stored = static_cast<std::int32_t>(sequence);
  state.set(keys.sequence, Value::integer(stored));
  state.set(keys.sent, Value::integer(total));
  if (extraInfo) {
    extraInfo->set(keys.lastSequence, Value::integer(stored));
    extraInfo->set(keys.lastSent, Value::integer(total));
  }
}

}  // namespace

std::int64_t forwardBitTotal(const PacketView& p) {
  using namespace records::forward_rate;
  std::int64_t total = 0;
  for (std::size_t i = 0; i < kBitsPerCount.size(); ++i) {
    total += static_cast<std::int64_t>(counter(i).raw(p)) * kBitsPerCount[i];
  }
  return total;
}

std::int64_t reverseBitTotal(const PacketView& p) {
  using namespace records::reverse_rate;
  std::int64_t total = 0;
  for (std::size_t rate = 0; rate < kBitsPerCount.size(); ++rate) {
    std::int64_t count = 0;
    for (std::size_t block = 0; block < kBlocks; ++block) {
      for (std::size_t n = 0; n < kCountersPerEntry; ++n) count += counter(block, rate, n).raw(p);
    }
    total += count * kBitsPerCount[rate];
  }
  return total;
}

void decodeForwardLinkRate(Packet bytes, const Dictionary& state, const Dictionary* lookup) {
  using namespace records::forward_rate;
  if (bytes.size() < kMinimumSize) {
    log::printf(log::kError, "Log code 0x1192 is %d bytes long but must be at least %ld bytes.",
                static_cast<int>(bytes.size()), static_cast<long>(kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  updateRate(kForward, kSequence.raw(p), forwardBitTotal(p), state, lookup);
}

void decodeReverseLinkRate(Packet bytes, const Dictionary& state, const Dictionary* lookup) {
  using namespace records::reverse_rate;
  if (bytes.size() < kMinimumSize) {
    log::printf(log::kError, "Log code 0x127e is %d bytes long but must be at least %ld bytes.",
                static_cast<int>(bytes.size()), static_cast<long>(kMinimumSize));
    return;
  }
  const PacketView p(bytes);
  updateRate(kReverse, kSequence.raw(p), reverseBitTotal(p), state, lookup);
}

}  // namespace corvane::c2k
