#pragma once

// Small builders that keep test data readable: D({{"a", S("x")}}), A({S("x")}).

#include <initializer_list>
#include <string>
#include <utility>

#include "platform/PropertyList.h"
#include "platform/Value.h"

namespace corvane::test {

inline Value S(std::string s) { return Value(std::move(s)); }
inline Value I(std::int64_t i) { return Value::integer(i); }

inline Dictionary Dict(std::initializer_list<std::pair<std::string, Value>> entries) {
  Dictionary d;
  for (const auto& [k, v] : entries) d.set(k, v);
  return d;
}
inline Value D(std::initializer_list<std::pair<std::string, Value>> entries) { return Value(Dict(entries)); }
inline Value A(std::initializer_list<Value> elements) { return Value(Array(std::vector<Value>(elements))); }

inline Bytes xmlBytes(const Value& v) { return plist::serializeOrThrow(v, plist::Format::XML); }
inline Bytes binaryBytes(const Value& v) { return plist::serializeOrThrow(v, plist::Format::Binary); }
inline Bytes bytesOf(std::string_view s) { return Bytes(s.begin(), s.end()); }

}  // namespace corvane::test
