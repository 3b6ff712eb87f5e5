#pragma once

// The common base of the log-code generators. It keeps the raw bytes of every
// packet received since the last display update, and when a snapshot is saved
// it adds a DLF binary of the history's raw packets to the saved contents: the
// version report record, then for each history entry its "DisplayState" bytes
// without their first byte (which turns the first packet of the buffer into a
// plain log record; the type bytes of the packets after it stay in the stream).

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/logcode/DlfVersionReport.h"

namespace corvane {

// The priority of the two DLF failure messages, passed to the log as it is.
inline constexpr int kDlfFailurePriority = 16;
inline constexpr std::string_view kSaveContentsDLF = "DLF";

// What the version report of a DLF says about the program and the moment.
struct DlfHeaderInputs {
  std::optional<std::string> bundleVersion;  // nothing gives "(none)"
  std::uint32_t secondsSince1970 = 0;
  int utcOffsetSeconds = 0;  // local offset, east positive
  bool daylightSaving = false;
  std::string buildDateText;  // "Jan 16 2017 23:26:21"
};

class QNDLogGenerator : public LogGenerator {
 public:
  QNDLogGenerator() = default;

  // The DLF binary of the state's history, or nothing when the header cannot
  // be written or a "DisplayState" is not a byte string.
  std::optional<Bytes> generateDlfFromState(const Dictionary& state) const;
  // A copy of the history, plus {"Description": "DLF binary (%d bytes)", "DLF": data}.
  Value getSaveContentsFromState(const Dictionary& state) override;

  // The inputs of the version report for now: this program's version and
  // build date, the current time and the local time zone.
  static DlfHeaderInputs currentHeaderInputs();
  // The time record of a version report; the offset goes to minutes toward zero.
  static DlfTimeRecord timeRecordFrom(const DlfHeaderInputs& inputs);
  // Replaces where the version report's inputs come from (tests).
  void setHeaderInputsSource(std::function<DlfHeaderInputs()> source) { headerInputs_ = std::move(source); }

 protected:
  Bytes _binData;

 private:
  std::function<DlfHeaderInputs()> headerInputs_ = &QNDLogGenerator::currentHeaderInputs;
};

}  // namespace corvane
