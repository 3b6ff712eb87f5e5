// corvane-decode: the offline decoder. Folds every packet of its inputs into one
// generator and one state, in order, then prints the display tree once.

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/logcode/ClassIndex.h"
#include "PacketInput.h"
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

const corvane::ProgramUsage kProgram{
    "corvane-decode",
    "Usage: corvane-decode --technology NAME [--format text|json] [--log] [FILE...]\n",
    "\n"
    "Decodes baseband log packets offline and prints the display tree.\n"
    "\n"
    "Each FILE (standard input when none is given, or for \"-\") is read in the\n"
    "format its contents show:\n"
    "  property list  one packet (XML or binary)\n"
    "  snapshot       a property list with \"Timestamp\" and \"Data\", as the\n"
    "                 application saves it: the packets of its history are\n"
    "                 replayed in order; its DLF only when the history holds none\n"
    "  DLF            any other binary: log records (16-bit length of the whole\n"
    "                 record, 16-bit code, 8-byte timestamp, payload), each\n"
    "                 replayed as a packet of type 0x01, or 0xFF when its payload\n"
    "                 is a binary property list; version reports (code 0x1FFD)\n"
    "                 are skipped. In a DLF that the application saved (it opens\n"
    "                 with the application's version report), a 0x01 or 0xFF\n"
    "                 may be a packet's type byte kept in the file: the reading\n"
    "                 of the whole file with the most records wins, then the one\n"
    "                 with the fewest records without a type byte (on a tie: no\n"
    "                 type byte); other DLFs are read record after record\n"
    "  hex text       one packet per line in hex, exactly as the telephony\n"
    "                 service delivers it; blanks and colons may stand between\n"
    "                 bytes, blank lines and lines starting with # are skipped\n"
    "A file cut off in its last record or packet is read up to there, with a\n"
    "warning that names the offset.\n"
    "\n"
    "Options:\n"
    "  -t, --technology NAME  the log-channel technology: IFX, Quendra_GSM,\n"
    "                         Quendra_CDMA, Quendra_LTE or Quendra_UTRAN2\n"
    "  -f, --format FORMAT    text (an indented tree, the default) or json\n"
    "  -l, --log              also write the decoders' system-log lines to\n"
    "                         standard error as \"<priority> <text>\"\n"
    "  -h, --help             show this help\n"
    "  -V, --version          show the version\n"
    "\n"
    "Exit status: 0 on success, 1 for unreadable or malformed input, 2 for bad\n"
    "usage, 3 when a decoder met data it asserts it never receives.\n",
};

int usageError(const std::string& message) { return corvane::usageError(kProgram, message); }

bool isKnownTechnology(const std::string& name) {
  for (auto t : corvane::kAllLogChannelTechnologies) {
    if (t == name) return true;
  }
  return false;
}

}  // namespace

int main(int argc, char** argv) {
  using namespace corvane;

  std::string technology;
  std::string format = "text";
  bool logToStderr = false;

  static constexpr CommandLineOption kOptions[] = {
      {"technology", 't', true},
      {"format", 'f', true},
      {"log", 'l', false},
  };
  const ParsedCommandLine parsed = parseCommandLine(
      argc, argv, kOptions,
      [&](std::string_view name, const char* value) {
        if (name == "technology") technology = value;
        if (name == "format") format = value;
        if (name == "log") logToStderr = true;
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

  // Read everything first, so that bad input stops the run before any decoding.
  std::vector<Bytes> packets;
  for (const auto& path : inputs) {
    tools::InputError error;
    auto contents = tools::readInput(path, error);
    if (!contents) {
      std::fprintf(stderr, "corvane-decode: %s\n", error.message.c_str());
      return kExitInput;
    }
    auto filePackets =
        tools::packetsFromContents(*contents, path == "-" ? std::string("standard input") : path, error);
    if (!filePackets) {
      std::fprintf(stderr, "corvane-decode: %s\n", error.message.c_str());
      return kExitInput;
    }
    for (const auto& warning : filePackets->warnings) {
      std::fprintf(stderr, "corvane-decode: warning: %s\n", warning.c_str());
    }
    for (auto& p : filePackets->packets) packets.push_back(std::move(p));
  }

  // Standard output carries the tree: the class indexes' teardown lines go
  // with the diagnostics under --log, and nowhere otherwise.
  ClassIndex::setTeardownStream(logToStderr ? stderr : nullptr);
  if (logToStderr) {
    tools::copyLogToStandardError();
  }

  std::unique_ptr<LogGenerator> generator = LogGenerator::generatorFromTechnology(technology);
  if (!generator) return usageError("no decoder for technology \"" + technology + "\" in this version");

  try {
    Dictionary state;
    for (const auto& packet : packets) generator->updateState(state, packet);
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
  return 0;
}
