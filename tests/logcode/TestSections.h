#pragma once

// A section that records what it is given, for framework tests.

#include <string>
#include <utility>
#include <vector>

#include "LogGenerator/logcode/Base.h"
#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane::test {

struct Delivery {
  std::string section;
  std::uint32_t code;
  std::size_t size;
  std::uint8_t firstByte;
};

class RecordingSection : public Base {
 public:
  RecordingSection(std::string name, std::vector<std::uint32_t> codes, std::vector<Delivery>* journal)
      : name_(std::move(name)), codes_(std::move(codes)), journal_(journal) {}

  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override {
    if (journal_) journal_->push_back({name_, logCode, data.size(), data.empty() ? std::uint8_t{0} : data[0]});
    setRow("Last Code", Value(std::to_string(logCode)));
  }
  std::string getSectionName() const override { return name_; }
  std::vector<std::uint32_t> getLogCodeArray() const override { return codes_; }

 private:
  std::string name_;
  std::vector<std::uint32_t> codes_;
  std::vector<Delivery>* journal_;
};

// An index of recording sections, made in the order given.
class RecordingIndex : public ClassIndex {
 public:
  RecordingIndex(std::vector<std::pair<std::string, std::vector<std::uint32_t>>> sections,
                 std::vector<Delivery>* journal) {
    for (auto& [name, codes] : sections) {
      made.push_back(Base::initWithDict<RecordingSection>(classDict, codeDictionary, name, codes, journal));
    }
  }
  std::vector<std::shared_ptr<RecordingSection>> made;
};

}  // namespace corvane::test
