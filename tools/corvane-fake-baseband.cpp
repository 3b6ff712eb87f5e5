// corvane-fake-baseband: a baseband's diagnostic port on a pseudo-terminal,
// for tests and demos of corvane-telephonyd --diag without a phone.
//
// It answers the log-configuration commands as a baseband does (id ranges,
// set mask, disable logging), and streams framed log packets of the
// simulator's scenario for a technology, only the codes whose mask bits are
// set. It can be told to misbehave: frames split across writes, garbage
// between frames, bad CRCs, frames for a second subscription, never
// answering, and vanishing for a while (a modem rebooting) to come back on a
// new pseudo-terminal behind the same link.
//
// What it is asked and does is written to standard output, one line each
// ("ranges asked", "mask set: id 11: 0xB0C1 0xB17F", "logging disabled",
// "vanished", "back on /dev/pts/7").

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <termios.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <optional>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "platform/CommandLine.h"
#include "platform/DiagFrames.h"
#include "platform/LogChannelTechnology.h"
#include "platform/DiagCommands.h"
#include "telephonyd/LogCodeSimulator.h"
#include "telephonyd/PacketSource.h"

namespace {

using namespace corvane;
using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

const ProgramUsage kProgram{
    "corvane-fake-baseband",
    "Usage: corvane-fake-baseband --link PATH [OPTION]...\n",
    "\n"
    "Plays a baseband's diagnostic port on a pseudo-terminal, reached through the\n"
    "symbolic link PATH, for corvane-telephonyd --diag PATH. It answers the log\n"
    "mask commands and streams framed log packets of the simulator's scenario,\n"
    "only the codes whose mask bits are set. What it is asked is printed, a line\n"
    "each. SIGINT or SIGTERM end it and remove the link.\n"
    "\n"
    "  -l, --link PATH        the link to the pseudo-terminal (required)\n"
    "  -t, --technology NAME  the scenario (default Quendra_LTE)\n"
    "  -s, --seed N           its seed (default 1)\n"
    "  -r, --rate N           log packets per second at most (default 50)\n"
    "      --split            write each frame in pieces of a few bytes\n"
    "      --garbage          write stray bytes and a flag before every fifth frame\n"
    "      --bad-crc N        spoil the CRC of every Nth frame\n"
    "      --subscription     wrap every other log packet for a second subscription\n"
    "      --silent           never answer a command\n"
    "      --vanish-after S   vanish S seconds after logging was first switched on...\n"
    "      --away-for S       ...for S seconds (default 2), then come back with\n"
    "                         logging off, as a rebooted modem does\n"
    "  -h, --help             show this help and exit\n"
    "  -V, --version          show the version and exit\n",
};

// The number of mask bits of equipment ids 0 to 15: what the scenarios' codes
// need, with room, and an id (11, LTE) narrower than 0x1000 codes.
constexpr diag::IdRanges kRanges = {0x100, 0x800, 0, 0, 0x1000, 0x1000, 0, 0x1000,
                                    0,     0,     0, 0x200, 0,   0,      0, 0};

struct Options {
  std::string link;
  std::string technology = std::string(kLogChannelTechnologyQuendraLTE);
  std::uint64_t seed = 1;
  double rate = 50;
  bool split = false;
  bool garbage = false;
  std::uint64_t badCrcEvery = 0;
  bool subscription = false;
  bool silent = false;
  std::optional<double> vanishAfter;
  double awayFor = 2;
};

volatile sig_atomic_t stopping = 0;

void say(const std::string& line) {
  std::printf("%s\n", line.c_str());
  std::fflush(stdout);
}

class FakeBaseband {
 public:
  explicit FakeBaseband(Options options) : options_(std::move(options)), random_(options_.seed) {}

  bool appear(std::string& error) {
    master_ = ::posix_openpt(O_RDWR | O_NOCTTY);
    if (master_ < 0 || ::grantpt(master_) != 0 || ::unlockpt(master_) != 0) {
      error = std::string("cannot make a pseudo-terminal: ") + std::strerror(errno);
      return false;
    }
    const std::string slave = ::ptsname(master_);
    // Holding the slave open keeps its raw settings for whoever opens it next.
    slave_ = ::open(slave.c_str(), O_RDWR | O_NOCTTY);
    termios settings{};
    if (slave_ < 0 || ::tcgetattr(slave_, &settings) != 0) {
      error = "cannot open " + slave + ": " + std::strerror(errno);
      return false;
    }
    ::cfmakeraw(&settings);
    ::tcsetattr(slave_, TCSANOW, &settings);
    ::fcntl(master_, F_SETFL, ::fcntl(master_, F_GETFL) | O_NONBLOCK);
    // The link moves in one step, so that a reader never finds it missing halfway.
    const std::string temporary = options_.link + ".new";
    std::filesystem::remove(temporary);
    std::error_code failed;
    std::filesystem::create_symlink(slave, temporary, failed);
    if (!failed) std::filesystem::rename(temporary, options_.link, failed);
    if (failed) {
      error = "cannot link " + options_.link + " to " + slave + ": " + failed.message();
      return false;
    }
    masks_ = {};
    deframer_ = diag::Deframer();
    return true;
  }

