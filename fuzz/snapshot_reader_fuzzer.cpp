// The snapshot reader over arbitrary input: it returns packets or an error; it
// never crashes or reads past the end of a history entry.
//
// Input that looks like a property list is read as a snapshot file. Any other
// input is made into a snapshot, so that the splitting of history entries gets
// the mutations: the first byte chooses entry kinds, the rest is a sequence of
// chunks, each a 16-bit little-endian length and that many bytes (fewer at the
// end), one history entry each.

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <span>

#include "PacketInput.h"
#include "platform/PropertyList.h"

namespace {

using namespace corvane;

Value snapshotFrom(std::span<const std::uint8_t> input) {
  const std::uint8_t kinds = input.empty() ? 0 : input[0];
  std::size_t at = input.empty() ? 0 : 1;
  Array data;
  for (unsigned index = 0; at < input.size(); ++index) {
    std::size_t length = input[at++];
    if (at < input.size()) length |= static_cast<std::size_t>(input[at++]) << 8;
    length = std::min(length, input.size() - at);
    // Exactly as long as the chunk, so that a read past its end is one past the allocation.
    const auto begin = input.begin() + static_cast<std::ptrdiff_t>(at);
    Bytes chunk(begin, begin + static_cast<std::ptrdiff_t>(length));
    at += length;
    Dictionary entry;
    switch (kinds >> (2 * (index % 4)) & 3) {
      case 0: entry.set("DisplayState", Value(std::move(chunk))); break;
      case 1: entry.set("DLF", Value(std::move(chunk))); break;
      case 2:
        entry.set("DisplayState", Value(std::move(chunk)));
        entry.set("DLF", Value(Bytes{}));
        break;
      default: entry.set("Description", Value("without packets")); break;
    }
    data.append(Value(entry));
  }
  Dictionary snapshot;
  snapshot.set("Timestamp", Value("2026-11-16 08:00:00 +0000"));
  snapshot.set("Data", Value(data));
  return Value(snapshot);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::span input(data, size);
  tools::InputError error;
  std::optional<tools::PacketList> list;
  if (plist::looksLikePropertyList(input)) {
    list = tools::packetsFromSnapshotContents(input, "fuzz.corvane", error);
  } else {
    list = tools::packetsFromSnapshot(snapshotFrom(input), "fuzz.corvane", error);
  }
  if (!list && error.message.empty()) std::abort();
  if (list) {
    for (const Bytes& packet : list->packets) {
      if (packet.empty()) std::abort();
    }
  }
  return 0;
}
