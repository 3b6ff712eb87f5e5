#pragma once

// One technology's sections as data: a table with one row per section, in the
// order its class index makes them (the order in which sections that share a
// log code are called). The class index makes its sections from the table;
// the template check, the tests that walk every technology and the fuzz
// targets read the same table.
//
//   section<LTEServingCellInfo>("objLTEServingCellInfo", "Serving Cell Info",
//                               {cell_identity::kCode, antenna_info::kCode, kExtraCodeCellList}, kRows),

#include <array>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <memory>
#include <span>
#include <string_view>

namespace corvane {

class Base;

// What a section writes into: its container in the display template.
enum class SectionContainer : std::uint8_t {
  Rows,         // a dictionary of key/value rows
  List,         // an array of row dictionaries
  Placeholder,  // nothing: the section takes no packets; any container will do
};

// A section's log codes, extra codes as 0xFF0000 + n, in subscription order.
class LogCodes {
 public:
  static constexpr std::size_t kCapacity = 8;
  constexpr LogCodes() = default;
  constexpr LogCodes(std::initializer_list<std::uint32_t> codes) {
    for (std::uint32_t code : codes) {
      if (count_ == kCapacity) throw "a section has at most LogCodes::kCapacity codes";
      codes_[count_++] = code;
    }
  }
  constexpr const std::uint32_t* begin() const { return codes_.data(); }
  constexpr const std::uint32_t* end() const { return codes_.data() + count_; }
  constexpr std::size_t size() const { return count_; }
  constexpr bool contains(std::uint32_t code) const {
    for (std::uint32_t own : *this) {
      if (own == code) return true;
    }
    return false;
  }

 private:
  std::array<std::uint32_t, kCapacity> codes_{};
  std::size_t count_ = 0;
};

struct SectionDescriptor {
  // The class index's member that owns the section.
  std::string_view field;
  // The display key: the section finds its container under this name in the
  // technology's template.
  std::string_view name;
  LogCodes codes;
  SectionContainer container;
  // Makes the section object.
  std::shared_ptr<Base> (*make)();
};

using SectionTable = std::span<const SectionDescriptor>;

template <class S>
std::shared_ptr<Base> makeSectionObject() {
  return std::make_shared<S>();
}

template <class S>
constexpr SectionDescriptor section(std::string_view field, std::string_view name, LogCodes codes,
                                    SectionContainer container) {
  return {field, name, codes, container, &makeSectionObject<S>};
}

// The row of section class S in a table, or nullptr.
template <class S>
const SectionDescriptor* findSection(SectionTable table) {
  for (const SectionDescriptor& row : table) {
    if (row.make == &makeSectionObject<S>) return &row;
  }
  return nullptr;
}

}  // namespace corvane
