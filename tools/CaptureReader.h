#pragma once

// Reading a capture as a stream, in constant memory: the packets of a file
// are handed over one at a time, each a view into a buffer the reader reuses,
// valid until the next one.
//
// The format is told by the first bytes (the first 64 KiB, or the whole of a
// smaller file), or forced:
//   property list, snapshot   a property list (see PacketInput.h); read whole
//   framed stream             frames of a diagnostic port (platform/DiagFrames.h)
//                             with at least as many good frames as bad ones
//                             there. A frame whose first byte is 0x10 carries one
//                             log record: 0x10, a reserved byte, the 16-bit
//                             length of the record, and the record as a DLF
//                             stores it, whose own length agrees. Frames of other
//                             commands are counted and skipped.
//   hex text                  text: one packet per line in hex
//   DLF                       log records one after the other from offset 0,
//                             as far as they go in the first 64 KiB, two at
//                             least (or one that is the whole file but a cut
//                             record), and more than half of their timestamps
//                             within 2^52 (years of baseband time) of their
//                             median. A DLF that the application saved (opening
//                             with its version report) is read whole, by the
//                             rules of PacketInput.h.
// Anything else is an error that says what was tried. A DLF damaged after its
// start is read up to the last whole record, and the error says at which byte
// reading stopped; a record cut off by the end of the file is a warning.

#include <array>
#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "PacketInput.h"
#include "platform/DiagFrames.h"

namespace corvane::tools {

// The formats as named on command lines and in messages.
std::optional<InputFormat> inputFormatNamed(std::string_view name);
std::string_view inputFormatName(InputFormat format);

// What a capture held, besides its packets.
struct CaptureCounts {
  std::uint64_t bytes = 0;
  std::uint64_t packets = 0;
  // Packets by log code: ordinary codes, and the extra codes (0xFF0000 and up).
  std::vector<std::uint64_t> perCode = std::vector<std::uint64_t>(65536);
  std::map<std::uint32_t, std::uint64_t> perExtraCode;
  // Framed streams only.
  diag::FrameCounts frames;
  std::array<std::uint64_t, 256> otherCommands{};
  std::uint64_t malformedLogFrames = 0;
};

// An open input: a file, or standard input for "-".
class CaptureFile {
 public:
  static std::optional<CaptureFile> open(const std::string& path, InputError& error);
  CaptureFile(CaptureFile&& other) noexcept;
  CaptureFile& operator=(CaptureFile&&) = delete;
  ~CaptureFile();

  const std::string& name() const { return name_; }  // "standard input" for "-"
  // The size of a regular file; nothing for a pipe or a terminal.
  std::optional<std::uint64_t> size() const { return size_; }
  // Reads up to buffer.size() bytes; 0 at the end. Throws nothing: a read
  // error is reported through `error` with -1.
  long read(std::span<std::uint8_t> buffer, InputError& error);

 private:
  CaptureFile(int fd, std::string name, std::optional<std::uint64_t> size);
  int fd_;
  bool own_;
  std::string name_;
  std::optional<std::uint64_t> size_;
};

struct CaptureOptions {
  std::optional<InputFormat> format;  // detected when not given
  bool keepBadCrc = false;
  // Called now and then with the bytes read so far.
  std::function<void(std::uint64_t bytesRead, std::uint64_t packets)> progress;
};

struct CaptureResult {
  InputFormat format = InputFormat::Dlf;
  std::vector<std::string> warnings;  // one line each
  // Set when reading stopped before the end: the packets before it were
  // handed over.
  std::optional<std::string> error;
};

// Reads the whole capture, handing each packet (type byte and record) to
// `packet` in order. Nothing when the input cannot be read at all (`error`
// says why; no packet was handed over).
std::optional<CaptureResult> readCapture(CaptureFile& file, const CaptureOptions& options,
                                         const std::function<void(std::span<const std::uint8_t>)>& packet,
                                         CaptureCounts& counts, InputError& error);

// What a read held, as lines for standard error: packets, format and rate;
// packets per log code; the codes `codeRead` says no section reads (when
// given); for framed streams, the frames skipped and why.
std::vector<std::string> captureSummary(const std::string& name, InputFormat format, const CaptureCounts& counts,
                                        double seconds, const std::function<bool(std::uint32_t)>& codeRead);

}  // namespace corvane::tools
