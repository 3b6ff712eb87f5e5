#pragma once

// The platform of a model that runs for real: the Qt run loop of the calling
// thread, named message ports over Unix-domain sockets in the private runtime
// directory, the client of corvane-telephonyd, and real UUIDs. The application
// and corvane-monitor both run their model on it.

#include <filesystem>
#include <memory>
#include <string>

#include "model/CorvaneModel.h"
#include "platform/QtRunLoop.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"

namespace corvane {

class SocketModelEnvironment {
 public:
  // Prepares the runtime directory. A QCoreApplication must exist. Returns
  // nullptr, and a one-line reason in `error`, when the directory is unusable.
  static std::unique_ptr<SocketModelEnvironment> create(std::string& error);

  SocketModelEnvironment(const SocketModelEnvironment&) = delete;
  SocketModelEnvironment& operator=(const SocketModelEnvironment&) = delete;

  // Valid for as long as this object lives; the model must go first.
  CorvaneModelEnvironment environment();
  RunLoop& runLoop() { return runLoop_; }
  SocketPortSystem& ports() { return ports_; }
  const std::filesystem::path& runtimeDirectory() const { return ports_.directory(); }

 private:
  explicit SocketModelEnvironment(std::filesystem::path runtimeDirectory);

  QtRunLoop runLoop_;
  SocketPortSystem ports_;
  SocketTelephonyClient telephony_;
};

}  // namespace corvane
