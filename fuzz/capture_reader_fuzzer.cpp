// corvane-decode's capture reader over arbitrary files: the format told by
// the bytes, or each format forced, as the first input byte picks. Besides
// the sanitizers' checks: every packet handed over holds a type byte and a
// whole record header, whose length the packet agrees with; the counts add
// up; a read that fails hands over nothing.

#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <cstdlib>
#include <string>

#include "CaptureReader.h"

using namespace corvane;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 1) return 0;
  static const int fd = memfd_create("capture", 0);
  if (fd < 0) std::abort();
  if (ftruncate(fd, 0) != 0 || pwrite(fd, data + 1, size - 1, 0) != static_cast<ssize_t>(size - 1)) std::abort();

  tools::InputError error;
  auto file = tools::CaptureFile::open("/proc/self/fd/" + std::to_string(fd), error);
  if (!file) std::abort();
  tools::CaptureOptions options;
  constexpr tools::InputFormat kFormats[] = {tools::InputFormat::Dlf, tools::InputFormat::Framed,
                                             tools::InputFormat::HexText, tools::InputFormat::PropertyList,
                                             tools::InputFormat::Snapshot};
  if (data[0] % 6 != 5) options.format = kFormats[data[0] % 6];
  options.keepBadCrc = (data[0] & 0x80) != 0;

  std::uint64_t handed = 0;
  bool lengthsAgree = true;
  tools::CaptureCounts counts;
  const auto result = tools::readCapture(
      *file, options,
      [&](std::span<const std::uint8_t> packet) {
        ++handed;
        if (packet.empty()) std::abort();
        const bool record = packet.size() >= 13 &&
                            (static_cast<std::size_t>(packet[1]) | static_cast<std::size_t>(packet[2]) << 8) ==
                                packet.size() - 1;
        lengthsAgree = lengthsAgree && record;
      },
      counts, error);
  if (!result && handed != 0) std::abort();
  if (handed != counts.packets) std::abort();
  if (counts.bytes > size - 1) std::abort();
  // Records read from DLFs and frames are whole log records, type byte first.
  if (result && (result->format == tools::InputFormat::Dlf || result->format == tools::InputFormat::Framed) &&
      !lengthsAgree) {
    std::abort();
  }
  return 0;
}