  void vanish() {
    std::error_code ignored;
    std::filesystem::remove(options_.link, ignored);
    if (master_ >= 0) ::close(master_);
    if (slave_ >= 0) ::close(slave_);
    master_ = slave_ = -1;
  }

  int run() {
    std::string error;
    if (!appear(error)) {
      std::fprintf(stderr, "corvane-fake-baseband: %s\n", error.c_str());
      return 1;
    }
    say("listening on " + std::string(::ptsname(master_)) + " as " + options_.link);
    scenario_ = telephonyd::makeLogCodeScenario(options_.technology, options_.seed, 1'800'000'000'000'000);
    const auto interval = std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(1.0 / options_.rate));
    auto next = Clock::now();
    while (!stopping) {
      if (vanishAt_ && Clock::now() >= *vanishAt_) {
        vanishAt_.reset();
        vanish();
        say("vanished");
        std::this_thread::sleep_for(std::chrono::duration<double>(options_.awayFor));
        if (stopping) break;
        if (!appear(error)) {
          std::fprintf(stderr, "corvane-fake-baseband: %s\n", error.c_str());
          return 1;
        }
        say("back on " + std::string(::ptsname(master_)));
      }
      const auto wait = std::chrono::duration_cast<std::chrono::milliseconds>(next - Clock::now()).count();
      pollfd ready{master_, POLLIN, 0};
      if (::poll(&ready, 1, static_cast<int>(std::max<long long>(0, std::min<long long>(wait, 100)))) > 0) readCommands();
      if (Clock::now() >= next) {
        next += interval;
        if (Clock::now() > next + 1s) next = Clock::now();  // held up: no burst
        sendDuePacket();
      }
    }
    vanish();
    return 0;
  }

 private:
  void readCommands() {
    std::array<std::uint8_t, 4096> buffer;
    for (;;) {
      const ssize_t n = ::read(master_, buffer.data(), buffer.size());
      if (n <= 0) return;  // nothing more now (EIO while nobody holds the port open but us)
      deframer_.feed(std::span<const std::uint8_t>(buffer.data(), static_cast<std::size_t>(n)),
                     [this](const diag::Deframer::Frame& frame) { onCommand(frame.bytes); });
    }
  }

  void onCommand(std::span<const std::uint8_t> frame) {
    const auto request = diag::parseLogConfigRequest(frame);
    if (!request) {
      say("command not understood");
      return;
    }
    switch (request->operation) {
      case diag::LogConfigOperation::RetrieveIdRanges:
        say("ranges asked");
        if (!options_.silent) send(diag::logConfigReply(request->operation, 0, &kRanges));
        return;
      case diag::LogConfigOperation::Disable:
        masks_ = {};
        say("logging disabled");
        if (!options_.silent) send(diag::logConfigReply(request->operation, 0));
        return;
      case diag::LogConfigOperation::SetMask: {
        const std::uint32_t id = request->equipmentId;
        const bool fits = id < diag::kEquipmentIds && request->bits <= kRanges[id];
        std::string line = "mask set: id " + std::to_string(id) + ":";
        if (fits) {
          masks_[id] = request->mask;
          for (std::uint32_t bit = 0; bit < request->bits; ++bit) {
            if (request->mask[bit / 8] >> (bit % 8) & 1) {
              char code[12];
              std::snprintf(code, sizeof code, " 0x%04X", static_cast<unsigned>(id << 12 | bit));
              line += code;
            }
          }
        } else {
          line += " refused: more bits than the id has";
        }
        say(line);
        if (!vanishAt_ && options_.vanishAfter && !vanishedOnce_) {
          vanishAt_ = Clock::now() + std::chrono::duration_cast<Clock::duration>(
                                         std::chrono::duration<double>(*options_.vanishAfter));
          vanishedOnce_ = true;
        }
        if (!options_.silent) send(diag::logConfigReply(request->operation, fits ? 0 : 1));
        return;
      }
    }
  }

  bool wanted(std::uint32_t code) const {
    const std::uint32_t id = code >> 12;
    const std::uint32_t bit = code & 0xFFF;
    if (id >= diag::kEquipmentIds || masks_[id].size() * 8 <= bit) return false;
    return masks_[id][bit / 8] >> (bit % 8) & 1;
  }

  // The scenario's next log record, if its code's bit is set.
  void sendDuePacket() {
    for (int tries = 0; tries < 64; ++tries) {
      const telephonyd::SourcePacket packet = scenario_->nextPacket();
      // The extra codes are the telephony service's own, never a baseband's.
      if (!packet.code || *packet.code >= telephonyd::kExtraCodeBase || !wanted(*packet.code)) continue;
      std::vector<std::uint8_t> frame = diag::logFrame(std::span(packet.data->data() + 1, packet.data->size() - 1));
      if (options_.subscription && ++logFrames_ % 2 == 0) {
        frame.insert(frame.begin(), {diag::kSubscriptionCommand, 1, 0, 0});
      }
      send(frame);
      return;
    }
  }

