#include "LogGenerator/logcode/TemplateResource.h"

#include <fstream>
#include <iterator>

#include "platform/PropertyList.h"
#include "platform/ResourceLocator.h"

namespace corvane {

std::optional<Dictionary> loadTemplateResource(std::string_view name) {
  const auto path = resources::pathForResource(name, "plist");
  if (!path) return std::nullopt;
  std::ifstream in(*path, std::ios::binary);
  if (!in) return std::nullopt;
  const Bytes contents((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  auto parsed = plist::parse(contents);
  if (!parsed || !parsed->isDictionary()) return std::nullopt;
  return *parsed->asDictionary();
}

}  // namespace corvane
