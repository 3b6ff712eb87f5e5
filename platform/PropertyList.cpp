#include "platform/PropertyList.h"

#include <plist/plist.h>

#include <QByteArray>
#include <QString>

#include <cstdlib>
#include <cstring>
#include <limits>
#include <memory>
#include <string_view>

namespace corvane::plist {

namespace {

// The library counts dates in seconds from 2001-01-01 00:00:00 UTC.
constexpr std::int64_t kReferenceDateOffsetSeconds = 978307200;

struct NodeDeleter {
  void operator()(void* node) const { plist_free(static_cast<plist_t>(node)); }
};
using NodePtr = std::unique_ptr<void, NodeDeleter>;

struct MallocDeleter {
  void operator()(char* p) const { std::free(p); }
};
using MallocString = std::unique_ptr<char, MallocDeleter>;

void setError(std::string* error, std::string text) {
  if (error) *error = std::move(text);
}

bool toValue(plist_t node, int depth, Value& out, std::string& error) {
  if (depth > kMaximumNesting) {
    error = "containers nested more than " + std::to_string(kMaximumNesting) + " deep";
    return false;
  }
  switch (plist_get_node_type(node)) {
    case PLIST_BOOLEAN: {
      std::uint8_t b = 0;
      plist_get_bool_val(node, &b);
      out = Value::boolean(b != 0);
      return true;
    }
    case PLIST_UINT: {
      std::uint64_t u = 0;
      plist_get_uint_val(node, &u);
      out = Value::integer(static_cast<std::int64_t>(u));
      return true;
    }
    case PLIST_UID: {
      std::uint64_t u = 0;
      plist_get_uid_val(node, &u);
      out = Value::integer(static_cast<std::int64_t>(u));
      return true;
    }
    case PLIST_REAL: {
      double d = 0;
      plist_get_real_val(node, &d);
      out = Value::real(d);
      return true;
    }
    case PLIST_STRING: {
      // Read with its length: a string may hold NUL characters.
      std::uint64_t length = 0;
      const char* chars = plist_get_string_ptr(node, &length);
      out = Value(chars ? std::string(chars, length) : std::string());
      return true;
    }
    case PLIST_DATA: {
      std::uint64_t length = 0;
      const char* chars = plist_get_data_ptr(node, &length);
      const auto* bytes = reinterpret_cast<const std::uint8_t*>(chars);
      out = Value(bytes ? Bytes(bytes, bytes + length) : Bytes());
      return true;
    }
    case PLIST_DATE: {
      std::int32_t sec = 0, usec = 0;
      plist_get_date_val(node, &sec, &usec);
      const std::int64_t unixSeconds = std::int64_t{sec} + kReferenceDateOffsetSeconds;
      out = Value(Date{unixSeconds * 1000000 + usec});
      return true;
    }
    case PLIST_ARRAY: {
      std::vector<Value> elements;
      const std::uint32_t n = plist_array_get_size(node);
      elements.reserve(n);
      for (std::uint32_t i = 0; i < n; ++i) {
        Value element;
        if (!toValue(plist_array_get_item(node, i), depth + 1, element, error)) return false;
        elements.push_back(std::move(element));
      }
      out = Value(Array(std::move(elements)));
      return true;
    }
    case PLIST_DICT: {
      Dictionary dict;
      dict.reserve(plist_dict_get_size(node));
      plist_dict_iter it = nullptr;
      plist_dict_new_iter(node, &it);
      std::unique_ptr<void, decltype(&std::free)> iterGuard(it, &std::free);
      // A key holding a NUL character comes back cut at the NUL; the library
      // offers no way to read such a key whole.
      for (;;) {
        char* rawKey = nullptr;
        plist_t item = nullptr;
        plist_dict_next_item(node, it, &rawKey, &item);
        MallocString key(rawKey);
        if (!item) break;
        Value element;
        if (!toValue(item, depth + 1, element, error)) return false;
        dict.set(key ? key.get() : "", std::move(element));
      }
      out = Value(std::move(dict));
      return true;
    }
    default:
      error = "unsupported value type in property list";
      return false;
  }
}

// The library writes strings that are not valid UTF-8 in a form that it cannot
// read back, so such strings are refused when writing.
bool isValidUtf8(const std::string& s) {
  for (unsigned char c : s) {
    if (c >= 0x80) {
      // Valid UTF-8, and only that, survives decoding and encoding unchanged.
      const QByteArray bytes = QByteArray::fromRawData(s.data(), static_cast<qsizetype>(s.size()));
      return QString::fromUtf8(bytes).toUtf8() == bytes;
    }
  }
  return true;
}

constexpr const char* kInvalidUtf8 = "a string that is not valid UTF-8 cannot be written to a property list";

NodePtr toNode(const Value& value, int depth, std::string& error) {
  if (depth > kMaximumNesting) {
    error = "containers nested more than " + std::to_string(kMaximumNesting) + " deep";
    return nullptr;
  }
  switch (value.type()) {
    case Value::Type::Null:
      error = "a null value cannot be written to a property list";
      return nullptr;
    case Value::Type::String:
      if (!isValidUtf8(*value.asString())) {
        error = kInvalidUtf8;
        return nullptr;
      }
      return NodePtr(plist_new_string(value.asString()->c_str()));
    case Value::Type::Integer:
      return NodePtr(plist_new_uint(static_cast<std::uint64_t>(*value.asInteger())));
    case Value::Type::Real:
      return NodePtr(plist_new_real(*value.asReal()));
    case Value::Type::Boolean:
      return NodePtr(plist_new_bool(*value.asBoolean() ? 1 : 0));
    case Value::Type::Date: {
      const std::int64_t us = value.asDate()->microsecondsSince1970;
      std::int64_t sec = us / 1000000;
      std::int64_t usec = us % 1000000;
      if (usec < 0) {
        usec += 1000000;
        sec -= 1;
      }
      sec -= kReferenceDateOffsetSeconds;
      if (sec < std::numeric_limits<std::int32_t>::min() || sec > std::numeric_limits<std::int32_t>::max()) {
        error = "a date outside the years 1933 to 2069 cannot be written to a property list";
        return nullptr;
      }
      return NodePtr(plist_new_date(static_cast<std::int32_t>(sec), static_cast<std::int32_t>(usec)));
    }
    case Value::Type::Data: {
      const Bytes& b = *value.asData();
      return NodePtr(plist_new_data(reinterpret_cast<const char*>(b.data()), b.size()));
    }
    case Value::Type::Array: {
      NodePtr array(plist_new_array());
      for (const Value& v : value.asArray()->elements()) {
        NodePtr child = toNode(v, depth + 1, error);
        if (!child) return nullptr;
        plist_array_append_item(array.get(), child.release());
      }
      return array;
    }
    case Value::Type::Dictionary: {
      NodePtr dict(plist_new_dict());
      for (const auto& [key, v] : value.asDictionary()->entries()) {
        if (!isValidUtf8(key)) {
          error = kInvalidUtf8;
          return nullptr;
        }
        NodePtr child = toNode(v, depth + 1, error);
        if (!child) return nullptr;
        plist_dict_set_item(dict.get(), key.c_str(), child.release());
      }
      return dict;
    }
  }
  error = "unknown value type";
  return nullptr;
}

std::string_view skipLeadingSpace(std::string_view s) {
  if (s.substr(0, 3) == "\xEF\xBB\xBF") s.remove_prefix(3);
  while (!s.empty() && (s.front() == ' ' || s.front() == '\t' || s.front() == '\r' || s.front() == '\n')) s.remove_prefix(1);
  return s;
}

}  // namespace

bool isBinary(std::span<const std::uint8_t> data) {
  static constexpr char kMagic[] = "bplist00";
  return data.size() >= 8 && std::memcmp(data.data(), kMagic, 8) == 0;
}

bool looksLikePropertyList(std::span<const std::uint8_t> data) {
  if (isBinary(data)) return true;
  const std::string_view text(reinterpret_cast<const char*>(data.data()), data.size());
  const std::string_view s = skipLeadingSpace(text);
  return s.starts_with("<?xml") || s.starts_with("<plist") || s.starts_with("<!DOCTYPE plist");
}

// The library's binary reader accepts a string object that holds a NUL
// character, but a dictionary key made from one fails an assertion inside the
// library's own key accessor (the stored length counts past the NUL), which
// would end the program. So before a binary property list goes to the library,
// its string objects are looked at: one that holds a NUL refuses the whole
// list. (String values are cut at a NUL by the binary reader anyway.) Only the
// object table is walked, bounds-checked; anything malformed is left for the
// library to refuse.
bool binaryStringHoldsNul(std::span<const std::uint8_t> data) {
  constexpr std::size_t kHeaderSize = 8;
  constexpr std::size_t kTrailerSize = 32;
  if (data.size() < kHeaderSize + kTrailerSize) return false;
  auto bigEndian = [&](std::size_t at, std::size_t width, std::uint64_t& out) {
    if (width == 0 || width > 8 || at > data.size() || width > data.size() - at) return false;
    out = 0;
    for (std::size_t i = 0; i < width; ++i) out = (out << 8) | data[at + i];
    return true;
  };
  const std::size_t trailer = data.size() - kTrailerSize;
  const std::size_t offsetSize = data[trailer + 6];
  std::uint64_t objectCount = 0, tableOffset = 0;
  bigEndian(trailer + 8, 8, objectCount);
  bigEndian(trailer + 24, 8, tableOffset);
  if (offsetSize == 0 || offsetSize > 8 || tableOffset >= trailer || objectCount > (trailer - tableOffset) / offsetSize) {
    return false;
  }
  for (std::uint64_t i = 0; i < objectCount; ++i) {
    std::uint64_t at = 0;
    if (!bigEndian(static_cast<std::size_t>(tableOffset + i * offsetSize), offsetSize, at) || at >= trailer) continue;
    const std::uint8_t marker = data[at];
    const unsigned kind = marker >> 4;
    if (kind != 0x5 && kind != 0x6) continue;  // ASCII or UTF-16 string
    std::uint64_t length = marker & 0x0F;
    std::size_t body = static_cast<std::size_t>(at) + 1;
    if (length == 0x0F) {  // the length follows as an integer object
      if (body >= trailer || (data[body] >> 4) != 0x1) continue;
      const std::size_t width = std::size_t{1} << (data[body] & 0x0F);
      if (!bigEndian(body + 1, width, length)) continue;
      body += 1 + width;
    }
    const std::uint64_t unit = kind == 0x6 ? 2 : 1;
    if (body > trailer || length > (trailer - body) / unit) continue;
    for (std::uint64_t c = 0; c < length; ++c) {
      const std::size_t pos = body + static_cast<std::size_t>(c * unit);
      if (data[pos] == 0 && (unit == 1 || data[pos + 1] == 0)) return true;
    }
  }
  return false;
}

std::optional<Value> parse(std::span<const std::uint8_t> data, std::string* error) {
  if (data.empty()) {
    setError(error, "empty data is not a property list");
    return std::nullopt;
  }
  if (data.size() > std::numeric_limits<std::uint32_t>::max()) {
    setError(error, "property list larger than 4 GiB");
    return std::nullopt;
  }
  const bool binary = isBinary(data);
  if (!binary && !looksLikePropertyList(data)) {
    setError(error, "data is neither an XML nor a binary property list");
    return std::nullopt;
  }
  plist_t root = nullptr;
  const auto* chars = reinterpret_cast<const char*>(data.data());
  const auto length = static_cast<std::uint32_t>(data.size());
  if (binary) {
    if (binaryStringHoldsNul(data)) {
      setError(error, "binary property list with a NUL character inside a string");
      return std::nullopt;
    }
    plist_from_bin(chars, length, &root);
  } else {
    plist_from_xml(chars, length, &root);
  }
  NodePtr guard(root);
  if (!root) {
    setError(error, binary ? "malformed binary property list" : "malformed XML property list");
    return std::nullopt;
  }
  Value out;
  std::string reason;
  if (!toValue(root, 0, out, reason)) {
    setError(error, reason);
    return std::nullopt;
  }
  return out;
}

Value parseOrThrow(std::span<const std::uint8_t> data) {
  std::string error;
  auto v = parse(data, &error);
  if (!v) throw PropertyListError(error);
  return std::move(*v);
}

std::optional<Bytes> serialize(const Value& value, Format format, std::string* error) {
  std::string reason;
  NodePtr node = toNode(value, 0, reason);
  if (!node) {
    setError(error, reason);
    return std::nullopt;
  }
  char* out = nullptr;
  std::uint32_t length = 0;
  if (format == Format::XML) {
    plist_to_xml(node.get(), &out, &length);
  } else {
    plist_to_bin(node.get(), &out, &length);
  }
  MallocString guard(out);
  if (!out) {
    setError(error, "the property-list writer failed");
    return std::nullopt;
  }
  const auto* bytes = reinterpret_cast<const std::uint8_t*>(out);
  return Bytes(bytes, bytes + length);
}

Bytes serializeOrThrow(const Value& value, Format format) {
  std::string error;
  auto b = serialize(value, format, &error);
  if (!b) throw PropertyListError(error);
  return std::move(*b);
}

}  // namespace corvane::plist
