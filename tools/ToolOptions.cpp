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

namespace {

// Wants no line, so that none is made.
class NoSink final : public log::Sink {
 public:
  void write(int, std::string_view) override {}
  bool wants(int) const override { return false; }
};

}  // namespace

std::optional<LogDestination> logDestinationNamed(std::string_view name) {
  if (name == "syslog") return LogDestination::SystemLog;
  if (name == "stderr") return LogDestination::StandardError;
  return std::nullopt;
}

void routeLog(LogDestination destination) {
  switch (destination) {
    case LogDestination::Nowhere: log::setSink(std::make_shared<NoSink>()); break;
    case LogDestination::SystemLog: log::setSink(std::make_shared<log::SyslogSink>()); break;
    case LogDestination::StandardError: log::setSink(std::make_shared<log::StderrSink>()); break;
  }
}

void copyLogToStandardError() {
  log::setSink(std::make_shared<log::TeeSink>(
      std::vector<std::shared_ptr<log::Sink>>{log::sink(), std::make_shared<log::StderrSink>()}));
}

}  // namespace corvane::tools
