// Reading snapshot files: see PacketInput.h for the rules.

#include <string_view>

#include "PacketInput.h"
#include "platform/PropertyList.h"

namespace corvane::tools {

namespace {

constexpr std::uint8_t kPrefixMarker = 0x81;
constexpr std::size_t kPrefixSize = 2;
constexpr std::size_t kRecordHeaderSize = 12;

bool isTypeByte(std::uint8_t b) { return b == 0x01 || b == 0xFF; }

std::string hexByte(std::uint8_t b) {
  static const char* digits = "0123456789abcdef";
  return std::string("0x") + digits[b >> 4] + digits[b & 15];
}

// The packets of one display interval, as the generator kept them: each as it
// was received, one after the other.
bool splitInterval(std::span<const std::uint8_t> data, const std::string& where, PacketList& list,
                   InputError& error) {
  std::size_t at = 0;
  while (at < data.size()) {
    const std::size_t left = data.size() - at;
    const std::size_t prefix = data[at] == kPrefixMarker ? kPrefixSize : 0;
    // Type byte and length field.
    if (left < prefix + 3) {
      list.warnings.push_back(where + ": truncated packet at offset " + std::to_string(at) + "; its " +
                              std::to_string(left) + " bytes are left out");
      return true;
    }
    const std::uint8_t type = data[at + prefix];
    if (!isTypeByte(type)) {
      error.message = where + ": no log packet at offset " + std::to_string(at) + ": type byte " + hexByte(type);
      return false;
    }
    const std::size_t length = static_cast<std::size_t>(data[at + prefix + 1]) |
                               static_cast<std::size_t>(data[at + prefix + 2]) << 8;
    if (length < kRecordHeaderSize) {
      error.message = where + ": no log packet at offset " + std::to_string(at) + ": record length " +
                      std::to_string(length) + " is shorter than its header";
      return false;
    }
    const std::size_t packetSize = prefix + 1 + length;
    if (packetSize > left) {
      list.warnings.push_back(where + ": truncated packet at offset " + std::to_string(at) + "; its " +
                              std::to_string(left) + " bytes are left out");
      return true;
    }
    list.packets.emplace_back(data.begin() + static_cast<std::ptrdiff_t>(at),
                              data.begin() + static_cast<std::ptrdiff_t>(at + packetSize));
    at += packetSize;
  }
  return true;
}

void appendAll(PacketList& to, PacketList&& from) {
  for (auto& packet : from.packets) to.packets.push_back(std::move(packet));
  for (auto& warning : from.warnings) to.warnings.push_back(std::move(warning));
}

const char* const kNoPackets = ": the snapshot holds no packets";

}  // namespace

bool isSnapshot(const Value& root) {
  const Dictionary* fields = root.asDictionary();
  return fields && fields->contains("Timestamp") && fields->contains("Data");
}

std::optional<PacketList> packetsFromSnapshot(const Value& snapshot, const std::string& source, InputError& error) {
  if (!isSnapshot(snapshot)) {
    error.message = source + ": not a snapshot: no \"Timestamp\" and \"Data\"";
    return std::nullopt;
  }
  const Value* data = snapshot.asDictionary()->find("Data");
  const Array* entries = data->asArray();
  if (!entries) {
    error.message = source + ": the snapshot's \"Data\" is a " + data->typeName() + ", not an array";
    return std::nullopt;
  }

  PacketList history;
  std::vector<std::size_t> dlfEntries;
  for (std::size_t i = 0; i < entries->size(); ++i) {
    const std::string where = source + ": Data[" + std::to_string(i) + "]";
    const Dictionary* entry = entries->at(i).asDictionary();
    if (!entry) {
      error.message = where + " is a " + std::string(entries->at(i).typeName()) + ", not a dictionary";
      return std::nullopt;
    }
    if (entry->contains("DLF")) dlfEntries.push_back(i);
    const Value* state = entry->find("DisplayState");
    if (!state) continue;
    const Bytes* bytes = state->asData();
    if (!bytes) {
      // An IFX report, kept as the decoded property list.
      std::string reason;
      auto packet = plist::serialize(*state, plist::Format::Binary, &reason);
      if (!packet) {
        error.message = where + ".DisplayState: " + reason;
        return std::nullopt;
      }
      history.packets.push_back(std::move(*packet));
    } else if (plist::looksLikePropertyList(*bytes)) {
      history.packets.push_back(*bytes);
    } else if (!splitInterval(*bytes, where + ".DisplayState", history, error)) {
      return std::nullopt;
    }
  }
  if (!history.packets.empty() || dlfEntries.empty()) {
    if (history.packets.empty()) history.warnings.push_back(source + kNoPackets);
    return history;
  }

  // Nothing in the history: the DLF of it is all there is.
  PacketList list;
  list.warnings = std::move(history.warnings);
  for (std::size_t i : dlfEntries) {
    const std::string where = source + ": Data[" + std::to_string(i) + "].DLF";
    const Value& dlf = *entries->at(i).asDictionary()->find("DLF");
    const Bytes* bytes = dlf.asData();
    if (!bytes) {
      error.message = where + " is a " + std::string(dlf.typeName()) + ", not data";
      return std::nullopt;
    }
    auto packets = packetsFromDlf(*bytes, where, error);
    if (!packets) return std::nullopt;
    appendAll(list, std::move(*packets));
  }
  if (list.packets.empty()) list.warnings.push_back(source + kNoPackets);
  return list;
}

std::optional<PacketList> packetsFromSnapshotContents(std::span<const std::uint8_t> contents,
                                                      const std::string& source, InputError& error) {
  std::string reason;
  const auto root = plist::parse(contents, &reason);
  if (!root) {
    error.message = source + ": " + reason;
    return std::nullopt;
  }
  return packetsFromSnapshot(*root, source, error);
}

}  // namespace corvane::tools
