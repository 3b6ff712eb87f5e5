#include "LogGenerator/LogGenerator.h"

#include <array>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "LogGenerator/lte/LTELogGenerator.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"
#include "platform/DateText.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"

namespace corvane {

namespace {

struct TechnologyGenerator {
  std::string_view technology;
  std::unique_ptr<LogGenerator> (*generator)();
};

// Searched in order; the first technology equal to the value wins.
constexpr std::array kGeneratorsByTechnology = {
    TechnologyGenerator{kLogChannelTechnologyQuendraGSM, &QND_GSMLogGenerator::generator},
    TechnologyGenerator{kLogChannelTechnologyQuendraCDMA, &C2KLogGenerator::generator},
    TechnologyGenerator{kLogChannelTechnologyQuendraLTE, &LTELogGenerator::generator},
    TechnologyGenerator{kLogChannelTechnologyQuendraUTRAN2, &UTRANLogGenerator::generator},
    TechnologyGenerator{kLogChannelTechnologyIFX, &GSMLogGenerator::generator},
};

Value shallowCopy(const Value& v) {
  if (const Dictionary* d = v.asDictionary()) return Value(d->shallowCopy());
  if (const Array* a = v.asArray()) return Value(a->shallowCopy());
  return v;
}

}  // namespace

LogGenerator::LogGenerator() { log::printf(log::kWarning, "Creating Log object: %s", log::pointerText(this).c_str()); }

void LogGenerator::updateHistoryInState(const Dictionary& state) {
  Array history;
  if (const Value* existing = state.find(kStateHistory); existing && existing->isArray()) {
    history = *existing->asArray();
    if (history.size() >= kHistoryLimit) history.removeFirst(history.size() - (kHistoryLimit - 1));
  } else {
    state.set(kStateHistory, Value(history));
  }

  // The entries go in this order and the first missing one ends the snapshot.
  Dictionary snapshot;
  for (std::string_view key : {kStateDisplayState, kStateDisplay, kStateExtraInfo}) {
    const Value* v = state.find(key);
    if (!v || v->isNull()) {
      history.append(Value(snapshot));
      return;
    }
    snapshot.set(key, shallowCopy(*v));
  }
  snapshot.set(kSnapshotDate, Value(currentDateText()));
  snapshot.set(kSnapshotDescription, Value("Snapshot (" + currentDateText() + ")"));
  history.append(Value(snapshot));
}

std::unique_ptr<LogGenerator> LogGenerator::generatorFromTechnology(std::string_view technology) {
  for (const auto& row : kGeneratorsByTechnology) {
    if (row.technology == technology) return row.generator();
  }
  return nullptr;
}

}  // namespace corvane
