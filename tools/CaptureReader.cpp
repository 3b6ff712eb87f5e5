#include "CaptureReader.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>

#include "platform/DiagCommands.h"
#include "platform/PropertyList.h"

namespace corvane::tools {

namespace {

constexpr std::size_t kBlock = std::size_t{1} << 20;
constexpr std::size_t kDetectionWindow = std::size_t{64} << 10;
// A log record is at most 65535 bytes: the buffer holds one whole behind any
// block's leftovers.
constexpr std::size_t kLargestRecord = 65535;
// Read whole: property lists, snapshots and the application's own DLFs.
constexpr std::size_t kLargestWholeFile = std::size_t{256} << 20;
// A hex line holds one packet.
constexpr std::size_t kLongestHexLine = 4 * kLargestRecord;
constexpr std::size_t kRecordHeaderSize = 12;
constexpr std::uint16_t kVersionReportCode = 0x1FFD;
constexpr std::uint8_t kTypeOrdinary = 0x01;
constexpr std::uint8_t kTypeExtraCode = 0xFF;
constexpr std::uint64_t kTimestampSpread = std::uint64_t{1} << 52;
constexpr std::string_view kBinaryPropertyListMagic = "bplist00";

std::size_t le16(const std::uint8_t* p) { return static_cast<std::size_t>(p[0]) | static_cast<std::size_t>(p[1]) << 8; }
std::uint64_t le64(const std::uint8_t* p) {
  std::uint64_t v = 0;
  for (int i = 7; i >= 0; --i) v = v << 8 | p[i];
  return v;
}

std::uint8_t typeOfRecord(std::span<const std::uint8_t> record) {
  const auto payload = record.subspan(kRecordHeaderSize);
  const bool propertyList =
      payload.size() >= kBinaryPropertyListMagic.size() &&
      std::equal(kBinaryPropertyListMagic.begin(), kBinaryPropertyListMagic.end(), payload.begin());
  return propertyList ? kTypeExtraCode : kTypeOrdinary;
}

bool isText(std::span<const std::uint8_t> contents) {
  for (std::uint8_t b : contents) {
    if (b == 0 || (b < 0x20 && b != '\n' && b != '\r' && b != '\t') || b >= 0x7F) return false;
  }
  return true;
}

// The application's DLFs open with its version report (see DlfReader.cpp).
bool opensWithApplicationVersionReport(std::span<const std::uint8_t> data) {
  constexpr std::string_view kName{"EXECUTABLE_NAME\0", 16};
  return data.size() >= 161 && le16(data.data()) == 161 && le16(data.data() + 2) == kVersionReportCode &&
         std::equal(kName.begin(), kName.end(), data.begin() + 23);
}

// Log records one after the other from offset 0, as far as they go in the
// window (to its end, to a record cut off by the end of the file, or to
// damage), the first of them whole, and most of their timestamps close
// together: a baseband's clock does not leap about from record to record,
// random bytes do.
bool looksLikeDlf(std::span<const std::uint8_t> window, bool wholeFile) {
  std::size_t at = 0;
  std::vector<std::uint64_t> timestamps;
  while (at + kRecordHeaderSize <= window.size()) {
    const std::size_t length = le16(window.data() + at);
    if (length < kRecordHeaderSize || at + length > window.size()) break;
    timestamps.push_back(le64(window.data() + at + 4));
    at += length;
  }
  if (timestamps.empty()) return false;
  // One record tells little: it must then be the whole file, or all of it
  // but a record cut off by its end.
  if (timestamps.size() == 1) {
    const std::size_t left = window.size() - at;
    const bool cutOff = left >= 2 && le16(window.data() + at) >= kRecordHeaderSize;
    if (!wholeFile || (left > 0 && !cutOff)) return false;
  }
  std::nth_element(timestamps.begin(), timestamps.begin() + timestamps.size() / 2, timestamps.end());
  const std::uint64_t median = timestamps[timestamps.size() / 2];
  const auto close = std::count_if(timestamps.begin(), timestamps.end(), [&](std::uint64_t t) {
    return (t > median ? t - median : median - t) < kTimestampSpread;
  });
  return static_cast<std::size_t>(close) * 2 > timestamps.size();
}

bool looksFramed(std::span<const std::uint8_t> window) {
  diag::Deframer deframer;
  deframer.feed(window, [](const diag::Deframer::Frame&) {});
  const diag::FrameCounts& counts = deframer.counts();
  return counts.frames > 0 && counts.frames >= counts.skipped();
}

std::optional<InputFormat> detect(std::span<const std::uint8_t> window, bool wholeFile) {
  if (plist::looksLikePropertyList(window)) return InputFormat::PropertyList;  // or a snapshot: told when read
  if (looksFramed(window)) return InputFormat::Framed;
  if (isText(window)) return InputFormat::HexText;
  if (opensWithApplicationVersionReport(window) || looksLikeDlf(window, wholeFile)) return InputFormat::Dlf;
  return std::nullopt;
}

std::string offsetText(std::uint64_t offset) { return "offset " + std::to_string(offset); }

// A window over the file that slides forward: bytes are consumed from its
// front and read behind its back, in blocks.
class Window {
 public:
  Window(CaptureFile& file, CaptureCounts& counts, const CaptureOptions& options)
      : file_(file), counts_(counts), options_(options), buffer_(kBlock + kLongestHexLine) {}

