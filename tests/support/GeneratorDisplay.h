#pragma once

// A log-code technology's generator with its display built from the
// template, and readers of its sections: the sections as the technology runs
// them, reached through the generator's dispatch.

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/logcode/Base.h"
#include "platform/Log.h"

namespace corvane::test {

// The container of a section anywhere in the display.
inline const Value* findSection(const Value& node, std::string_view name) {
  if (const Dictionary* d = node.asDictionary()) {
    for (const auto& [key, value] : d->entries()) {
      if (key == name) return &value;
      if (const Value* found = findSection(value, name)) return found;
    }
  }
  return nullptr;
}

inline std::vector<std::string> sectionNames(const CodeDictionary::Subscribers* subscribers) {
  std::vector<std::string> names;
  if (subscribers) {
    for (const auto& s : *subscribers) names.push_back(s->getSectionName());
  }
  return names;
}

inline std::vector<std::string> warningTexts(const log::ScopedCapture& capture) {
  std::vector<std::string> texts;
  for (const auto& line : capture.lines()) {
    if (line.priority == log::kWarning) texts.push_back(line.text);
  }
  return texts;
}

template <class Generator>
class GeneratorDisplayTest : public ::testing::Test {
 protected:
  GeneratorDisplayTest() {
    log::ScopedCapture quiet;
    generator = std::make_unique<Generator>();
    generator->getDisplayFromState(state);
    display = state.get("Display");
  }

  std::string rowText(std::string_view section, std::string_view row) const {
    const Value* rows = findSection(display, section);
    const Value* v = rows && rows->asDictionary() ? rows->asDictionary()->find(row) : nullptr;
    return v && v->asString() ? *v->asString() : "<none>";
  }
  std::size_t listSize(std::string_view section) const {
    const Value* list = findSection(display, section);
    return list && list->asArray() ? list->asArray()->size() : 9999;
  }

  std::unique_ptr<Generator> generator;
  Dictionary state;
  Value display;
};

}  // namespace corvane::test
