#include "telephonyd/ReplaySource.h"

#include <map>
#include <set>
#include <utility>

#include "CaptureReader.h"
#include "LogGenerator/LogCodeTechnologies.h"
#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd {

namespace {

// Packets the reader may be ahead of the service.
constexpr std::size_t kQueueCapacity = 4096;
// Packets handed from the reader at a time.
constexpr std::size_t kBatch = 256;
constexpr std::uint8_t kPrefixByte = 0x81;

// Thrown through the capture reader to end a read early.
struct StopReading {};

struct PacketFacts {
  std::optional<std::uint32_t> code;
  std::optional<std::uint64_t> timestamp;
};

// The code and timestamp of a log packet: an optional 2-byte prefix, the type
// byte (0x01 or 0xFF) and a record; nothing for a property-list report.
PacketFacts factsOf(std::span<const std::uint8_t> packet) {
  std::size_t at = packet.size() >= 2 && packet[0] == kPrefixByte ? 2 : 0;
  if (packet.size() < at + kLogPacketHeaderSize) return {};
  const std::uint8_t type = packet[at];
  if (type != kLogTypeOrdinary && type != kLogTypeExtraCode) return {};
  ++at;
  std::uint32_t code = packet[at + 2] | static_cast<std::uint32_t>(packet[at + 3]) << 8;
  if (type == kLogTypeExtraCode) code |= kExtraCodeBase;
  std::uint64_t timestamp = 0;
  for (int i = 7; i >= 0; --i) timestamp = timestamp << 8 | packet[at + 4 + static_cast<std::size_t>(i)];
  return {code, timestamp};
}

std::string tellTechnology(const std::string& path, std::string& error) {
  tools::InputError inputError;
  auto file = tools::CaptureFile::open(path, inputError);
  if (!file) {
    error = inputError.message;
    return {};
  }
  std::map<std::uint32_t, std::uint64_t> codes;
  std::uint64_t reports = 0;
  std::uint64_t seen = 0;
  tools::CaptureCounts counts;
  try {
    const auto result = tools::readCapture(
        *file, {},
        [&](std::span<const std::uint8_t> packet) {
          const PacketFacts facts = factsOf(packet);
          if (facts.code) ++codes[*facts.code];
          else ++reports;
          if (++seen == ReplaySource::kPacketsToTellTechnology) throw StopReading{};
        },
        counts, inputError);
    if (!result) {
      error = inputError.message;
      return {};
    }
  } catch (const StopReading&) {
  }
  std::string why;
  std::string technology = technologyOfCodes(codes, reports, why);
  if (technology.empty()) error = "cannot tell the technology of " + file->name() + ": " + why + "; give it with --technology NAME";
  return technology;
}

}  // namespace

std::string technologyOfCodes(const std::map<std::uint32_t, std::uint64_t>& codes, std::uint64_t reports,
                              std::string& why) {
  std::uint64_t logPackets = 0;
  for (const auto& [code, count] : codes) logPackets += code < kExtraCodeBase ? count : 0;
  if (logPackets == 0 && reports > 0) return std::string(kLogChannelTechnologyIFX);
  // The codes each technology's decoders read: the section tables', and the CDMA2000 decoders'.
  std::vector<std::pair<std::string_view, std::set<std::uint32_t>>> readers;
  for (const LogCodeTechnology& technology : logCodeTechnologies()) {
    std::set<std::uint32_t>& read = readers.emplace_back(technology.technology, std::set<std::uint32_t>{}).second;
    for (const SectionDescriptor& row : technology.sections()) read.insert(row.codes.begin(), row.codes.end());
  }
  std::set<std::uint32_t>& cdma = readers.emplace_back(kLogChannelTechnologyQuendraCDMA, std::set<std::uint32_t>{}).second;
  for (const c2k::CodeDecoder& decoder : c2k::kDecoders) cdma.insert(decoder.code);

  std::string best;
  std::string tiedWith;
  std::uint64_t most = 0;
  for (const auto& [technology, read] : readers) {
    std::uint64_t votes = 0;
    for (const auto& [code, count] : codes) votes += code < kExtraCodeBase && read.count(code) ? count : 0;
    if (votes > most) {
      most = votes;
      best = technology;
      tiedWith.clear();
    } else if (votes == most && votes > 0) {
      tiedWith = technology;
    }
  }
  if (most == 0) {
    why = logPackets == 0 ? "it holds no log records, only the service's own extra codes"
                          : "no decoder of this version reads its log codes";
    return {};
  }
  if (!tiedWith.empty()) {
    why = "its log codes are read as much by " + best + " as by " + tiedWith;
    return {};
  }
  return best;
}