  // Reads until at least `wanted` bytes are there or the file ends; false on a read error.
  bool fill(std::size_t wanted, InputError& error) {
    if (end_ - begin_ >= wanted || atEnd_) return true;
    if (begin_ > 0) {
      std::memmove(buffer_.data(), buffer_.data() + begin_, end_ - begin_);
      end_ -= begin_;
      begin_ = 0;
    }
    while (end_ - begin_ < wanted && !atEnd_) {
      const long n = file_.read(std::span(buffer_).subspan(end_), error);
      if (n < 0) return false;
      if (n == 0) atEnd_ = true;
      end_ += static_cast<std::size_t>(n);
      counts_.bytes += static_cast<std::uint64_t>(n);
      if (options_.progress) options_.progress(counts_.bytes, counts_.packets);
    }
    return true;
  }
  std::span<std::uint8_t> bytes() { return std::span(buffer_).subspan(begin_, end_ - begin_); }
  void consume(std::size_t n) {
    begin_ += n;
    consumed_ += n;
  }
  bool atEnd() const { return atEnd_; }
  // The file offset of the first byte not consumed.
  std::uint64_t offset() const { return consumed_; }
  std::size_t room() const { return buffer_.size(); }

 private:
  CaptureFile& file_;
  CaptureCounts& counts_;
  const CaptureOptions& options_;
  std::vector<std::uint8_t> buffer_;
  std::size_t begin_ = 0;
  std::size_t end_ = 0;
  std::uint64_t consumed_ = 0;
  bool atEnd_ = false;
};

using PacketFunction = std::function<void(std::span<const std::uint8_t>)>;

void countPacket(CaptureCounts& counts, std::span<const std::uint8_t> packet) {
  ++counts.packets;
  if (packet.size() < 5) return;
  const std::uint32_t code = static_cast<std::uint32_t>(le16(packet.data() + 3));
  if (packet[0] == kTypeExtraCode) ++counts.perExtraCode[0xFF0000 | code];
  else ++counts.perCode[code];
}

// DLF records one after the other; each becomes a packet with its type byte
// put in front, in a buffer of its own.
bool readDlf(Window& window, const PacketFunction& packet, CaptureCounts& counts, CaptureResult& result,
             const std::string& name, InputError& error) {
  std::vector<std::uint8_t> scratch(kLargestRecord + 1);
  for (;;) {
    if (!window.fill(kLargestRecord, error)) return false;
    auto bytes = window.bytes();
    if (bytes.empty()) return true;
    const std::size_t length = bytes.size() >= 2 ? le16(bytes.data()) : 0;
    if (bytes.size() >= 2 && length < kRecordHeaderSize) {
      result.error = name + ": no log record at " + offsetText(window.offset()) +
                     ": the DLF is damaged there; the records before it were decoded";
      return true;
    }
    if (bytes.size() < 2 || length > bytes.size()) {
      result.warnings.push_back(name + ": truncated record at " + offsetText(window.offset()) + "; its " +
                                std::to_string(bytes.size()) + " bytes are left out");
      return true;
    }
    const auto record = bytes.first(length);
    const std::uint8_t type = typeOfRecord(record);
    if (!(type == kTypeOrdinary && le16(record.data() + 2) == kVersionReportCode)) {
      scratch[0] = type;
      std::memcpy(scratch.data() + 1, record.data(), length);
      const std::span<const std::uint8_t> p(scratch.data(), length + 1);
      countPacket(counts, p);
      packet(p);
    }
    window.consume(length);
  }
}

bool readFramed(Window& window, const CaptureOptions& options, const PacketFunction& packet, CaptureCounts& counts,
                InputError& error) {
  diag::Deframer deframer(options.keepBadCrc);
  auto onFrame = [&](const diag::Deframer::Frame& frame) {
    std::span<std::uint8_t> f = frame.bytes;
    if (f[0] != diag::kLogCommand) {
      ++counts.otherCommands[f[0]];
      return;
    }
    if (!diag::logRecordOfFrame(f)) {
      ++counts.malformedLogFrames;
      return;
    }
    // The type byte takes the place of the length's high byte, just before the record.
    constexpr std::size_t kHeader = diag::kLogFrameHeaderSize;
    f[kHeader - 1] = typeOfRecord(f.subspan(kHeader));
    const std::span<const std::uint8_t> p = f.subspan(kHeader - 1);
    if (p[0] == kTypeOrdinary && le16(p.data() + 3) == kVersionReportCode) return;
    countPacket(counts, p);
    packet(p);
  };
  for (;;) {
    if (!window.fill(kBlock, error)) return false;
    auto bytes = window.bytes();
    if (bytes.empty()) break;
    deframer.feed(bytes, onFrame);
    window.consume(bytes.size());
  }
  deframer.finish();
  counts.frames = deframer.counts();
  return true;
}

bool readHexLines(Window& window, const PacketFunction& packet, CaptureCounts& counts, CaptureResult& result,
                  const std::string& name, InputError& error) {
  Bytes line;
  std::size_t lineNumber = 0;
  for (;;) {
    if (!window.fill(kLongestHexLine, error)) return false;
    auto bytes = window.bytes();
    if (bytes.empty()) return true;
    const auto newline = std::find(bytes.begin(), bytes.end(), std::uint8_t{'\n'});
    if (newline == bytes.end() && !window.atEnd()) {
      error.message = name + ":" + std::to_string(lineNumber + 1) + ": a line longer than any packet";
      return false;
    }
    const std::size_t length = static_cast<std::size_t>(newline - bytes.begin());
    std::string_view text(reinterpret_cast<const char*>(bytes.data()), length);
    ++lineNumber;
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) text.remove_prefix(1);
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t' || text.back() == '\r')) text.remove_suffix(1);
    if (!text.empty() && text.front() != '#') {
      std::string reason;
      if (!parseHexLineInto(text, line, reason)) {
        result.error = name + ":" + std::to_string(lineNumber) + ": bad hex line: " + reason +
                       "; the lines before it were decoded";
        return true;
      }
      countPacket(counts, line);
      packet(line);
    }
    window.consume(std::min(length + 1, bytes.size()));
  }
}

// Formats read whole: property lists, snapshots and the application's DLFs.
bool readWhole(Window& window, const PacketFunction& packet, CaptureCounts& counts, CaptureResult& result,
               const std::string& name, InputError& error) {
  Bytes contents;
  const bool propertyList = result.format == InputFormat::PropertyList || result.format == InputFormat::Snapshot;
  if (propertyList && !plist::looksLikePropertyList(window.bytes())) {
    error.message = name + ": not a property list (neither XML nor binary)";
    return false;
  }
  for (;;) {
    if (!window.fill(kBlock, error)) return false;
    auto bytes = window.bytes();
    if (bytes.empty()) break;
    if (contents.size() + bytes.size() > kLargestWholeFile) {
      error.message = name + ": property lists, snapshots and the application's own DLFs larger than 256 MiB are "
                             "not read";
      return false;
    }
    contents.insert(contents.end(), bytes.begin(), bytes.end());
    window.consume(bytes.size());
  }
  auto list = packetsFromContents(contents, name, error);
  if (!list) return false;
  if (plist::looksLikePropertyList(contents)) {
    const auto root = plist::parse(contents);
    result.format = root && isSnapshot(*root) ? InputFormat::Snapshot : InputFormat::PropertyList;
  }
  result.warnings = std::move(list->warnings);
  for (const Bytes& p : list->packets) {
    countPacket(counts, p);
    packet(p);
  }
  return true;
}

}  // namespace

