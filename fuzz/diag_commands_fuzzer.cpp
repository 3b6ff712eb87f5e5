// The diagnostic-port commands over arbitrary frames: replies, requests, log
// frames and second-subscription frames are read without reading past the
// end, and what reads back encodes to the same bytes; log masks over
// arbitrary codes and id ranges set exactly the codes within range.

#include <cstdint>
#include <cstdlib>
#include <set>
#include <span>
#include <vector>

#include "platform/DiagCommands.h"

using namespace corvane::diag;

namespace {

void check(bool condition) {
  if (!condition) std::abort();
}

std::uint32_t word(std::span<const std::uint8_t> data, std::size_t at) {
  std::uint32_t value = 0;
  for (std::size_t i = 0; i < 4 && at + i < data.size(); ++i) value |= static_cast<std::uint32_t>(data[at + i]) << (8 * i);
  return value;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  const std::span<const std::uint8_t> frame(bytes, size);

  if (const auto reply = parseLogConfigReply(frame)) {
    const bool withRanges = reply->operation == LogConfigOperation::RetrieveIdRanges && reply->status == 0;
    const std::vector<std::uint8_t> again =
        logConfigReply(reply->operation, reply->status, withRanges ? &reply->ranges : nullptr);
    check(again.size() <= size && std::equal(again.begin() + 4, again.end(), frame.begin() + 4));
  }
  if (const auto request = parseLogConfigRequest(frame)) {
    const std::vector<std::uint8_t> again =
        request->operation == LogConfigOperation::SetMask
            ? setMaskRequest(request->equipmentId, request->bits, request->mask)
            : request->operation == LogConfigOperation::Disable ? disableLoggingRequest() : retrieveIdRangesRequest();
    check(again.size() <= size && std::equal(again.begin() + 4, again.end(), frame.begin() + 4));
  }
  if (const auto record = logRecordOfFrame(frame)) {
    const std::vector<std::uint8_t> again = logFrame(*record);
    check(again.size() == size && std::equal(again.begin() + 2, again.end(), frame.begin() + 2));
  }
  if (const auto inner = unwrapSubscription(frame)) check(inner->size() + kSubscriptionHeaderSize == size);

  // The first 64 bytes as sixteen ranges (kept small), the rest as codes.
  IdRanges ranges{};
  for (std::size_t id = 0; id < kEquipmentIds; ++id) ranges[id] = word(frame, 4 * id) % 0x1400;
  std::set<std::uint32_t> codes;
  for (std::size_t at = 64; at + 3 < size; at += 3) codes.insert(word(frame, at) & 0xFFFFFF);
  std::set<std::uint32_t> outOfRange;
  const auto masks = logMasks(codes, ranges, outOfRange);
  std::set<std::uint32_t> set;
  for (const auto& [id, mask] : masks) {
    check(id < kEquipmentIds && ranges[id] > 0);
    check(mask.size() == (std::min<std::uint32_t>(ranges[id], 0x1000) + 7) / 8);
    for (std::size_t bit = 0; bit < mask.size() * 8; ++bit) {
      if (mask[bit / 8] >> (bit % 8) & 1) {
        check(bit < ranges[id]);
        set.insert(id << 12 | static_cast<std::uint32_t>(bit));
      }
    }
  }
  for (std::uint32_t code : codes) check(set.count(code) + outOfRange.count(code) == 1);
  check(set.size() + outOfRange.size() == codes.size());
  return 0;
}
