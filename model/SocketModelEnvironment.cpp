#include "model/SocketModelEnvironment.h"

#include "platform/RuntimeDirectory.h"
#include "platform/Uuid.h"

namespace corvane {

std::unique_ptr<SocketModelEnvironment> SocketModelEnvironment::create(std::string& error) {
  const RuntimeDirectoryResult directory = prepareRuntimeDirectory();
  if (!directory) {
    error = directory.error;
    return nullptr;
  }
  return std::unique_ptr<SocketModelEnvironment>(new SocketModelEnvironment(directory.path));
}

SocketModelEnvironment::SocketModelEnvironment(std::filesystem::path runtimeDirectory)
    : ports_(std::move(runtimeDirectory)), telephony_(ports_) {}

CorvaneModelEnvironment SocketModelEnvironment::environment() {
  return CorvaneModelEnvironment{runLoop_, ports_, telephony_, &makeUUIDText};
}

}  // namespace corvane
