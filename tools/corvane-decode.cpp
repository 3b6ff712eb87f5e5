// corvane-decode: the offline decoder. Streams every packet of its inputs into
// one generator and one state, in order, then prints the display tree once.

#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <set>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "CaptureReader.h"
#include "LogGenerator/LogCodeTechnologies.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "LogGenerator/logcode/ClassIndex.h"
#include "Progress.h"
#include "ToolOptions.h"
#include "TreePrinter.h"
#include "model/CorvaneModelNode.h"
#include "platform/Assertion.h"
#include "platform/CommandLine.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"

namespace {

constexpr int kExitInput = 1;
constexpr int kExitAssertion = 3;
constexpr std::uint64_t kPacketsPerDisplay = 4096;

const corvane::ProgramUsage kProgram{
    "corvane-decode",
    "Usage: corvane-decode --technology NAME [--format text|json] [--input-format FORMAT]\n"
    "                      [--keep-bad-crc] [--log[=syslog|stderr]] [--quiet] [FILE...]\n",
    "\n"
    "Decodes baseband log packets offline and prints the display tree.\n"
    "\n"
    "Each FILE (standard input when none is given, or for \"-\") is read as a\n"
    "stream, in constant memory, in the format its first bytes show:\n"
    "  framed stream  what a baseband's diagnostic port sends: frames ending in\n"
    "                 a 0x7E flag, 0x7D escaping the next byte, a CRC-16/X.25 at\n"
    "                 the end of each; a frame whose first byte is 0x10 carries\n"
    "                 one log record. Frames with a bad CRC and frames of other\n"
    "                 commands are counted and skipped\n"
    "  DLF            log records one after the other (16-bit length of the whole\n"
    "                 record, 16-bit code, 8-byte timestamp, payload), each\n"
    "                 replayed as a packet of type 0x01, or 0xFF when its payload\n"
    "                 is a binary property list; version reports (code 0x1FFD)\n"
    "                 are skipped. A DLF that the application saved (it opens\n"
    "                 with the application's version report) is read whole: a\n"
    "                 0x01 or 0xFF may be a packet's type byte kept in the file,\n"
    "                 and the reading of the whole file with the most records\n"
    "                 wins, then the one with the fewest records without a type\n"
    "                 byte (on a tie: no type byte)\n"
    "  hex text       one packet per line in hex, exactly as the telephony\n"
    "                 service delivers it; blanks and colons may stand between\n"
    "                 bytes, blank lines and lines starting with # are skipped\n"
    "  property list  one packet (XML or binary)\n"
    "  snapshot       a property list with \"Timestamp\" and \"Data\", as the\n"
    "                 application saves it: the packets of its history are\n"
    "                 replayed in order; its DLF only when the history holds none\n"
    "A file cut off in its last record is read up to there, with a warning that\n"
    "names the byte; a DLF damaged in the middle is decoded up to the damage and\n"
    "the error names the byte. At the end, a summary goes to standard error:\n"
    "packets per log code, the codes no section reads, frames skipped and why.\n"
    "While a large file is read and standard error is a terminal, a progress\n"
    "line shows bytes, packets per second and the time left.\n"
    "\n"
    "Options:\n"
    "  -t, --technology NAME      the log-channel technology: IFX, Quendra_GSM,\n"
    "                             Quendra_CDMA, Quendra_LTE or Quendra_UTRAN2\n"
    "  -f, --format FORMAT        text (an indented tree, the default) or json\n"
    "  -i, --input-format FORMAT  read every FILE as dlf, framed, hex, plist or\n"
    "                             snapshot instead of telling by its contents\n"
    "      --keep-bad-crc         decode frames whose CRC is wrong too\n"
    "  -l, --log[=WHERE]          the decoders' log lines: to the system log\n"
    "                             (syslog, the default WHERE) or to standard\n"
    "                             error as \"<priority> <text>\" (stderr). Without\n"
    "                             --log they are not even made; corvane-decode's\n"
    "                             own errors and warnings go to standard error\n"
    "  -q, --quiet                no summary and no progress line\n"
    "  -h, --help                 show this help\n"
    "  -V, --version              show the version\n"
    "\n"
    "Exit status: 0 on success, 1 for unreadable, unrecognised or damaged input\n"
    "(the tree of what was decoded before the damage is printed), 2 for bad\n"
    "usage, 3 when a decoder met data it asserts it never receives.\n",
};

int usageError(const std::string& message) { return corvane::usageError(kProgram, message); }

bool isKnownTechnology(const std::string& name) {
  for (auto t : corvane::kAllLogChannelTechnologies) {
    if (t == name) return true;
  }
  return false;
}

// The log codes that some section or decoder of a log-code technology reads;
// nothing for IFX.
std::function<bool(std::uint32_t)> codesReadBy(const std::string& technology) {
  for (const corvane::LogCodeTechnology& t : corvane::logCodeTechnologies()) {
    if (t.technology != technology) continue;
    auto codes = std::make_shared<std::set<std::uint32_t>>();
    for (const corvane::SectionDescriptor& row : t.sections()) codes->insert(row.codes.begin(), row.codes.end());
    return [codes](std::uint32_t code) { return codes->count(code) != 0; };
  }
  // CDMA2000 has no sections: a decoder per code.
  if (technology == corvane::kLogChannelTechnologyQuendraCDMA) {
    return [](std::uint32_t code) { return corvane::c2k::decoderFor(code) != nullptr; };
  }
  return {};
}

}  // namespace

