#pragma once

// One section made and registered as its technology's class index makes it,
// from its row of the table, with a container of its own, and readers of what
// it wrote.

#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

#include "LogGenerator/logcode/Base.h"
#include "platform/Log.h"
#include "support/Packets.h"

namespace corvane::test {

// A section made from its row of the table, registered in the two dictionaries.
template <class Section>
std::shared_ptr<Section> makeSection(SectionTable table, ClassDictionary& classDict, CodeDictionary& codeDict) {
  return std::static_pointer_cast<Section>(Base::initWithDict(*findSection<Section>(table), classDict, codeDict));
}

template <class Section, SectionTable (*Sections)()>
class SectionTest : public ::testing::Test {
 protected:
  SectionTest() : section(makeSection<Section>(Sections(), classDict, codeDict)) {}

  // Gives the section a dictionary of rows (as the display template does).
  Dictionary attachRows() {
    Dictionary rows;
    section->updateSectionRef(Value(rows));
    return rows;
  }
  // Gives the section an array of row dictionaries.
  Array attachList() {
    Array list;
    section->updateSectionRef(Value(list));
    return list;
  }
  void feed(const Bytes& packet, std::uint32_t code) { section->updateWithData(packet, code); }

  ClassDictionary classDict;
  CodeDictionary codeDict;
  std::shared_ptr<Section> section;
};

// The text of a row, or "<none>" when the row is missing or not a string.
inline std::string rowText(const Dictionary& rows, std::string_view key) {
  const Value* v = rows.find(key);
  const std::string* s = v ? v->asString() : nullptr;
  return s ? *s : "<none>";
}

inline Dictionary rowAt(const Array& list, std::size_t i) { return *list.at(i).asDictionary(); }

inline std::vector<std::string> keysOf(const Dictionary& rows) {
  std::vector<std::string> keys;
  for (const auto& entry : rows.entries()) keys.push_back(entry.first);
  return keys;
}

inline std::vector<log::Line> warnings(std::initializer_list<const char*> texts) {
  std::vector<log::Line> lines;
  for (const char* t : texts) lines.push_back({log::kWarning, t});
  return lines;
}

}  // namespace corvane::test
