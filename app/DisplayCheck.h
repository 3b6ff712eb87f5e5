#pragma once

// Whether a Qt GUI can start here: a display to draw on (X11 or Wayland), or a
// platform plugin that needs none (QT_QPA_PLATFORM=offscreen and the like).
// Without one Qt would abort; the programs say so in one line instead.

#include <cstdlib>
#include <string>
#include <string_view>

namespace corvane {

inline bool environmentSet(const char* name) {
  const char* value = std::getenv(name);
  return value && *value;
}

// True when QT_QPA_PLATFORM names a plugin that can run here: one that needs
// no display, or one whose display is set. Platforms it does not know are
// left to Qt.
inline bool platformUsable(std::string_view platforms) {
  while (!platforms.empty()) {
    const std::size_t end = platforms.find(';');
    std::string_view entry = platforms.substr(0, end);
    platforms = end == std::string_view::npos ? std::string_view() : platforms.substr(end + 1);
    const std::string_view name = entry.substr(0, entry.find(':'));
    if (name.empty()) continue;
    if (name == "xcb") {
      if (environmentSet("DISPLAY")) return true;
    } else if (name.substr(0, 7) == "wayland") {
      if (environmentSet("WAYLAND_DISPLAY")) return true;
    } else {
      return true;
    }
  }
  return false;
}

inline bool displayAvailable() {
  const char* platform = std::getenv("QT_QPA_PLATFORM");
  if (platform && *platform) return platformUsable(platform);
  return environmentSet("DISPLAY") || environmentSet("WAYLAND_DISPLAY");
}

// The one line said when there is no display, after "<program>: ".
inline std::string noDisplayMessage(std::string_view program) {
  return "no display to show the screens on (DISPLAY and WAYLAND_DISPLAY are empty); run it under xvfb-run "
         "(xvfb-run -a " + std::string(program) + "), or use corvane-monitor for the display tree as text";
}

}  // namespace corvane
