#pragma once

// The log-code technologies and their section tables, for whatever walks all
// of them: the template checks, the fuzz targets, `corvane-decode --sections`.

#include <span>
#include <string_view>

#include "LogGenerator/logcode/SectionTable.h"

namespace corvane {

struct LogCodeTechnology {
  std::string_view technology;    // the log channel's technology value
  std::string_view templateName;  // the display template the generator loads
  SectionTable (*sections)();
};

std::span<const LogCodeTechnology> logCodeTechnologies();

}  // namespace corvane
