#pragma once

// The registry of one technology's sections: it owns them, finds a section by
// its display name for the template processor, names the subscribers of a log
// code for the packet dispatcher, and lists every code for the start command.
// A technology's index makes its sections from the technology's table
// (SectionTable.h), in table order; from then on the registries do not change.

#include <cstdint>
#include <cstdio>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ClassIndex {
 public:
  // An index without sections.
  ClassIndex() = default;
  // An index of the sections of a table, made in table order.
  explicit ClassIndex(SectionTable sections);
  // Prints "Deallocing ClassIndex" on standard output.
  virtual ~ClassIndex();
  ClassIndex(const ClassIndex&) = delete;
  ClassIndex& operator=(const ClassIndex&) = delete;

  Base* getClass(std::string_view name) const;
  // The sections subscribed to the code (its decimal string), or nullptr.
  const CodeDictionary::Subscribers* getSubscribers(std::int32_t logCode) const;
  // Logs at level 4 whether the class dictionary is a dictionary and whether it is a string.
  void status() const;
  // Every subscribed code as a decimal string, in the order of first subscription.
  std::vector<std::string> getAllLogCodes() const;
  // Teardown lines ("Deallocing ClassIndex" ...) go to standard output; a tool
  // whose standard output carries a document sends them elsewhere, or nowhere
  // (nullptr).
  static void setTeardownStream(std::FILE* stream);
  static void printTeardownLine(const char* line);

  // The names of the registered sections (order unspecified).
  std::vector<std::string> sectionNames() const;

 protected:
  // Releases the index's own references to its sections, in table order (the
  // dictionaries keep theirs until the index's own teardown).
  void releaseSections();

  ClassDictionary classDict;
  CodeDictionary codeDictionary;

 private:
  // One owning reference per table row, in table order.
  std::vector<std::shared_ptr<Base>> sections_;
};

}  // namespace corvane