int main(int argc, char** argv) {
  using namespace corvane;

  std::string technology;
  std::string format = "text";
  std::optional<tools::InputFormat> inputFormat;
  tools::LogDestination logDestination = tools::LogDestination::Nowhere;
  bool keepBadCrc = false;
  bool quiet = false;

  static constexpr CommandLineOption kOptions[] = {
      {"technology", 't', true},
      {"format", 'f', true},
      {"input-format", 'i', true},
      {"keep-bad-crc", 0, false},
      {"log", 'l', true, true},
      {"quiet", 'q', false},
  };
  const ParsedCommandLine parsed = parseCommandLine(
      argc, argv, kOptions,
      [&](std::string_view name, const char* value) -> std::string {
        if (name == "technology") technology = value;
        if (name == "format") format = value;
        if (name == "input-format") {
          inputFormat = tools::inputFormatNamed(value);
          if (!inputFormat) return "unknown input format \"" + std::string(value) + "\" (dlf, framed, hex, plist or snapshot)";
        }
        if (name == "keep-bad-crc") keepBadCrc = true;
        if (name == "log") {
          const auto destination = tools::logDestinationNamed(value ? value : "syslog");
          if (!destination) return "unknown log destination \"" + std::string(value) + "\" (syslog or stderr)";
          logDestination = *destination;
        }
        if (name == "quiet") quiet = true;
        return std::string();
      },
      true);
  if (const std::optional<int> status = answerCommandLine(parsed, kProgram)) return *status;
  if (technology.empty()) return usageError("--technology NAME is required");
  if (!isKnownTechnology(technology)) return usageError("unknown technology \"" + technology + "\"");
  const std::optional<tools::TreeFormat> treeFormat = tools::treeFormatNamed(format);
  if (!treeFormat) return usageError("unknown format \"" + format + "\" (text or json)");

  std::vector<std::string> inputs = parsed.operands;
  if (inputs.empty()) inputs.emplace_back("-");

  // Standard output carries the tree: the class indexes' teardown lines go
  // with the diagnostics when every line goes to standard error, and nowhere
  // otherwise.
  tools::routeLog(logDestination);
  ClassIndex::setTeardownStream(logDestination == tools::LogDestination::StandardError ? stderr : nullptr);

  // Before any input is read: a technology without a decoder is said at once.
  std::unique_ptr<LogGenerator> generator = LogGenerator::generatorFromTechnology(technology);
  if (!generator) {
    std::string decoded;
    for (auto t : kAllLogChannelTechnologies) {
      if (LogGenerator::generatorFromTechnology(t)) decoded += (decoded.empty() ? "" : ", ") + std::string(t);
    }
    std::fprintf(stderr, "corvane-decode: no decoder for technology \"%s\" in this version; these have one: %s\n",
                 technology.c_str(), decoded.c_str());
    return kExitInput;
  }
  const std::function<bool(std::uint32_t)> codeRead = codesReadBy(technology);

  int status = 0;
  try {
    Dictionary state;
    // The generator keeps each display interval's packets for the DLF log
    // until the display is made, as the application makes it every 2 s; made
    // now and then here too, they stay few.
    std::uint64_t sinceDisplay = 0;
    auto onPacket = [&](std::span<const std::uint8_t> packet) {
      generator->updateState(state, packet);
      if (++sinceDisplay == kPacketsPerDisplay) {
        generator->generateLogUsingState(state);
        sinceDisplay = 0;
      }
    };
    for (const auto& path : inputs) {
      tools::InputError error;
      auto file = tools::CaptureFile::open(path, error);
      if (!file) {
        std::fprintf(stderr, "corvane-decode: %s\n", error.message.c_str());
        return kExitInput;
      }
      tools::CaptureCounts counts;
      tools::Progress progress(!quiet && isatty(STDERR_FILENO) != 0, file->size());
      tools::CaptureOptions options;
      options.format = inputFormat;
      options.keepBadCrc = keepBadCrc;
      options.progress = [&](std::uint64_t bytes, std::uint64_t packets) { progress.update(bytes, packets); };
      const auto started = std::chrono::steady_clock::now();
      const auto result = tools::readCapture(*file, options, onPacket, counts, error);
      progress.finish();
      if (!result) {
        std::fprintf(stderr, "corvane-decode: %s\n", error.message.c_str());
        return kExitInput;
      }
      for (const auto& warning : result->warnings) {
        std::fprintf(stderr, "corvane-decode: warning: %s\n", warning.c_str());
      }
      if (!quiet) {
        const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
        for (const auto& line : tools::captureSummary(file->name(), result->format, counts, seconds, codeRead)) {
          std::fprintf(stderr, "corvane-decode: %s\n", line.c_str());
        }
      }
      if (result->error) {
        std::fprintf(stderr, "corvane-decode: %s\n", result->error->c_str());
        status = kExitInput;
        break;
      }
    }
    const Value display = generator->generateLogUsingState(state);
    PathDictionary paths;
    const NodeRef root = CorvaneModelNode::makeTreeFromObject(display, paths);
    const std::string text = tools::formatTree(*root, *treeFormat);
    std::fwrite(text.data(), 1, text.size(), stdout);
  } catch (const AssertionFailure& failure) {
    std::fflush(stdout);
    std::fprintf(stderr, "corvane-decode: assertion failure in %s:%d: %s\n", failure.file().c_str(), failure.line(),
                 failure.description().c_str());
    return kExitAssertion;
  }
  if (std::fflush(stdout) != 0) {
    std::fprintf(stderr, "corvane-decode: cannot write the output: %s\n", std::strerror(errno));
    return kExitInput;
  }
  return status;
}
