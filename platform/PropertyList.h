#pragma once

// Property lists in XML and binary form, read into and written from the value
// model. Reading detects the form from the data. Malformed data never crashes:
// it yields an error that says what is wrong.

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>

#include "platform/Value.h"

namespace corvane::plist {

enum class Format { XML, Binary };

class PropertyListError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// Containers nested deeper than this are refused when reading and writing.
inline constexpr int kMaximumNesting = 512;

// Parses XML or binary property-list data. On failure returns nothing and, when
// `error` is given, stores a one-line reason in it.
std::optional<Value> parse(std::span<const std::uint8_t> data, std::string* error = nullptr);
// As parse, but throws PropertyListError on failure.
Value parseOrThrow(std::span<const std::uint8_t> data);

// Serialises a value. Fails for a null value anywhere in it, and for nesting
// beyond kMaximumNesting.
std::optional<Bytes> serialize(const Value& value, Format format, std::string* error = nullptr);
Bytes serializeOrThrow(const Value& value, Format format);

// True when the data starts the way an XML or binary property list starts.
bool looksLikePropertyList(std::span<const std::uint8_t> data);
bool isBinary(std::span<const std::uint8_t> data);

}  // namespace corvane::plist
