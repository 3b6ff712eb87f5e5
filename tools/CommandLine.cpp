#include "CommandLine.h"

#include <cstdio>
#include <memory>
#include <vector>

#include "platform/Log.h"

namespace corvane::tools {

int usageError(const char* program, const char* usage, const std::string& message) {
  std::fprintf(stderr, "%s: %s\n%s", program, message.c_str(), usage);
  return kExitUsage;
}

std::optional<TreeFormat> treeFormatNamed(std::string_view name) {
  if (name == "text") return TreeFormat::Text;
  if (name == "json") return TreeFormat::Json;
  return std::nullopt;
}

void copyLogToStandardError() {
  log::setSink(std::make_shared<log::TeeSink>(
      std::vector<std::shared_ptr<log::Sink>>{log::sink(), std::make_shared<log::StderrSink>()}));
}

}  // namespace corvane::tools
