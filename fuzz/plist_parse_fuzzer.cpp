// Property-list reading: any bytes give a value or an error, never a crash; a
// value read can always be written again in both forms and read back equal.

#include <cstdint>
#include <cstdlib>

#include "platform/PropertyList.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace corvane;
  std::string error;
  auto value = plist::parse(std::span(data, size), &error);
  if (!value) {
    if (error.empty()) std::abort();  // every failure says why
    return 0;
  }
  for (auto format : {plist::Format::XML, plist::Format::Binary}) {
    auto written = plist::serialize(*value, format);
    if (!written) continue;  // e.g. a date the writer cannot represent
    auto again = plist::parse(*written);
    if (!again) std::abort();
  }
  return 0;
}
