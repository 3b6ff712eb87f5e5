#pragma once

// The status line under every list screen: an activity indicator and a text.
// At launch the root shows "Connecting" with the indicator spinning; while the
// model is not connected every screen shows "Connecting..." spinning; once
// connected, the time of the last display update ("Updated 2026-11-24 at
// 08:00:00", local time) with the indicator stopped.

#include <string>

#include "platform/Value.h"

namespace corvane {

struct StatusState {
  std::string text;
  bool isLoading = true;
  friend bool operator==(const StatusState&, const StatusState&) = default;
};

inline constexpr const char* kLaunchingStatus = "Connecting";
inline constexpr const char* kConnectingStatus = "Connecting...";

class StatusLine {
 public:
  static StatusState launching() { return {kLaunchingStatus, true}; }

  // "Updated <local date> at <local time>".
  static std::string updateMessageAt(const Date& date);

  // What a screen shows now.
  StatusState current(bool connected) const;
  // After a display update: a connected model takes the update time `now`.
  void displayUpdated(bool connected, const Date& now);

  const std::string& updateMessage() const { return updateMessage_; }
  void setUpdateMessage(std::string message) { updateMessage_ = std::move(message); }

 private:
  std::string updateMessage_ = kConnectingStatus;
};

}  // namespace corvane
