#include "LogGenerator/logcode/TechnologyGenerators.h"

#include <algorithm>
#include <filesystem>

#include "LogGenerator/logcode/LTEClassIndex.h"
#include "LogGenerator/logcode/QND_GSMClassIndex.h"
#include "LogGenerator/logcode/UTRANClassIndex.h"
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

// --- GSM/UMTS ---

QNDLogGenerator2::Configuration QND_GSMLogGenerator::configuration() {
  log::printf(log::kError, "Creating QND_GSMLogGenerator object");
  return {"QND_GSM", std::make_unique<QND_GSMClassIndex>()};
}

QND_GSMLogGenerator::QND_GSMLogGenerator() : QNDLogGenerator2(configuration()) {}

QND_GSMLogGenerator::~QND_GSMLogGenerator() {
  log::printf(log::kWarning, "QND_GSMLogGenerator is destructed %s", log::pointerText(this).c_str());
}

std::unique_ptr<LogGenerator> QND_GSMLogGenerator::generator() { return std::make_unique<QND_GSMLogGenerator>(); }

// --- LTE ---

QNDLogGenerator2::Configuration LTELogGenerator::configuration() {
  log::printf(log::kError, "Creating LTELogGenerator object");
  return {"LTE", std::make_unique<LTEClassIndex>()};
}

LTELogGenerator::LTELogGenerator() : QNDLogGenerator2(configuration()) {}

LTELogGenerator::~LTELogGenerator() {
  log::printf(log::kWarning, "LTELogGenerator is destructed %s", log::pointerText(this).c_str());
}

std::unique_ptr<LogGenerator> LTELogGenerator::generator() { return std::make_unique<LTELogGenerator>(); }

// --- UTRAN ---

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
