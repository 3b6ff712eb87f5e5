#pragma once

// The property-list value model: strings, integers, reals, booleans, dates,
// data, and the two containers. Dictionaries and arrays are shared mutable
// objects: copying a Dictionary or Array handle gives a second holder of the
// same container, and both see every change. Dictionaries keep insertion order.

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <variant>
#include <vector>

namespace corvane {

using Bytes = std::vector<std::uint8_t>;

class Value;

// A point in time with microsecond resolution, counted from 1970-01-01 00:00:00 UTC.
struct Date {
  std::int64_t microsecondsSince1970 = 0;
  friend bool operator==(const Date&, const Date&) = default;
};

// Containers are handles with reference semantics, like a shared pointer: the
// mutating operations are const because they change the shared container, not
// the handle.
class Dictionary {
  struct Storage;

 public:
  using Entry = std::pair<std::string, Value>;

  Dictionary();  // a new, empty dictionary

  std::size_t size() const;
  bool empty() const { return size() == 0; }

  // The value under the key, or nullptr when there is none.
  const Value* find(std::string_view key) const;
  Value* findMutable(std::string_view key) const;
  // The value under the key, or a null value when there is none.
  Value get(std::string_view key) const;
  bool contains(std::string_view key) const { return find(key) != nullptr; }

  // Replaces the value in place when the key exists, else appends the entry.
  void set(std::string_view key, Value value) const;
  // The same, for a writer that sets the same keys in the same order over and
  // over: `next` carries the position behind the key set last, where the next
  // key is tried before the dictionary is searched. Start it at 0.
  void set(std::string_view key, Value value, std::size_t& next) const;
  // Sets a string, written into the string already under the key when there
  // is one (no new string is made), with a position hint as above.
  void setString(std::string_view key, std::string_view text, std::size_t& next) const;
  bool remove(std::string_view key) const;
  void clear() const;
  void reserve(std::size_t count) const;

  // Entries in insertion order.
  const std::vector<Entry>& entries() const;

  // A new dictionary holding the same values (containers inside are shared).
  Dictionary shallowCopy() const;
  // A new dictionary in which every nested container is copied too.
  Dictionary deepCopy() const;

  bool isSameObject(const Dictionary& other) const { return storage_ == other.storage_; }
  const void* identity() const { return storage_.get(); }

  // A reference that does not keep the dictionary alive.
  class Weak {
   public:
    Weak() = default;
    explicit Weak(const Dictionary& d) : storage_(d.storage_) {}
    // The dictionary while some handle still holds it, else nothing.
    std::optional<Dictionary> lock() const;

   private:
    std::weak_ptr<Storage> storage_;
  };

 private:
  explicit Dictionary(std::shared_ptr<Storage> storage) : storage_(std::move(storage)) {}
  std::shared_ptr<Storage> storage_;
};

class Array {
  struct Storage;

 public:
  Array();  // a new, empty array
  explicit Array(std::vector<Value> elements);

  std::size_t size() const;
  bool empty() const { return size() == 0; }
  const Value& at(std::size_t index) const;  // throws std::out_of_range
  void append(Value value) const;
  void insert(std::size_t index, Value value) const;
  void removeAt(std::size_t index) const;
  void removeFirst(std::size_t count) const;  // removes min(count, size) leading elements
  void clear() const;

  const std::vector<Value>& elements() const;

  Array shallowCopy() const;
  Array deepCopy() const;

  bool isSameObject(const Array& other) const { return storage_ == other.storage_; }
  const void* identity() const { return storage_.get(); }

  // A reference that does not keep the array alive.
  class Weak {
   public:
    Weak() = default;
    explicit Weak(const Array& a) : storage_(a.storage_) {}
    // The array while some handle still holds it, else nothing.
    std::optional<Array> lock() const;

   private:
    std::weak_ptr<Storage> storage_;
  };

 private:
  explicit Array(std::shared_ptr<Storage> storage) : storage_(std::move(storage)) {}
  std::shared_ptr<Storage> storage_;
};

class Value {
 public:
  enum class Type { Null, String, Integer, Real, Boolean, Date, Data, Dictionary, Array };

  Value() = default;  // the null value: "nothing"
  Value(std::string s) : v_(std::move(s)) {}
  Value(std::string_view s) : v_(std::string(s)) {}
  Value(const char* s) : v_(std::string(s)) {}
  Value(Dictionary d) : v_(std::move(d)) {}
  Value(Array a) : v_(std::move(a)) {}
  Value(corvane::Date d) : v_(d) {}
  Value(Bytes b) : v_(std::move(b)) {}

  // Numbers and booleans are made explicitly, so that a literal never picks
  // the wrong kind by accident.
  static Value integer(std::int64_t i) { Value v; v.v_ = i; return v; }
  static Value real(double d) { Value v; v.v_ = d; return v; }
  static Value boolean(bool b) { Value v; v.v_ = b; return v; }

  Type type() const { return static_cast<Type>(v_.index()); }
  bool isNull() const { return type() == Type::Null; }
  bool isString() const { return type() == Type::String; }
  bool isDictionary() const { return type() == Type::Dictionary; }
  bool isArray() const { return type() == Type::Array; }

  // Each returns nullptr when the value is of another type. The pointer points
  // into this value, so these are not offered on temporaries, where it would
  // dangle: keep the value (or find() it in its container) first.
  const std::string* asString() const& { return std::get_if<std::string>(&v_); }
  const std::int64_t* asInteger() const& { return std::get_if<std::int64_t>(&v_); }
  const double* asReal() const& { return std::get_if<double>(&v_); }
  const bool* asBoolean() const& { return std::get_if<bool>(&v_); }
  const corvane::Date* asDate() const& { return std::get_if<corvane::Date>(&v_); }
  const Bytes* asData() const& { return std::get_if<Bytes>(&v_); }
  const Dictionary* asDictionary() const& { return std::get_if<Dictionary>(&v_); }
  const Array* asArray() const& { return std::get_if<Array>(&v_); }
  const std::string* asString() const&& = delete;
  const std::int64_t* asInteger() const&& = delete;
  const double* asReal() const&& = delete;
  const bool* asBoolean() const&& = delete;
  const corvane::Date* asDate() const&& = delete;
  const Bytes* asData() const&& = delete;
  const Dictionary* asDictionary() const&& = delete;
  const Array* asArray() const&& = delete;

  // The class name shown in diagnostics: "String", "Integer", ...
  const char* typeName() const { return typeName(type()); }
  static const char* typeName(Type type);

  // A copy in which nested containers are copied too (no sharing).
  Value deepCopy() const;

  // Structural equality: containers compare by contents, in order.
  friend bool operator==(const Value& a, const Value& b);
  // Writes strings in place (Dictionary::setString).
  friend class Dictionary;

 private:
  std::variant<std::monostate, std::string, std::int64_t, double, bool, corvane::Date, Bytes, Dictionary, Array> v_;
};

bool operator==(const Dictionary& a, const Dictionary& b);
bool operator==(const Array& a, const Array& b);

}  // namespace corvane
