#pragma once

// Points the resource locator at a temporary directory for the life of the
// object, so a test decides which templates exist.

#include <cstdlib>
#include <optional>
#include <string>

#include "support/Process.h"
#include "support/Values.h"

namespace corvane::test {

class ScopedResourceDirectory {
 public:
  ScopedResourceDirectory() {
    if (const char* old = std::getenv("CORVANE_RESOURCE_DIR")) previous_ = old;
    ::setenv("CORVANE_RESOURCE_DIR", dir_.path().c_str(), 1);
  }
  ~ScopedResourceDirectory() {
    if (previous_) {
      ::setenv("CORVANE_RESOURCE_DIR", previous_->c_str(), 1);
    } else {
      ::unsetenv("CORVANE_RESOURCE_DIR");
    }
  }
  ScopedResourceDirectory(const ScopedResourceDirectory&) = delete;
  ScopedResourceDirectory& operator=(const ScopedResourceDirectory&) = delete;

  // Writes NAME.plist holding the value as an XML property list.
  std::string writeTemplate(const std::string& name, const Value& root) const {
    const Bytes xml = xmlBytes(root);
    return dir_.write(name + ".plist", std::string(xml.begin(), xml.end()));
  }
  const std::string& path() const { return dir_.path(); }

 private:
  TemporaryDirectory dir_;
  std::optional<std::string> previous_;
};

}  // namespace corvane::test
