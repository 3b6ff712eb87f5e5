#pragma once

// Saving a snapshot of what the application has collected: the save contents
// (the model's, copied at the moment the save screen opens), the descriptions
// of their entries (every one is saved), a description typed by the user, and
// one XML property list {"Timestamp", "Data", "Description"} written as
// "<directory>/CorvaneSnapshot-<seconds since 1970>.corvane".

#include <filesystem>
#include <string>
#include <vector>

#include "platform/Value.h"

namespace corvane {

// What the user is told when the file cannot be written.
inline constexpr const char* kFileErrorTitle = "File Error";
inline constexpr const char* kFileErrorMessage = "Unable to write file to disk";
inline constexpr const char* kFileErrorButton = "Close";

// Saving is offered on a device that holds the save-enabling marker below `deviceRoot`.
bool saveOffered(const std::filesystem::path& deviceRoot);

class SnapshotSaver {
 public:
  // Records `opened` as the snapshot's timestamp and keeps a deep copy of `saveHistory`.
  SnapshotSaver(const Value& saveHistory, std::filesystem::path directory, const Date& opened);

  const Date& timeStamp() const { return timeStamp_; }
  const Value& saveHistory() const { return saveHistory_; }
  const std::filesystem::path& directory() const { return directory_; }

  // The "Description" of each entry of the save contents ("" where it has none).
  std::vector<std::string> entryDescriptions() const;
  // Where the snapshots go, for the save screen.
  std::string destinationText() const;
  std::string snapshotFileAt(const Date& date) const;
  // The snapshot: "Timestamp", then "Data" and "Description" when there are save contents.
  Value snapshot(const std::string& description) const;
  // Writes the snapshot into the file of `now`; logs an error and returns false when it cannot.
  bool save(const std::string& description, const Date& now, std::string* file = nullptr) const;

 private:
  Date timeStamp_;
  Value saveHistory_;
  std::filesystem::path directory_;
};

}  // namespace corvane
