#pragma once

// The decoder contract. A generator folds the packets of one radio technology
// into the model's state dictionary and turns that state into a display object
// (dictionaries, arrays and strings). The base class also chooses the generator
// for a technology and keeps the bounded history of snapshots in the state.

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>

#include "platform/Value.h"

namespace corvane {

// State-dictionary keys shared by every generator.
inline constexpr std::string_view kStateDisplayState = "DisplayState";
inline constexpr std::string_view kStateDisplay = "Display";
inline constexpr std::string_view kStateExtraInfo = "ExtraInfo";
inline constexpr std::string_view kStateHistory = "History";
inline constexpr std::string_view kSnapshotDate = "Date";
inline constexpr std::string_view kSnapshotDescription = "Description";

// The history keeps at most this many snapshots, oldest first.
inline constexpr std::size_t kHistoryLimit = 5;

class LogGenerator {
 public:
  // Writes the trace "Creating Log object: %p".
  LogGenerator();
  virtual ~LogGenerator() = default;
  LogGenerator(const LogGenerator&) = delete;
  LogGenerator& operator=(const LogGenerator&) = delete;

  // Folds one packet, exactly as it arrived, into the state.
  virtual void updateState(const Dictionary& state, std::span<const std::uint8_t> data) = 0;
  // The display object of the state; records a history snapshot too.
  virtual Value generateLogUsingState(const Dictionary& state) = 0;
  // The command that makes the telephony service start streaming for this generator.
  virtual Dictionary getStartCommand() = 0;
  // What a snapshot file holds.
  virtual Value getSaveContentsFromState(const Dictionary& state) = 0;

  // Appends a snapshot of "DisplayState", "Display" and "ExtraInfo" to the
  // state's "History", keeping the newest kHistoryLimit.
  static void updateHistoryInState(const Dictionary& state);

  // The generator for a technology value, or nullptr for an unknown one.
  static std::unique_ptr<LogGenerator> generatorFromTechnology(std::string_view technology);
};

}  // namespace corvane
