#pragma once

// The registry of one technology's sections: it owns them, finds a section by
// its display name for the template processor, names the subscribers of a log
// code for the packet dispatcher, and lists every code for the start command.
// A technology subclass makes its sections in its constructor; from then on the
// registries do not change.

#include <cstdint>
#include <cstdio>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ClassIndex {
 public:
  ClassIndex() = default;
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
  // Makes a section of class S registered in this index.
  template <class S>
  std::shared_ptr<S> makeSection() {
    return Base::initWithDict<S>(classDict, codeDictionary);
  }

  ClassDictionary classDict;
  CodeDictionary codeDictionary;
};

}  // namespace corvane
