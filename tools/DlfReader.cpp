// Reading DLF files: see PacketInput.h for the rules.

#include <algorithm>
#include <cstdint>
#include <string_view>

#include "PacketInput.h"

namespace corvane::tools {

namespace {

constexpr std::size_t kRecordHeaderSize = 12;
constexpr std::uint16_t kVersionReportCode = 0x1FFD;
constexpr std::size_t kVersionReportSize = 161;
constexpr std::size_t kExecutableNameOffset = 23;
// The application's version report names its executable with this literal, NUL included.
constexpr std::string_view kApplicationExecutableName{"EXECUTABLE_NAME\0", 16};
constexpr std::uint8_t kTypeOrdinary = 0x01;
constexpr std::uint8_t kTypeExtraCode = 0xFF;
constexpr std::string_view kBinaryPropertyListMagic = "bplist00";
// Record by record, any size reads in one pass. With type bytes the reader
// keeps a table of 8 bytes per byte of the file; the application's DLFs hold
// five display intervals, far below this.
constexpr std::size_t kLargestDlf = std::size_t{1} << 30;
constexpr std::size_t kLargestDlfWithTypeBytes = std::size_t{256} << 20;

bool isTypeByte(std::uint8_t b) { return b == kTypeOrdinary || b == kTypeExtraCode; }

std::size_t le16(std::span<const std::uint8_t> data, std::size_t at) {
  return static_cast<std::size_t>(data[at]) | static_cast<std::size_t>(data[at + 1]) << 8;
}

std::string_view textAt(std::span<const std::uint8_t> data, std::size_t at, std::size_t length) {
  return {reinterpret_cast<const char*>(data.data() + at), length};
}

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

bool opensWithApplicationVersionReport(std::span<const std::uint8_t> data) {
  return data.size() >= kVersionReportSize && le16(data, 0) == kVersionReportSize &&
         le16(data, 2) == kVersionReportCode &&
         textAt(data, kExecutableNameOffset, kApplicationExecutableName.size()) == kApplicationExecutableName;
}

// One record as read, with its type byte when the file holds one.
struct Step {
  std::size_t at = 0;  // of the record
  std::size_t length = 0;
  bool typed = false;
};

// Reads records one after the other; returns where reading stopped.
std::size_t readRecordsOnly(std::span<const std::uint8_t> dlf, std::vector<Step>& steps) {
  std::size_t at = 0;
  while (at < dlf.size()) {
    const std::size_t length = wholeRecordAt(dlf, at);
    if (length == 0) break;
    steps.push_back({at, length, false});
    at += length;
  }
  return at;
}

// How the file reads from an offset on, with each choice made the best way:
// where reading ends (best at the end, then at a record cut off by it, worst
// at bytes that are no record), how many records it reads, how many of them
// without a type byte, and the choice at this offset.
enum class Ending : std::uint8_t { AtEnd, Truncated, Garbage };
enum class Choice : std::uint8_t { None, Record, TypedRecord };

struct Reading {
  std::uint32_t records = 0;
  std::uint16_t untyped = 0;  // saturates; the application writes one per display interval
  Ending ending = Ending::AtEnd;
  Choice choice = Choice::None;
};

bool better(const Reading& a, const Reading& b) {
  if (a.ending != b.ending) return a.ending < b.ending;
  if (a.records != b.records) return a.records > b.records;
  return a.untyped < b.untyped;
}

Reading after(const Reading& next, Choice choice) {
  Reading reading = next;
  reading.records = next.records + 1;
  if (choice == Choice::Record && reading.untyped < UINT16_MAX) ++reading.untyped;
  reading.choice = choice;
  return reading;
}

// Finds the best reading of the whole file, from the end backwards: the best
// reading from each offset follows from those of the offsets after it. Returns
// where reading stops.
std::size_t readWithTypeBytes(std::span<const std::uint8_t> dlf, std::vector<Step>& steps) {
  const std::size_t size = dlf.size();
  std::vector<Reading> best(size + 1);
  for (std::size_t at = size; at-- > 0;) {
    Reading chosen;
    bool any = false;
    if (const std::size_t length = wholeRecordAt(dlf, at)) {
      chosen = after(best[at + length], Choice::Record);
      any = true;
    }
    if (isTypeByte(dlf[at]) && at + 1 < size) {
      if (const std::size_t length = wholeRecordAt(dlf, at + 1)) {
        const Reading typed = after(best[at + 1 + length], Choice::TypedRecord);
        // On a tie, no type byte (see PacketInput.h).
        if (!any || better(typed, chosen)) chosen = typed;
        any = true;
      }
    }
    if (!any) chosen.ending = cutRecordAt(dlf, at) ? Ending::Truncated : Ending::Garbage;
    best[at] = chosen;
  }

  std::size_t at = 0;
  while (at < size && best[at].choice != Choice::None) {
    const bool typed = best[at].choice == Choice::TypedRecord;
    const std::size_t recordAt = typed ? at + 1 : at;
    const std::size_t length = le16(dlf, recordAt);
    steps.push_back({recordAt, length, typed});
    at = recordAt + length;
  }
  return at;
}

std::uint8_t typeOfUntypedRecord(std::span<const std::uint8_t> record) {
  const auto payload = record.subspan(kRecordHeaderSize);
  const bool propertyList = payload.size() >= kBinaryPropertyListMagic.size() &&
                            textAt(payload, 0, kBinaryPropertyListMagic.size()) == kBinaryPropertyListMagic;
  return propertyList ? kTypeExtraCode : kTypeOrdinary;
}

}  // namespace

std::optional<PacketList> packetsFromDlf(std::span<const std::uint8_t> dlf, const std::string& source,
                                         InputError& error) {
  const bool typeBytes = opensWithApplicationVersionReport(dlf);
  if (dlf.size() > (typeBytes ? kLargestDlfWithTypeBytes : kLargestDlf)) {
    error.message = source + ": DLF files larger than " + (typeBytes ? "256 MiB" : "1 GiB") + " are not read";
    return std::nullopt;
  }
  std::vector<Step> steps;
  const std::size_t stop = typeBytes ? readWithTypeBytes(dlf, steps) : readRecordsOnly(dlf, steps);
  if (stop == 0 && !dlf.empty()) {
    error.message = source + ": not a DLF file: no whole log record at offset 0";
    return std::nullopt;
  }
  if (stop < dlf.size() && !cutRecordAt(dlf, stop)) {
    error.message = source + ": no log record at offset " + std::to_string(stop) + ": the DLF is damaged there";
    return std::nullopt;
  }

  PacketList list;
  list.packets.reserve(steps.size());
  for (const Step& step : steps) {
    const auto record = dlf.subspan(step.at, step.length);
    const std::uint8_t type = step.typed ? dlf[step.at - 1] : typeOfUntypedRecord(record);
    if (type == kTypeOrdinary && le16(record, 2) == kVersionReportCode) continue;
    Bytes packet;
    packet.reserve(record.size() + 1);
    packet.push_back(type);
    packet.insert(packet.end(), record.begin(), record.end());
    list.packets.push_back(std::move(packet));
  }
  if (stop < dlf.size()) {
    list.warnings.push_back(source + ": truncated record at offset " + std::to_string(stop) + "; its " +
                            std::to_string(dlf.size() - stop) + " bytes are left out");
  }
  return list;
}

}  // namespace corvane::tools
