#include "platform/ResourceLocator.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <system_error>

namespace corvane::resources {

namespace fs = std::filesystem;

namespace {

std::optional<fs::path> executablePath() {
  std::error_code ec;
  fs::path p = fs::read_symlink("/proc/self/exe", ec);
  if (ec) return std::nullopt;
  return p;
}

bool isInside(const fs::path& path, const fs::path& directory) {
  const auto rel = path.lexically_relative(directory);
  return !rel.empty() && *rel.begin() != "..";
}

bool isDirectory(const fs::path& p) {
  std::error_code ec;
  return fs::is_directory(p, ec);
}

std::string lowered(std::string s) {
  std::transform(s.begin(), s.end(), s.begin(), [](unsigned char c) {
    return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : static_cast<char>(c);
  });
  return s;
}

}  // namespace

std::optional<std::string> resourceDirectory() {
  if (const char* env = std::getenv("CORVANE_RESOURCE_DIR"); env && *env) {
    if (isDirectory(env)) return std::string(env);
    return std::nullopt;
  }
  const auto exe = executablePath();
  std::vector<fs::path> candidates;
  if (exe && isInside(*exe, CORVANE_BUILD_DIR)) candidates.emplace_back(CORVANE_SOURCE_RESOURCE_DIR);
  if (exe) candidates.push_back(exe->parent_path().parent_path() / "share" / "corvane" / "resources");
  candidates.emplace_back(CORVANE_INSTALL_RESOURCE_DIR);
  candidates.emplace_back(CORVANE_SOURCE_RESOURCE_DIR);
  for (const auto& c : candidates) {
    if (isDirectory(c)) return c.string();
  }
  return std::nullopt;
}

std::optional<std::string> pathForResource(std::string_view name, std::string_view type) {
  const auto dir = resourceDirectory();
  if (!dir || name.empty() || name.find('/') != std::string_view::npos) return std::nullopt;
  fs::path p = fs::path(*dir) / (std::string(name) + "." + std::string(type));
  std::error_code ec;
  if (!fs::is_regular_file(p, ec)) return std::nullopt;
  return p.string();
}

std::vector<std::string> pathsForResourcesOfType(std::string_view type) {
  std::vector<std::string> paths;
  const auto dir = resourceDirectory();
  if (!dir) return paths;
  const std::string extension = "." + std::string(type);
  std::error_code ec;
  for (fs::directory_iterator it(*dir, ec), end; !ec && it != end; it.increment(ec)) {
    std::error_code fileError;
    if (!it->is_regular_file(fileError)) continue;
    if (it->path().extension() != extension) continue;
    paths.push_back(it->path().string());
  }
  std::sort(paths.begin(), paths.end(), [](const std::string& a, const std::string& b) {
    const auto la = lowered(fs::path(a).filename().string());
    const auto lb = lowered(fs::path(b).filename().string());
    return la != lb ? la < lb : a < b;
  });
  return paths;
}

}  // namespace corvane::resources
