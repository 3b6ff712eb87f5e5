#pragma once

// The generator of the IFX baseband. Its packets are serialised property lists
// that already hold the values to show. The generator keeps the latest packet
// and folds it for display: the first element of every array is left out, and a
// dictionary with a single entry is replaced by that entry's value.

#include "LogGenerator/LogGenerator.h"

namespace corvane {

class GSMLogGenerator final : public LogGenerator {
 public:
  // Where the decoder's assertion failures are reported.
  static constexpr const char* kSourceFile = "LogGenerator/GSM/GSMLogGenerator";
  static constexpr int kUnknownObjectLine = 78;
  static constexpr int kDeserializeLine = 90;

  // Raises an AssertionFailure when the data is not a property list or holds
  // anything but dictionaries, arrays and strings.
  void updateState(const Dictionary& state, std::span<const std::uint8_t> data) override;
  Value generateLogUsingState(const Dictionary& state) override;
  // {"SetState": "Streaming"}
  Dictionary getStartCommand() override;
  // A new array holding the entries of the state's history.
  Value getSaveContentsFromState(const Dictionary& state) override;

  // The single value of a one-entry dictionary; null for anything else.
  static Value canCollapse(const Value& object);
  static Value processObject(const Value& object);

  static std::unique_ptr<LogGenerator> generator();
};

}  // namespace corvane