std::optional<InputFormat> inputFormatNamed(std::string_view name) {
  if (name == "dlf") return InputFormat::Dlf;
  if (name == "framed") return InputFormat::Framed;
  if (name == "hex") return InputFormat::HexText;
  if (name == "plist") return InputFormat::PropertyList;
  if (name == "snapshot") return InputFormat::Snapshot;
  return std::nullopt;
}

std::string_view inputFormatName(InputFormat format) {
  switch (format) {
    case InputFormat::Dlf: return "DLF";
    case InputFormat::Framed: return "framed stream";
    case InputFormat::HexText: return "hex text";
    case InputFormat::PropertyList: return "property list";
    case InputFormat::Snapshot: return "snapshot";
  }
  return "?";
}

std::optional<CaptureFile> CaptureFile::open(const std::string& path, InputError& error) {
  int fd = 0;
  std::string name = "standard input";
  if (path != "-") {
    name = path;
    fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) {
      error.message = path + ": cannot open: " + std::strerror(errno);
      return std::nullopt;
    }
  }
  struct stat info {};
  std::optional<std::uint64_t> size;
  if (::fstat(fd, &info) == 0) {
    if (S_ISDIR(info.st_mode)) {
      error.message = name + ": is a directory";
      if (fd != 0) ::close(fd);
      return std::nullopt;
    }
    if (S_ISREG(info.st_mode)) size = static_cast<std::uint64_t>(info.st_size);
  }
