#include "LogGenerator/logcode/ClassIndex.h"

#include <cstdio>

#include "platform/Log.h"

namespace corvane {

namespace {
std::FILE* teardownStream = stdout;
}  // namespace

void ClassIndex::setTeardownStream(std::FILE* stream) { teardownStream = stream; }

void ClassIndex::printTeardownLine(const char* line) {
  std::FILE* out = teardownStream;
  if (!out) return;
  std::fputs(line, out);
  std::fputc('\n', out);
  std::fflush(out);
}

ClassIndex::ClassIndex(SectionTable sections) {
  sections_.reserve(sections.size());
  for (const SectionDescriptor& descriptor : sections) {
    sections_.push_back(Base::initWithDict(descriptor, classDict, codeDictionary));
  }
}

void ClassIndex::releaseSections() {
  for (auto& section : sections_) section.reset();
  sections_.clear();
}

ClassIndex::~ClassIndex() {
  printTeardownLine("Deallocing ClassIndex");
  classDict.clear();
  codeDictionary.clear();
}

Base* ClassIndex::getClass(std::string_view name) const {
  auto it = classDict.find(std::string(name));
  return it == classDict.end() ? nullptr : it->second.get();
}

const CodeDictionary::Subscribers* ClassIndex::getSubscribers(std::int32_t logCode) const {
  return codeDictionary.find(std::to_string(logCode));
}

void ClassIndex::status() const {
  // The class dictionary is a dictionary by construction here; the trace keeps
  // its two lines so that logs read the same on every platform.
  log::printf(log::kWarning, "Dictionary = %d", 1);
  log::printf(log::kWarning, "String = %d", 0);
}

std::vector<std::string> ClassIndex::getAllLogCodes() const { return codeDictionary.keys(); }

std::vector<std::string> ClassIndex::sectionNames() const {
  std::vector<std::string> names;
  names.reserve(classDict.size());
  for (const auto& entry : classDict) names.push_back(entry.first);
  return names;
}

}  // namespace corvane
