#include "presenter/SnapshotSaver.h"

#include <cstdio>

#include "platform/DateText.h"
#include "platform/DevicePaths.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"

namespace corvane {

namespace {

// Writes straight into the final file (no temporary file and rename): a
// snapshot is written once and nothing else reads it while it is written.
bool writeFile(const std::string& path, const Bytes& bytes) {
  std::FILE* file = std::fopen(path.c_str(), "wb");
  if (!file) return false;
  const bool written = std::fwrite(bytes.data(), 1, bytes.size(), file) == bytes.size();
  return std::fclose(file) == 0 && written;
}

}  // namespace

bool saveOffered(const std::filesystem::path& deviceRoot) {
  std::error_code error;
  return std::filesystem::exists(devicePath(kSaveEnablingMarkerPath, deviceRoot), error);
}

SnapshotSaver::SnapshotSaver(const Value& saveHistory, std::filesystem::path directory, const Date& opened)
    : timeStamp_(opened), saveHistory_(saveHistory.deepCopy()), directory_(std::move(directory)) {}

std::vector<std::string> SnapshotSaver::entryDescriptions() const {
  std::vector<std::string> descriptions;
  const Array* entries = saveHistory_.asArray();
  if (!entries) return descriptions;
  for (std::size_t i = 0; i < entries->size(); ++i) {
    std::string description;
    if (const Dictionary* dictionary = entries->at(i).asDictionary()) {
      if (const Value* text = dictionary->find("Description"); text && text->asString()) description = *text->asString();
    }
    descriptions.push_back(std::move(description));
  }
  return descriptions;
}

std::string SnapshotSaver::destinationText() const {
  return "Written to " + directory_.string() +
         " as CorvaneSnapshot-<seconds since 1970>.corvane, an XML property list.";
}

std::string SnapshotSaver::snapshotFileAt(const Date& date) const {
  // Whole seconds, rounded down also before 1970.
  std::int64_t seconds = date.microsecondsSince1970 / 1'000'000;
  if (date.microsecondsSince1970 % 1'000'000 < 0) --seconds;
  char name[64];
  std::snprintf(name, sizeof name, "CorvaneSnapshot-%ld.corvane", static_cast<long>(seconds));
  return directory_.string() + "/" + name;
}

Value SnapshotSaver::snapshot(const std::string& description) const {
  // The keys go in this order, and the first value missing ends the dictionary.
  Dictionary snapshot;
  snapshot.set("Timestamp", Value(dateText(timeStamp_)));
  if (!saveHistory_.isNull()) {
    snapshot.set("Data", saveHistory_);
    snapshot.set("Description", Value(description));
  }
  return Value(snapshot);
}

bool SnapshotSaver::save(const std::string& description, const Date& now, std::string* file) const {
  const std::string path = snapshotFileAt(now);
  if (file) *file = path;
  std::string error;
  const std::optional<Bytes> bytes = plist::serialize(snapshot(description), plist::Format::XML, &error);
  if (bytes && writeFile(path, *bytes)) return true;
  log::printf(log::kError, "Unable to write snapshot to %s", path.c_str());
  return false;
}

}  // namespace corvane
