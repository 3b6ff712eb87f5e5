// The DLF reader over arbitrary bytes: it returns packets, each a type byte and
// one whole record, or an error; it never crashes or reads past the end.

#include <cstdint>
#include <cstdlib>
#include <span>

#include "PacketInput.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace corvane;
  tools::InputError error;
  const auto list = tools::packetsFromDlf(std::span(data, size), "fuzz.dlf", error);
  if (!list) {
    if (error.message.empty()) std::abort();
    return 0;
  }
  std::size_t recordBytes = 0;
  for (const Bytes& packet : list->packets) {
    if (packet.size() < 13 || (packet[0] != 0x01 && packet[0] != 0xFF)) std::abort();
    if ((packet[1] | packet[2] << 8) != static_cast<int>(packet.size() - 1)) std::abort();
    recordBytes += packet.size() - 1;
  }
  // Every record comes from the input, once.
  if (recordBytes > size) std::abort();
  return 0;
}