  void send(std::span<const std::uint8_t> payload) {
    ++frames_;
    std::vector<std::uint8_t> bytes;
    if (options_.garbage && frames_ % 5 == 0) bytes.insert(bytes.end(), {0x13, 0x37, 0x00, 0xA5, diag::kFlag});
    diag::appendFrame(bytes, payload);
    if (options_.badCrcEvery > 0 && frames_ % options_.badCrcEvery == 0) {
      // The byte before the flag is the CRC's (or an escape's second): spoil it without making a flag or escape.
      std::uint8_t& last = bytes[bytes.size() - 2];
      last = last == 0x01 ? 0x02 : 0x01;
    }
    if (!options_.split) {
      writeAll(bytes);
      return;
    }
    std::uniform_int_distribution<std::size_t> piece(1, 7);
    for (std::size_t at = 0; at < bytes.size();) {
      const std::size_t n = std::min(piece(random_), bytes.size() - at);
      writeAll(std::span(bytes.data() + at, n));
      at += n;
      std::this_thread::sleep_for(50us);
    }
  }

  void writeAll(std::span<const std::uint8_t> bytes) {
    for (std::size_t at = 0; at < bytes.size() && master_ >= 0;) {
      const ssize_t n = ::write(master_, bytes.data() + at, bytes.size() - at);
      if (n > 0) {
        at += static_cast<std::size_t>(n);
      } else if (n < 0 && errno == EAGAIN) {
        pollfd room{master_, POLLOUT, 0};
        if (::poll(&room, 1, 100) <= 0) return;  // nobody reads: the rest is lost, as on a real port
      } else if (n < 0 && errno != EINTR) {
        return;
      }
    }
  }

  Options options_;
  std::mt19937_64 random_;
  int master_ = -1;
  int slave_ = -1;
  diag::Deframer deframer_;
  std::array<std::vector<std::uint8_t>, diag::kEquipmentIds> masks_;
  std::unique_ptr<telephonyd::LogCodeSimulator> scenario_;
  std::uint64_t frames_ = 0;
  std::uint64_t logFrames_ = 0;
  std::optional<Clock::time_point> vanishAt_;
  bool vanishedOnce_ = false;
};

bool parseNumber(const char* text, double& value) {
  char* end = nullptr;
  errno = 0;
  const double parsed = std::strtod(text, &end);
  if (errno != 0 || end == text || *end != '\0' || !std::isfinite(parsed) || parsed < 0) return false;
  value = parsed;
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  Options options;
  static constexpr CommandLineOption kOptions[] = {
      {"link", 'l', true},        {"technology", 't', true}, {"seed", 's', true},   {"rate", 'r', true},
      {"split", 0, false},        {"garbage", 0, false},     {"bad-crc", 0, true},  {"subscription", 0, false},
      {"silent", 0, false},       {"vanish-after", 0, true}, {"away-for", 0, true},
  };
  const ParsedCommandLine parsed =
      parseCommandLine(argc, argv, kOptions, [&](std::string_view name, const char* value) -> std::string {
        double number = 0;
        const bool numeric = value && parseNumber(value, number);
        if (name == "link") options.link = value;
        if (name == "technology") options.technology = value;
        if (name == "seed" || name == "rate" || name == "bad-crc" || name == "vanish-after" || name == "away-for") {
          if (!numeric) return "invalid number '" + std::string(value) + "' for --" + std::string(name);
        }
        if (name == "seed") options.seed = static_cast<std::uint64_t>(number);
        if (name == "rate") {
          if (number <= 0) return std::string("--rate must be above 0");
          options.rate = number;
        }
        if (name == "bad-crc") options.badCrcEvery = static_cast<std::uint64_t>(number);
        if (name == "vanish-after") options.vanishAfter = number;
        if (name == "away-for") options.awayFor = number;
        if (name == "split") options.split = true;
        if (name == "garbage") options.garbage = true;
        if (name == "subscription") options.subscription = true;
        if (name == "silent") options.silent = true;
        return {};
      });
  if (const std::optional<int> status = answerCommandLine(parsed, kProgram)) return *status;
  if (options.link.empty()) return usageError(kProgram, "--link PATH is required");
  if (!telephonyd::makeLogCodeScenario(options.technology, 1, 0)) {
    return usageError(kProgram, "no log-code scenario for technology '" + options.technology + "'");
  }

  struct sigaction action {};
  action.sa_handler = [](int) { stopping = 1; };
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
  std::signal(SIGPIPE, SIG_IGN);
  return FakeBaseband(options).run();
}
