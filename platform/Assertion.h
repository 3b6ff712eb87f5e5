#pragma once

// Assertion failures: a decoder that meets data it must never see raises one.
// Uncaught, it ends the program (see installTerminateHandler); tests and the
// offline tools catch it.

#include <stdexcept>
#include <string>

namespace corvane {

class AssertionFailure : public std::logic_error {
 public:
  AssertionFailure(std::string description, std::string file, int line);
  const std::string& description() const { return description_; }
  const std::string& file() const { return file_; }
  int line() const { return line_; }

 private:
  std::string description_;
  std::string file_;
  int line_;
};

[[noreturn]] void raiseAssertionFailure(std::string description, const char* file, int line);

// Makes an uncaught AssertionFailure print "*** Assertion failure in FILE:LINE: DESCRIPTION"
// to standard error before the program is aborted.
void installTerminateHandler();

}  // namespace corvane
