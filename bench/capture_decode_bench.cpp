// corvane-decode end to end on captures of the simulator's LTE mix: writes a
// framed diagnostic-port capture and a DLF of the same N log records (the
// radio records of the Quendra_LTE scenario, as a baseband's diagnostic port
// sends them: the service's own extra codes are not among them), runs
// corvane-decode on each several times, and prints packets per second
// (median run) and the peak resident memory of the process.

#include <sys/resource.h>
#include <sys/wait.h>
#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "platform/CommandLine.h"
#include "platform/DiagFrames.h"
#include "platform/LogChannelTechnology.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/LogRecord.h"

namespace {

using namespace corvane;

const ProgramUsage kProgram{
    "capture_decode_bench",
    "Usage: capture_decode_bench [--packets N] [--runs R] [--decode PATH] [--directory DIR]\n",
    "\n"
    "Writes a framed capture and a DLF of N log records of the simulator's LTE\n"
    "mix, runs corvane-decode on each R times and prints, per format, the\n"
    "packets per second of the median run and the largest peak resident memory.\n"
    "\n"
    "Options:\n"
    "  -n, --packets N      log records in each capture (default 1000000)\n"
    "  -r, --runs R         runs per capture (default 5)\n"
    "  -d, --decode PATH    the corvane-decode to run (default: the one built with this bench)\n"
    "  -o, --directory DIR  where the captures are written and kept (default: a\n"
    "                       temporary directory, removed at the end)\n"
    "  -h, --help           show this help\n"
    "  -V, --version        show the version\n",
};

struct Run {
  double seconds;
  long peakKib;
  int status;
};

Run runDecode(const std::string& decode, const std::string& capture) {
  const auto started = std::chrono::steady_clock::now();
  const pid_t child = fork();
  if (child == 0) {
    const int null = ::open("/dev/null", O_WRONLY);
    dup2(null, STDOUT_FILENO);
    execl(decode.c_str(), decode.c_str(), "-q", "-t", "Quendra_LTE", capture.c_str(), static_cast<char*>(nullptr));
    _exit(127);
  }
  int status = 0;
  rusage usage{};
  wait4(child, &status, 0, &usage);
  const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
  return {seconds, usage.ru_maxrss, WIFEXITED(status) ? WEXITSTATUS(status) : 128};
}

}  // namespace

int main(int argc, char** argv) {
  unsigned long long packets = 1'000'000;
  unsigned runs = 5;
  std::string decode = CORVANE_DECODE_BINARY;
  std::string directory;
  static constexpr CommandLineOption kOptions[] = {
      {"packets", 'n', true}, {"runs", 'r', true}, {"decode", 'd', true}, {"directory", 'o', true}};
  const ParsedCommandLine parsed = parseCommandLine(argc, argv, kOptions, [&](std::string_view name, const char* value) {
    char* end = nullptr;
    if (name == "packets") packets = std::strtoull(value, &end, 10);
    if (name == "runs") runs = static_cast<unsigned>(std::strtoul(value, &end, 10));
    if ((name == "packets" || name == "runs") && (end == value || *end != '\0')) {
      return "--" + std::string(name) + " takes a whole number, not '" + value + "'";
    }
    if (name == "decode") decode = value;
    if (name == "directory") directory = value;
    return std::string();
  });
  if (const std::optional<int> status = answerCommandLine(parsed, kProgram)) return *status;
  if (packets == 0 || runs == 0) return usageError(kProgram, "--packets and --runs must be at least 1");

  const bool temporary = directory.empty();
  if (temporary) {
    char pattern[] = "/tmp/capture-decode-bench-XXXXXX";
    if (!mkdtemp(pattern)) {
      std::perror("capture_decode_bench: cannot make a temporary directory");
      return 1;
    }
    directory = pattern;
  }
  const std::string dlfPath = directory + "/lte-mix.dlf";
  const std::string framedPath = directory + "/lte-mix.bin";
  {
    std::ofstream dlf(dlfPath, std::ios::binary);
    std::ofstream framed(framedPath, std::ios::binary);
    auto scenario = telephonyd::makeLogCodeScenario(kLogChannelTechnologyQuendraLTE, 1, 1'800'000'000'000'000ULL);
    std::vector<std::uint8_t> frame;
    std::vector<std::uint8_t> payload;
    for (unsigned long long n = 0; n < packets;) {
      const telephonyd::SourcePacket packet = scenario->nextPacket();
      const Bytes& bytes = *packet.data;
      if (bytes.empty() || bytes[0] != telephonyd::kLogTypeOrdinary) continue;
      const std::span<const std::uint8_t> record(bytes.data() + 1, bytes.size() - 1);
      dlf.write(reinterpret_cast<const char*>(record.data()), static_cast<std::streamsize>(record.size()));
      payload.assign({0x10, 0x00, static_cast<std::uint8_t>(record.size() & 0xFF),
                      static_cast<std::uint8_t>(record.size() >> 8)});
      payload.insert(payload.end(), record.begin(), record.end());
      frame.clear();
      diag::appendFrame(frame, payload);
      framed.write(reinterpret_cast<const char*>(frame.data()), static_cast<std::streamsize>(frame.size()));
      ++n;
    }
    if (!dlf || !framed) {
      std::fprintf(stderr, "capture_decode_bench: cannot write the captures in %s\n", directory.c_str());
      return 1;
    }
  }

  std::printf("corvane-decode -t Quendra_LTE, %llu packets of the simulator's LTE mix, median of %u runs\n", packets,
              runs);
  std::printf("%-14s %12s %10s %16s %14s\n", "capture", "bytes", "seconds", "packets/s", "peak RSS (MiB)");
  int failed = 0;
  for (const auto& [name, path] : {std::pair{"framed stream", framedPath}, std::pair{"DLF", dlfPath}}) {
    std::vector<double> seconds;
    long peak = 0;
    for (unsigned r = 0; r < runs; ++r) {
      const Run run = runDecode(decode, path);
      if (run.status != 0) {
        std::fprintf(stderr, "capture_decode_bench: %s exited with %d on %s\n", decode.c_str(), run.status,
                     path.c_str());
        failed = 1;
        break;
      }
      seconds.push_back(run.seconds);
      peak = std::max(peak, run.peakKib);
    }
    if (seconds.empty()) continue;
    std::sort(seconds.begin(), seconds.end());
    const double median = seconds[seconds.size() / 2];
    std::printf("%-14s %12llu %10.3f %16.0f %14.1f\n", name,
                static_cast<unsigned long long>(std::filesystem::file_size(path)), median,
                static_cast<double>(packets) / median, static_cast<double>(peak) / 1024);
  }
  if (temporary) std::filesystem::remove_all(directory);
  return failed;
}