#ifdef POSIX_FADV_SEQUENTIAL
  ::posix_fadvise(fd, 0, 0, POSIX_FADV_SEQUENTIAL);
#endif
  return CaptureFile(fd, std::move(name), size);
}

CaptureFile::CaptureFile(int fd, std::string name, std::optional<std::uint64_t> size)
    : fd_(fd), own_(fd != 0), name_(std::move(name)), size_(size) {}

CaptureFile::CaptureFile(CaptureFile&& other) noexcept
    : fd_(other.fd_), own_(other.own_), name_(std::move(other.name_)), size_(other.size_) {
  other.own_ = false;
}

CaptureFile::~CaptureFile() {
  if (own_) ::close(fd_);
}

long CaptureFile::read(std::span<std::uint8_t> buffer, InputError& error) {
  for (;;) {
    const ssize_t n = ::read(fd_, buffer.data(), buffer.size());
    if (n >= 0) return static_cast<long>(n);
    if (errno == EINTR) continue;
    error.message = name_ + ": cannot read: " + std::strerror(errno);
    return -1;
  }
}

std::optional<CaptureResult> readCapture(CaptureFile& file, const CaptureOptions& options,
                                         const PacketFunction& packet, CaptureCounts& counts, InputError& error) {
  Window window(file, counts, options);
  if (!window.fill(kDetectionWindow, error)) return std::nullopt;
  const auto first = window.bytes().first(std::min(window.bytes().size(), kDetectionWindow));
  const bool wholeFile = window.atEnd() && window.bytes().size() <= kDetectionWindow;
  if (first.empty()) {
    error.message = file.name() + ": is empty: there is nothing to decode";
    return std::nullopt;
  }
  CaptureResult result;
  if (options.format) {
    result.format = *options.format;
  } else if (const auto found = detect(first, wholeFile)) {
    result.format = *found;
  } else {
    error.message = file.name() +
                    ": not a capture corvane-decode reads: not a DLF (no run of log records from byte 0), not a "
                    "framed stream (more bad frames than good ones), not a property list or snapshot, not hex "
                    "text; if it is one of them, say which with --input-format";
    return std::nullopt;
  }

  bool read = false;
  switch (result.format) {
    case InputFormat::Framed: read = readFramed(window, options, packet, counts, error); break;
    case InputFormat::HexText: read = readHexLines(window, packet, counts, result, file.name(), error); break;
    case InputFormat::Dlf:
      read = opensWithApplicationVersionReport(first)
                 ? readWhole(window, packet, counts, result, file.name(), error)
                 : readDlf(window, packet, counts, result, file.name(), error);
      break;
    case InputFormat::PropertyList:
    case InputFormat::Snapshot: read = readWhole(window, packet, counts, result, file.name(), error); break;
  }
  if (!read) return std::nullopt;
  if (counts.packets == 0 && result.error) {
    error.message = *result.error;
    return std::nullopt;
  }
  if (counts.packets == 0) result.warnings.push_back(file.name() + ": holds no packets");
  return result;
}