std::unique_ptr<ReplaySource> ReplaySource::open(Settings settings, std::string& error) {
  if (settings.technology.empty()) {
    settings.technology = tellTechnology(settings.path, error);
    if (settings.technology.empty()) return nullptr;
  } else {
    tools::InputError inputError;
    if (!tools::CaptureFile::open(settings.path, inputError)) {
      error = inputError.message;
      return nullptr;
    }
  }
  std::unique_ptr<ReplaySource> source(new ReplaySource(std::move(settings)));
  source->reader_ = std::thread([s = source.get()] { s->readerMain(); });
  return source;
}

ReplaySource::ReplaySource(Settings settings) : settings_(std::move(settings)) {}

ReplaySource::~ReplaySource() {
  {
    std::lock_guard lock(mutex_);
    stopping_ = true;
  }
  space_.notify_all();
  if (reader_.joinable()) reader_.join();
}

bool ReplaySource::hand(std::vector<Queued>& batch) {
  std::unique_lock lock(mutex_);
  space_.wait(lock, [this] { return stopping_ || shared_.size() < kQueueCapacity; });
  if (stopping_) return false;
  for (Queued& queued : batch) shared_.push_back(std::move(queued));
  batch.clear();
  return true;
}

void ReplaySource::readerMain() {
  const std::string& path = settings_.path;
  for (std::uint64_t round = 0;; ++round) {
    tools::InputError error;
    auto file = tools::CaptureFile::open(path, error);
    if (!file) {
      log::printf(log::kError, "Replay: %s", error.message.c_str());
      break;
    }
    tools::CaptureCounts counts;
    std::vector<Queued> batch;
    batch.reserve(kBatch);
    bool first = true;
    bool stopped = false;
    std::optional<tools::CaptureResult> result;
    try {
      result = tools::readCapture(
          *file, {},
          [&](std::span<const std::uint8_t> packet) {
            const PacketFacts facts = factsOf(packet);
            batch.push_back({std::make_shared<const Bytes>(packet.begin(), packet.end()), facts.code, facts.timestamp,
                             first});
            first = false;
            if (batch.size() == kBatch && !hand(batch)) throw StopReading{};
          },
          counts, error);
      stopped = !hand(batch);
    } catch (const StopReading&) {
      stopped = true;
    }
    if (stopped) return;
    if (!result) {
      log::printf(log::kError, "Replay: %s", error.message.c_str());
      break;
    }
    if (round == 0) {
      for (const std::string& warning : result->warnings) log::printf(log::kWarning, "Replay: %s", warning.c_str());
      if (result->error) log::printf(log::kError, "Replay: %s", result->error->c_str());
    }
    if (counts.packets == 0 || !settings_.loop) break;
  }
  std::lock_guard lock(mutex_);
  readerDone_ = true;
}

PacketSource::Availability ReplaySource::availability() {
  if (!taken_.empty()) return Availability::Ready;
  if (ended_) return Availability::Ended;
  bool done = false;
  {
    std::lock_guard lock(mutex_);
    taken_.swap(shared_);
    done = readerDone_;
  }
  space_.notify_one();
  if (!taken_.empty()) return Availability::Ready;
  if (!done) return Availability::Later;
  ended_ = true;
  log::printf(log::kNotice, "Replay of %s ended after %llu packets", settings_.path.c_str(),
              static_cast<unsigned long long>(played_));
  return Availability::Ended;
}

SourcePacket ReplaySource::nextPacket() {
  Queued queued = std::move(taken_.front());
  taken_.pop_front();
  if (queued.firstOfRound && played_ > 0) {
    log::printf(log::kNotice, "Replay of %s starting again after %llu packets", settings_.path.c_str(),
                static_cast<unsigned long long>(played_));
    previousTimestamp_.reset();  // the new round follows at once
  }
  if (settings_.speed > 0 && played_ > 0) {
    std::chrono::nanoseconds gap{0};
    if (queued.timestamp) {
      if (previousTimestamp_) {
        const auto interval = basebandInterval(*previousTimestamp_, *queued.timestamp);
        if (interval.count() > 0 && interval <= kLongestGap) gap = interval;
      }
    } else if (!queued.firstOfRound) {
      gap = settings_.untimedInterval;
    }
    due_ += std::chrono::nanoseconds(static_cast<std::int64_t>(static_cast<double>(gap.count()) / settings_.speed));
  }
  if (queued.timestamp) previousTimestamp_ = queued.timestamp;
  ++played_;
  return {std::move(queued.data), queued.code, due_};
}

}  // namespace corvane::telephonyd
