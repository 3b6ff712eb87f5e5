#include "ToolOptions.h"

#include <memory>
#include <vector>

#include "platform/Log.h"

namespace corvane::tools {

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
