#include "telephonyd/ModemExtraCodes.h"

#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd {

namespace {

constexpr std::uint64_t kTicksPerContexts = ModemExtraCodes::kContextsEvery / ModemExtraCodes::kCellsEvery;
constexpr std::uint64_t kTicksPerSimFiles = ModemExtraCodes::kSimFilesEvery / ModemExtraCodes::kCellsEvery;

// The extra code (less 0xFF0000) of each part.
std::uint16_t extraCode(ModemClient::Part part) {
  switch (part) {
    case ModemClient::Part::Sim: return 0;
    case ModemClient::Part::Cells: return 1;
    case ModemClient::Part::Contexts: return 2;
  }
  return 0;
}

constexpr ModemClient::Part kParts[] = {ModemClient::Part::Sim, ModemClient::Part::Cells,
                                        ModemClient::Part::Contexts};

}  // namespace

ModemExtraCodes::ModemExtraCodes(RunLoop& loop, std::unique_ptr<ModemClient> client)
    : loop_(loop), client_(std::move(client)) {
  // The client is this object's own, and the handler goes before it does.
  client_->setChangeHandler([this](ModemClient::Part part) { onChange(part); });
}

ModemExtraCodes::~ModemExtraCodes() {
  if (timer_) loop_.cancel(timer_);
  client_->setChangeHandler(nullptr);
}

bool ModemExtraCodes::wants(ModemClient::Part part) const { return wanted_.count(extraCode(part)) > 0; }

void ModemExtraCodes::setWantedCodes(const std::set<std::uint32_t>& extraCodes) {
  wanted_.clear();
  for (ModemClient::Part part : kParts) {
    if (extraCodes.count(extraCode(part))) wanted_.insert(extraCode(part));
  }
  if (wanted_.empty()) {
    if (timer_) loop_.cancel(timer_);
    timer_ = 0;
    return;
  }
  if (!timer_) {
    ticks_ = 0;
    std::weak_ptr<bool> alive = alive_;
    timer_ = loop_.scheduleRepeatingTimer(kCellsEvery, [this, alive] {
      if (!alive.expired()) tick();
    });
  }
  // A channel that has just started gets what is known at once (after the
  // current work: this runs inside the service's channel bookkeeping).
  std::weak_ptr<bool> alive = alive_;
  loop_.dispatchAsync([this, alive] {
    if (alive.expired()) return;
    if (wants(ModemClient::Part::Cells)) client_->refresh(ModemClient::Part::Cells);
    for (ModemClient::Part part : {ModemClient::Part::Sim, ModemClient::Part::Contexts}) {
      if (wants(part)) send(part);
    }
  });
}

void ModemExtraCodes::tick() {
  ++ticks_;
  if (wants(ModemClient::Part::Cells)) client_->refresh(ModemClient::Part::Cells);
  if (ticks_ % kTicksPerContexts == 0 && wants(ModemClient::Part::Contexts)) {
    client_->refresh(ModemClient::Part::Contexts);
    send(ModemClient::Part::Contexts);
  }
  if (ticks_ % kTicksPerSimFiles == 0 && wants(ModemClient::Part::Sim)) send(ModemClient::Part::Sim);
}

void ModemExtraCodes::onChange(ModemClient::Part part) {
  if (wants(part)) send(part);
}

void ModemExtraCodes::send(ModemClient::Part part) {
  if (!emit_) return;
  Value payload;
  switch (part) {
    case ModemClient::Part::Sim:
      if (const auto sim = client_->sim()) payload = Value(modem::simFiles(*sim));
      break;
    case ModemClient::Part::Cells:
      if (const auto cells = client_->cells()) payload = Value(modem::cellMonitorList(*cells));
      break;
    case ModemClient::Part::Contexts:
      if (const auto contexts = client_->contexts()) {
        payload = Value(modem::pdpContexts(contexts->profiles, contexts->bearers));
      }
      break;
  }
  if (payload.type() == Value::Type::Null) return;  // not known (no modem)
  const auto now = std::chrono::time_point_cast<std::chrono::microseconds>(std::chrono::system_clock::now());
  const std::uint16_t n = extraCode(part);
  emit_({std::make_shared<const Bytes>(encodeExtraCodePacket(n, basebandTimestamp(now), payload)),
         kExtraCodeBase + n});
}

}  // namespace corvane::telephonyd
