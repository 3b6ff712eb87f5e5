#include "telephonyd/LogCodeSimulator.h"

#include <stdexcept>

#include "platform/LogChannelTechnology.h"
#include "telephonyd/CdmaRadioEncoder.h"
#include "telephonyd/GsmUmtsRadioEncoder.h"
#include "telephonyd/LogRecord.h"
#include "telephonyd/LteRadioEncoder.h"
#include "telephonyd/UtranRadioEncoder.h"

namespace corvane::telephonyd {

namespace {

constexpr std::uint64_t kPeriodsPerMeasurement =
    LogCodeSimulator::periodsIn(
        std::chrono::duration_cast<std::chrono::milliseconds>(SimulatedNetwork::kMeasurementPeriod));
static_assert(kPeriodsPerMeasurement * LogCodeSimulator::kPeriod == SimulatedNetwork::kMeasurementPeriod,
              "measurements fall on period starts");

constexpr std::uint64_t kMicrosecondsPerPeriod =
    static_cast<std::uint64_t>(std::chrono::microseconds(LogCodeSimulator::kPeriod).count());

bool isLogCodeTechnology(std::string_view technology) {
  return technology == kLogChannelTechnologyQuendraGSM || technology == kLogChannelTechnologyQuendraLTE ||
         technology == kLogChannelTechnologyQuendraUTRAN2 || technology == kLogChannelTechnologyQuendraCDMA;
}

SourcePacket extraCodePacket(std::uint16_t n, std::uint64_t timestamp, const Value& payload) {
  return {std::make_shared<const Bytes>(encodeExtraCodePacket(n, timestamp, payload)), kExtraCodeBase + n};
}

}  // namespace

LogCodeSimulator::LogCodeSimulator(std::string_view technology, std::uint64_t seed, std::uint64_t clockStart)
    : technology_(technology), network_(technology, seed), clockStart_(clockStart) {}

void LogCodeSimulator::addEncoder(std::unique_ptr<Encoder> encoder) { encoders_.push_back(std::move(encoder)); }

void LogCodeSimulator::runPeriod() {
  const std::uint64_t period = nextPeriod_++;
  if (period > 0 && period % kPeriodsPerMeasurement == 0) network_.step();
  const std::uint64_t timestamp =
      basebandTimestamp(BasebandMoment(std::chrono::microseconds(clockStart_ + period * kMicrosecondsPerPeriod)));
  due_.clear();
  for (const auto& encoder : encoders_) encoder->encode(network_, period, timestamp, due_);
  for (SourcePacket& packet : due_) pending_.push_back(std::move(packet));
}

SourcePacket LogCodeSimulator::nextPacket() {
  if (encoders_.empty()) throw std::logic_error("a log-code scenario without encoders yields no packets");
  // An encoder that stayed silent for this long is broken, not just quiet.
  constexpr std::uint64_t kMostSilentPeriods = 1'000'000;
  for (std::uint64_t silent = 0; pending_.empty(); ++silent) {
    if (silent == kMostSilentPeriods) throw std::logic_error("the log-code scenario's encoders have fallen silent");
    runPeriod();
  }
  SourcePacket packet = std::move(pending_.front());
  pending_.pop_front();
  return packet;
}

void ExtraCodeEncoder::encode(const SimulatedNetwork& network, std::uint64_t period, std::uint64_t timestamp,
                              std::vector<SourcePacket>& out) {
  static constexpr std::uint64_t kSimFilesPeriods = LogCodeSimulator::periodsIn(kSimFilesEvery);
  static constexpr std::uint64_t kPdpPeriods = LogCodeSimulator::periodsIn(kPdpContextsEvery);
  if (period % kSimFilesPeriods == 0) out.push_back(extraCodePacket(0, timestamp, network.simFiles()));
  if (period % kPeriodsPerMeasurement == 0) out.push_back(extraCodePacket(1, timestamp, network.cellList()));
  if (period % kPdpPeriods == 0 || network.pdpGeneration() != reportedPdpGeneration_) {
    out.push_back(extraCodePacket(2, timestamp, network.pdpContexts()));
    reportedPdpGeneration_ = network.pdpGeneration();
  }
}

std::unique_ptr<LogCodeSimulator> makeLogCodeScenario(std::string_view technology, std::uint64_t seed,
                                                      std::uint64_t clockStart) {
  if (!isLogCodeTechnology(technology)) return nullptr;
  auto scenario = std::make_unique<LogCodeSimulator>(technology, seed, clockStart);
  scenario->addEncoder(std::make_unique<ExtraCodeEncoder>());
  if (technology == kLogChannelTechnologyQuendraLTE) scenario->addEncoder(std::make_unique<LteRadioEncoder>());
  if (technology == kLogChannelTechnologyQuendraGSM) scenario->addEncoder(std::make_unique<GsmUmtsRadioEncoder>());
  if (technology == kLogChannelTechnologyQuendraCDMA) scenario->addEncoder(std::make_unique<CdmaRadioEncoder>(seed));
  if (technology == kLogChannelTechnologyQuendraUTRAN2) scenario->addEncoder(std::make_unique<UtranRadioEncoder>());
  return scenario;
}

}  // namespace corvane::telephonyd
