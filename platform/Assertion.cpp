#include "platform/Assertion.h"

#include <cstdio>
#include <cstdlib>
#include <exception>

namespace corvane {

AssertionFailure::AssertionFailure(std::string description, std::string file, int line)
    : std::logic_error(description), description_(std::move(description)), file_(std::move(file)), line_(line) {}

void raiseAssertionFailure(std::string description, const char* file, int line) {
  throw AssertionFailure(std::move(description), file, line);
}

namespace {
[[noreturn]] void onTerminate() {
  if (auto e = std::current_exception()) {
    try {
      std::rethrow_exception(e);
    } catch (const AssertionFailure& failure) {
      std::fprintf(stderr, "*** Assertion failure in %s:%d: %s\n", failure.file().c_str(), failure.line(),
                   failure.description().c_str());
    } catch (const std::exception& other) {
      std::fprintf(stderr, "*** Terminating due to uncaught exception: %s\n", other.what());
    } catch (...) {
      std::fprintf(stderr, "*** Terminating due to uncaught exception\n");
    }
  }
  std::abort();
}
}  // namespace

void installTerminateHandler() { std::set_terminate(onTerminate); }

}  // namespace corvane
