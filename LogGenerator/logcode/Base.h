#pragma once

// The section contract of the log-code technologies. A section is one titled
// group of rows on the screen ("RRC Info", "Serving Cell Info"): it names the
// log codes it wants, registers itself with its technology's class index when it
// is made, is handed the container that stands for it in the display, and
// writes decoded values into that container whenever a packet with one of its
// codes arrives.

#include <cstddef>
#include <cstdint>
#include <exception>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <variant>
#include <vector>

#include "LogGenerator/logcode/PacketView.h"
#include "LogGenerator/logcode/SectionTable.h"
#include "LogGenerator/records/Field.h"
#include "platform/Value.h"

namespace corvane {

class Base;

// Thrown by the bounded list accessors for an entry at or beyond the count the
// packet itself gives. Nothing catches it: asking for such an entry is a
// programming error of the section.
class ArrayOutOfBoundsException : public std::exception {};

// Entries of a list in a packet: a count the packet gives, then fixed-size
// entries from a first offset.
class BoundedList {
 public:
  BoundedList(std::size_t count, std::size_t firstOffset, std::size_t stride)
      : count_(count), firstOffset_(firstOffset), stride_(stride) {}
  BoundedList(std::size_t count, records::EntryList entries)
      : BoundedList(count, entries.first, entries.entrySize) {}
  std::size_t count() const { return count_; }
  // The absolute offset of entry i; throws ArrayOutOfBoundsException when i >= count.
  std::size_t entryOffset(std::size_t i) const {
    if (i >= count_) throw ArrayOutOfBoundsException();
    return firstOffset_ + stride_ * i;
  }

 private:
  std::size_t count_;
  std::size_t firstOffset_;
  std::size_t stride_;
};

// Section name → section. A later section with the same name replaces the
// earlier one here (the earlier one stays subscribed to its codes).
using ClassDictionary = std::unordered_map<std::string, std::shared_ptr<Base>>;

// Log code as a decimal string → the sections subscribed to it, in the order in
// which they subscribed. Codes keep the order in which they were first entered.
class CodeDictionary {
 public:
  using Subscribers = std::vector<std::shared_ptr<Base>>;

  const Subscribers* find(const std::string& code) const;
  // The subscriber array of the code, made empty when the code is new.
  Subscribers& subscribersFor(const std::string& code);
  // Every code, in the order of first entry.
  std::vector<std::string> keys() const;
  std::size_t size() const { return entries_.size(); }
  void clear();

 private:
  std::vector<std::pair<std::string, Subscribers>> entries_;
  std::unordered_map<std::string, std::size_t> index_;
};

class Base : public std::enable_shared_from_this<Base> {
 public:
  Base() = default;
  virtual ~Base() = default;
  Base(const Base&) = delete;
  Base& operator=(const Base&) = delete;

  // Makes the section a table row describes and registers it: in the class
  // dictionary under its name, and in the code dictionary for each of its codes.
  static std::shared_ptr<Base> initWithDict(const SectionDescriptor& descriptor, ClassDictionary& classDict,
                                            CodeDictionary& codeDict);
  // The same for a section of class S that names itself (it overrides
  // getSectionName and getLogCodeArray).
  template <class S, class... Args>
  static std::shared_ptr<S> initWithDict(ClassDictionary& classDict, CodeDictionary& codeDict, Args&&... args) {
    auto section = std::make_shared<S>(std::forward<Args>(args)...);
    classDict[section->getSectionName()] = section;
    section->updateLogCodeDict(codeDict);
    return section;
  }

  // Points the section at its container in the current display (a dictionary
  // of rows or an array of row dictionaries) and traces the section name. The
  // section does not keep the container alive.
  void updateSectionRef(const Value& container);

  // One packet (prefix removed, header included) with its effective log code.
  virtual void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) = 0;
  // The display key of the section: its table row's name. A section made
  // without a table row must override it; not doing so is a programming error
  // that ends the process.
  virtual std::string getSectionName() const;
  // The section's log codes, extra codes as 0xFF0000 + n: its table row's, or
  // the override's, as for the name.
  virtual std::vector<std::uint32_t> getLogCodeArray() const;

  // Subscribes the section to each of its codes (twice if listed twice).
  void updateLogCodeDict(CodeDictionary& codeDict);

  // List changes are made whole under the array lock, so that the display
  // builder never sees a half-filled list.
  static void clearElementsInArray(const Array& array);
  // Empties target, then appends every element of source. Given one array as
  // both arguments, the array ends up empty.
  static void replaceArray(const Array& target, const Array& source);

  // Linear Ec/No (units of 2^-19, 524288 = 0 dB) to whole decibels.
  static std::int16_t lookUpECNO(std::uint32_t value);

  // The section's containers while the display holds them; nothing before the
  // first display build, after the display is gone, or when the container is
  // of the other kind.
  std::optional<Dictionary> sectionDictionary() const;
  std::optional<Array> sectionArray() const;

 protected:
  // Sets a row of a dictionary section; nothing happens without a container.
  void setRow(std::string_view key, Value value) const;
  void removeRow(std::string_view key) const;
  // "Received an unknown log message: %d" at level 3, the code as signed decimal.
  static void logUnknownCode(std::uint32_t logCode);
  // The entry of a section with one code: traces the section at level 4, logs a
  // foreign code, and gives the packet when the code is the section's own and
  // the packet holds at least minimumLength bytes (a shorter one is dropped
  // without a message).
  static std::optional<PacketView> acceptPacket(std::string_view trace, std::span<const std::uint8_t> data,
                                                std::uint32_t logCode, std::uint32_t ownCode,
                                                std::size_t minimumLength);

 private:
  std::variant<std::monostate, Dictionary::Weak, Array::Weak> sectionRef;
  // The table row the section was made from, if any.
  const SectionDescriptor* descriptor_ = nullptr;
};

}  // namespace corvane