std::vector<std::string> captureSummary(const std::string& name, InputFormat format, const CaptureCounts& counts,
                                        double seconds, const std::function<bool(std::uint32_t)>& codeRead) {
  std::vector<std::string> lines;
  char rate[64] = "";
  if (seconds > 0) {
    std::snprintf(rate, sizeof rate, " in %.2f s (%.0f packets/s)", seconds, static_cast<double>(counts.packets) / seconds);
  }
  lines.push_back(name + ": " + std::to_string(counts.packets) + " packets from " + std::to_string(counts.bytes) +
                  " bytes of " + std::string(inputFormatName(format)) + rate);

  auto codeText = [](std::uint32_t code) {
    char text[16];
    std::snprintf(text, sizeof text, "0x%04X", code);
    return std::string(text);
  };
  std::string perCode;
  std::string unread;
  auto add = [&](std::uint32_t code, std::uint64_t n) {
    if (n == 0) return;
    perCode += (perCode.empty() ? "" : ", ") + codeText(code) + " " + std::to_string(n);
    if (codeRead && !codeRead(code)) unread += (unread.empty() ? "" : ", ") + codeText(code) + " (" + std::to_string(n) + ")";
  };
  for (std::uint32_t code = 0; code < counts.perCode.size(); ++code) add(code, counts.perCode[code]);
  for (const auto& [code, n] : counts.perExtraCode) add(code, n);
  if (!perCode.empty()) lines.push_back("packets per log code: " + perCode);
  if (!unread.empty()) lines.push_back("log codes no section reads: " + unread);

  if (format == InputFormat::Framed) {
    const diag::FrameCounts& f = counts.frames;
    std::string skipped;
    auto reason = [&](std::uint64_t n, const char* what) {
      if (n) skipped += (skipped.empty() ? "" : ", ") + std::to_string(n) + " " + what;
    };
    reason(f.badCrc, "with a bad CRC");
    reason(f.tooShort, "too short for a CRC");
    reason(f.badEscape, "with an escape before the flag");
    reason(f.oversized, "longer than any frame");
    reason(counts.malformedLogFrames, "log frames whose lengths disagree");
    std::string others;
    std::uint64_t otherFrames = 0;
    for (std::size_t command = 0; command < counts.otherCommands.size(); ++command) {
      if (!counts.otherCommands[command]) continue;
      otherFrames += counts.otherCommands[command];
      char text[32];
      std::snprintf(text, sizeof text, "0x%02zX: %llu", command,
                    static_cast<unsigned long long>(counts.otherCommands[command]));
      others += (others.empty() ? "" : ", ") + std::string(text);
    }
    std::string line = "frames: " + std::to_string(f.frames) + " good";
    if (!skipped.empty()) line += "; skipped: " + skipped;
    if (otherFrames) line += "; " + std::to_string(otherFrames) + " of other commands (" + others + ")";
    if (f.leadingBytes) line += "; " + std::to_string(f.leadingBytes) + " bytes before the first flag";
    if (f.trailingBytes) line += "; " + std::to_string(f.trailingBytes) + " bytes cut off after the last flag";
    lines.push_back(line);
  }
  return lines;
}

}  // namespace corvane::tools
