#pragma once

// The generator of the UTRAN technology. It finds its display template by
// searching the resources for a property list whose name contains "UTRAN".

#include <memory>
#include <optional>
#include <string>

#include "LogGenerator/logcode/QNDLogGenerator2.h"

namespace corvane {

class UTRANLogGenerator final : public QNDLogGenerator2 {
 public:
  static std::unique_ptr<LogGenerator> generator();

  // The template name: the first "plist" resource, in listing order, whose
  // path contains "UTRAN" in any letter case; nothing when there is none.
  static std::optional<std::string> findTemplateName();

 private:
  using QNDLogGenerator2::QNDLogGenerator2;
};

}  // namespace corvane
