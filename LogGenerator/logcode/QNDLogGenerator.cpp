#include "LogGenerator/logcode/QNDLogGenerator.h"

#include "platform/DateText.h"
#include "platform/Log.h"
#include "platform/Version.h"

namespace corvane {

namespace {

constexpr const char* kExecutableName = "EXECUTABLE_NAME";
// The moment this file was compiled, in the form "Jan 16 2017 23:26:21".
constexpr const char* kBuildDateText = __DATE__ " " __TIME__;

}  // namespace

DlfHeaderInputs QNDLogGenerator::currentHeaderInputs() {
  const Date now = currentDate();
  const LocalTimeZone zone = localTimeZoneAt(now);
  DlfHeaderInputs inputs;
  inputs.bundleVersion = std::string(kVersion);
  inputs.secondsSince1970 = static_cast<std::uint32_t>(now.microsecondsSince1970 / 1'000'000);
  inputs.utcOffsetSeconds = zone.offsetFromUtcSeconds;
  inputs.daylightSaving = zone.daylightSaving;
  inputs.buildDateText = kBuildDateText;
  return inputs;
}

DlfTimeRecord QNDLogGenerator::timeRecordFrom(const DlfHeaderInputs& inputs) {
  DlfTimeRecord time;
  time.seconds = inputs.secondsSince1970;
  time.timeZoneMinutes = static_cast<std::int16_t>(inputs.utcOffsetSeconds / 60);  // toward zero
  time.daylightSaving = inputs.daylightSaving ? 1 : 0;
  return time;
}

std::optional<Bytes> QNDLogGenerator::generateDlfFromState(const Dictionary& state) const {
  Bytes dlf(kDlfVersionReportSize, 0);
  const DlfHeaderInputs inputs = headerInputs_();
  const std::string version = inputs.bundleVersion ? "Corvane " + *inputs.bundleVersion : "(none)";
  std::size_t written = 0;
  const int result = QNVDLFAddVersionReport(dlf.data(), dlf.size(), &written, 1, 1, version.c_str(), kExecutableName,
                                            inputs.buildDateText.c_str(), timeRecordFrom(inputs));
  if (result != kDlfOk) {
    log::printf(kDlfFailurePriority, "Could not write DLF header (result=%d)", result);
    return std::nullopt;
  }

  const Value* history = state.find(kStateHistory);
  if (const Array* entries = history ? history->asArray() : nullptr) {
    for (const Value& entry : entries->elements()) {
      const Dictionary* snapshot = entry.asDictionary();
      const Value* displayState = snapshot ? snapshot->find(kStateDisplayState) : nullptr;
      if (!displayState || displayState->isNull()) continue;
      const Bytes* bytes = displayState->asData();
      if (!bytes) {
        log::printf(kDlfFailurePriority, "Got wrong class writing history to DLF; aborting writing the DLF file");
        return std::nullopt;
      }
      if (bytes->size() >= 2) dlf.insert(dlf.end(), bytes->begin() + 1, bytes->end());
    }
  }
  return dlf;
}

Value QNDLogGenerator::getSaveContentsFromState(const Dictionary& state) {
  Array contents;
  if (const Value* history = state.find(kStateHistory)) {
    if (const Array* entries = history->asArray()) contents = entries->shallowCopy();
  }
  if (auto dlf = generateDlfFromState(state)) {
    Dictionary entry;
    entry.set(kSnapshotDescription, Value(log::format("DLF binary (%d bytes)", static_cast<int>(dlf->size()))));
    entry.set(kSaveContentsDLF, Value(std::move(*dlf)));
    contents.append(Value(entry));
  }
  return Value(contents);
}

}  // namespace corvane
