// Reading DLF files: see PacketInput.h for the rules.

#include <cstdint>
#include <string_view>

#include "PacketInput.h"

namespace corvane::tools {

namespace {

constexpr std::size_t kRecordHeaderSize = 12;
constexpr std::uint16_t kVersionReportCode = 0x1FFD;
constexpr std::uint8_t kTypeOrdinary = 0x01;
constexpr std::uint8_t kTypeExtraCode = 0xFF;
constexpr std::string_view kBinaryPropertyListMagic = "bplist00";
// The reading of every offset is kept in 32 bits (see Reading); the record
// count of files beyond this would not fit.
constexpr std::size_t kLargestDlf = std::size_t{1} << 30;

bool isTypeByte(std::uint8_t b) { return b == kTypeOrdinary || b == kTypeExtraCode; }

std::size_t le16(std::span<const std::uint8_t> data, std::size_t at) {
  return static_cast<std::size_t>(data[at]) | static_cast<std::size_t>(data[at + 1]) << 8;
}

// How the file reads from an offset on, when each choice is made the best way:
// the number of whole records up to where reading stops, why it stops there,
// and the choice at this offset. Packed in 32 bits: the tables are as long as the file.
enum class Ending : std::uint32_t { AtEnd = 0, Truncated = 1, Garbage = 2 };
enum class Choice : std::uint32_t { None = 0, Record = 1, TypedRecord = 2 };

struct Reading {
  std::uint32_t packed = 0;

  static Reading of(std::uint32_t records, Ending ending, Choice choice) {
    return {records << 4 | static_cast<std::uint32_t>(ending) << 2 | static_cast<std::uint32_t>(choice)};
  }
  std::uint32_t records() const { return packed >> 4; }
  Ending ending() const { return static_cast<Ending>(packed >> 2 & 3); }
  Choice choice() const { return static_cast<Choice>(packed & 3); }
};

// The length of the whole record at `at`, or 0 when there is none: a record
// needs a length of at least its header, and all of it within the data.
std::size_t wholeRecordAt(std::span<const std::uint8_t> data, std::size_t at) {
  const std::size_t left = data.size() - at;
  if (left < kRecordHeaderSize) return 0;
  const std::size_t length = le16(data, at);
  return length >= kRecordHeaderSize && length <= left ? length : 0;
}

// True when the bytes from `at` on look like the start of a record cut off by
// the end of the data, with or without a type byte.
bool cutRecordAt(std::span<const std::uint8_t> data, std::size_t at) {
  auto cut = [&](std::size_t from) {
    const std::size_t left = data.size() - from;
    if (left < 2) return true;  // not even the whole length field
    const std::size_t length = le16(data, from);
    return length >= kRecordHeaderSize && length > left;
  };
  return cut(at) || (isTypeByte(data[at]) && cut(at + 1));
}

bool better(Reading a, Reading b) {
  if (a.records() != b.records()) return a.records() > b.records();
  return a.ending() < b.ending();
}

Bytes packetOf(std::uint8_t type, std::span<const std::uint8_t> record) {
  Bytes packet;
  packet.reserve(record.size() + 1);
  packet.push_back(type);
  packet.insert(packet.end(), record.begin(), record.end());
  return packet;
}

std::uint8_t typeOfUntypedRecord(std::span<const std::uint8_t> record) {
  const auto payload = record.subspan(kRecordHeaderSize);
  const bool propertyList =
      payload.size() >= kBinaryPropertyListMagic.size() &&
      std::string_view(reinterpret_cast<const char*>(payload.data()), kBinaryPropertyListMagic.size()) ==
          kBinaryPropertyListMagic;
  return propertyList ? kTypeExtraCode : kTypeOrdinary;
}

}  // namespace

std::optional<PacketList> packetsFromDlf(std::span<const std::uint8_t> dlf, const std::string& source,
                                         InputError& error) {
  const std::size_t size = dlf.size();
  if (size > kLargestDlf) {
    error.message = source + ": DLF files larger than 1 GiB are not read";
    return std::nullopt;
  }

  // From the end backwards: the best reading from each offset, given the best
  // readings of the offsets after it.
  std::vector<Reading> best(size + 1);
  best[size] = Reading::of(0, Ending::AtEnd, Choice::None);
  for (std::size_t at = size; at-- > 0;) {
    Reading chosen;
    bool any = false;
    if (const std::size_t length = wholeRecordAt(dlf, at)) {
      const Reading next = best[at + length];
      chosen = Reading::of(next.records() + 1, next.ending(), Choice::Record);
      any = true;
    }
    if (isTypeByte(dlf[at]) && at + 1 < size) {
      if (const std::size_t length = wholeRecordAt(dlf, at + 1)) {
        const Reading next = best[at + 1 + length];
        const Reading typed = Reading::of(next.records() + 1, next.ending(), Choice::TypedRecord);
        if (!any || better(typed, chosen)) chosen = typed;
        any = true;
      }
    }
    if (!any) chosen = Reading::of(0, cutRecordAt(dlf, at) ? Ending::Truncated : Ending::Garbage, Choice::None);
    best[at] = chosen;
  }

  PacketList list;
  std::size_t at = 0;
  for (;;) {
    const Reading reading = best[at];
    if (reading.choice() == Choice::None) break;
    std::uint8_t type = 0;
    std::span<const std::uint8_t> record;
    if (reading.choice() == Choice::Record) {
      record = dlf.subspan(at, le16(dlf, at));
      type = typeOfUntypedRecord(record);
    } else {
      type = dlf[at];
      record = dlf.subspan(at + 1, le16(dlf, at + 1));
    }
    at = static_cast<std::size_t>(record.data() - dlf.data()) + record.size();
    const bool versionReport = type == kTypeOrdinary && le16(record, 2) == kVersionReportCode;
    if (!versionReport) list.packets.push_back(packetOf(type, record));
  }

  if (at == 0 && size > 0) {
    error.message = source + ": not a DLF file: no whole log record at offset 0";
    return std::nullopt;
  }
  switch (best[at].ending()) {
    case Ending::AtEnd:
      break;
    case Ending::Truncated:
      list.warnings.push_back(source + ": truncated record at offset " + std::to_string(at) + "; its " +
                              std::to_string(size - at) + " bytes are left out");
      break;
    case Ending::Garbage:
      error.message = source + ": no log record at offset " + std::to_string(at) + ": the DLF is damaged there";
      return std::nullopt;
  }
  return list;
}

}  // namespace corvane::tools
