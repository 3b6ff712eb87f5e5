#include "LogGenerator/utran/UTRANLogGenerator.h"

#include <algorithm>
#include <filesystem>

#include "LogGenerator/utran/UTRANClassIndex.h"
#include "platform/Log.h"
#include "platform/ResourceLocator.h"

namespace corvane {

namespace {

bool containsIgnoringCase(std::string_view text, std::string_view part) {
  auto lower = [](char c) { return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c; };
  auto it = std::search(text.begin(), text.end(), part.begin(), part.end(),
                        [&](char a, char b) { return lower(a) == lower(b); });
  return it != text.end();
}

}  // namespace

std::optional<std::string> UTRANLogGenerator::findTemplateName() {
  for (const std::string& path : resources::pathsForResourcesOfType("plist")) {
    if (containsIgnoringCase(path, "UTRAN")) return std::filesystem::path(path).stem().string();
  }
  return std::nullopt;
}

std::unique_ptr<LogGenerator> UTRANLogGenerator::generator() {
  auto name = findTemplateName();
  // Without a template the generator stays unconfigured: no index, no display.
  if (!name) return std::unique_ptr<LogGenerator>(new UTRANLogGenerator(Unconfigured{}));
  auto made = std::unique_ptr<LogGenerator>(
      new UTRANLogGenerator(Configuration{std::move(*name), std::make_unique<UTRANClassIndex>()}));
  log::printf(log::kError, "Created UTRANLogGenerator object");
  return made;
}

}  // namespace corvane
