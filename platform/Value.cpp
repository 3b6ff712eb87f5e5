#include "platform/Value.h"

#include <stdexcept>

namespace corvane {

namespace {
struct KeyHash {
  using is_transparent = void;
  std::size_t operator()(std::string_view s) const noexcept { return std::hash<std::string_view>{}(s); }
};
}  // namespace

// Small dictionaries, the common case, are searched linearly; a hash index is
// built only once a dictionary grows past kIndexThreshold entries.
constexpr std::size_t kIndexThreshold = 12;

struct Dictionary::Storage {
  using Index = std::unordered_map<std::string, std::size_t, KeyHash, std::equal_to<>>;

  std::vector<Entry> entries_;
  std::unique_ptr<Index> index_;

  Storage() = default;
  Storage(const Storage& other) : entries_(other.entries_) { rebuildIndex(); }

  std::ptrdiff_t position(std::string_view key) const {
    if (index_) {
      auto it = index_->find(key);
      return it == index_->end() ? -1 : static_cast<std::ptrdiff_t>(it->second);
    }
    for (std::size_t i = 0; i < entries_.size(); ++i) {
      if (entries_[i].first == key) return static_cast<std::ptrdiff_t>(i);
    }
    return -1;
  }

  // The value under the key, tried first at `next`; on success `next` moves
  // behind it.
  Value* findFrom(std::string_view key, std::size_t& next) {
    std::ptrdiff_t at = -1;
    if (next < entries_.size() && entries_[next].first == key) {
      at = static_cast<std::ptrdiff_t>(next);
    } else {
      at = position(key);
    }
    if (at < 0) return nullptr;
    next = static_cast<std::size_t>(at) + 1;
    return &entries_[static_cast<std::size_t>(at)].second;
  }

  void append(std::string_view key, Value value) {
    entries_.emplace_back(std::string(key), std::move(value));
    if (index_) {
      index_->emplace(entries_.back().first, entries_.size() - 1);
    } else if (entries_.size() > kIndexThreshold) {
      rebuildIndex();
    }
  }

  void rebuildIndex() {
    if (entries_.size() <= kIndexThreshold) {
      index_.reset();
      return;
    }
    index_ = std::make_unique<Index>();
    index_->reserve(entries_.size());
    for (std::size_t i = 0; i < entries_.size(); ++i) index_->emplace(entries_[i].first, i);
  }
};

struct Array::Storage {
  std::vector<Value> elements;
};

// --- Dictionary ---------------------------------------------------------------

Dictionary::Dictionary() : storage_(std::make_shared<Storage>()) {}

std::optional<Dictionary> Dictionary::Weak::lock() const {
  if (auto storage = storage_.lock()) return Dictionary(std::move(storage));
  return std::nullopt;
}

std::size_t Dictionary::size() const { return storage_->entries_.size(); }

const Value* Dictionary::find(std::string_view key) const {
  const std::ptrdiff_t pos = storage_->position(key);
  return pos < 0 ? nullptr : &storage_->entries_[static_cast<std::size_t>(pos)].second;
}

Value* Dictionary::findMutable(std::string_view key) const {
  const std::ptrdiff_t pos = storage_->position(key);
  return pos < 0 ? nullptr : &storage_->entries_[static_cast<std::size_t>(pos)].second;
}

Value Dictionary::get(std::string_view key) const {
  const Value* v = find(key);
  return v ? *v : Value();
}

void Dictionary::set(std::string_view key, Value value) const {
  if (Value* existing = findMutable(key)) {
    *existing = std::move(value);
    return;
  }
  storage_->append(key, std::move(value));
}

void Dictionary::set(std::string_view key, Value value, std::size_t& next) const {
  if (Value* existing = storage_->findFrom(key, next)) {
    *existing = std::move(value);
    return;
  }
  storage_->append(key, std::move(value));
  next = storage_->entries_.size();
}

void Dictionary::setString(std::string_view key, std::string_view text, std::size_t& next) const {
  Value* existing = storage_->findFrom(key, next);
  if (!existing) {
    storage_->append(key, Value(text));
    next = storage_->entries_.size();
  } else if (auto* string = std::get_if<std::string>(&existing->v_)) {
    // A text of the same length, as a value rewritten on every update mostly
    // is, and a first text into an empty string take the short ways.
    if (string->size() == text.size()) {
      text.copy(string->data(), text.size());
    } else if (string->empty()) {
      string->append(text);
    } else {
      string->assign(text);
    }
  } else {
    *existing = Value(text);
  }
}

bool Dictionary::remove(std::string_view key) const {
  const std::ptrdiff_t pos = storage_->position(key);
  if (pos < 0) return false;
  storage_->entries_.erase(storage_->entries_.begin() + pos);
  storage_->rebuildIndex();
  return true;
}

void Dictionary::clear() const {
  storage_->entries_.clear();
  storage_->index_.reset();
}

void Dictionary::reserve(std::size_t count) const { storage_->entries_.reserve(count); }

const std::vector<Dictionary::Entry>& Dictionary::entries() const { return storage_->entries_; }

Dictionary Dictionary::shallowCopy() const { return Dictionary(std::make_shared<Storage>(*storage_)); }

Dictionary Dictionary::deepCopy() const {
  Dictionary copy;
  copy.reserve(size());
  for (const auto& [key, value] : storage_->entries_) copy.set(key, value.deepCopy());
  return copy;
}

bool operator==(const Dictionary& a, const Dictionary& b) {
  if (a.isSameObject(b)) return true;
  return a.entries() == b.entries();
}

// --- Array --------------------------------------------------------------------

Array::Array() : storage_(std::make_shared<Storage>()) {}

std::optional<Array> Array::Weak::lock() const {
  if (auto storage = storage_.lock()) return Array(std::move(storage));
  return std::nullopt;
}

Array::Array(std::vector<Value> elements) : storage_(std::make_shared<Storage>()) {
  storage_->elements = std::move(elements);
}

std::size_t Array::size() const { return storage_->elements.size(); }

const Value& Array::at(std::size_t index) const { return storage_->elements.at(index); }

void Array::append(Value value) const { storage_->elements.push_back(std::move(value)); }

void Array::insert(std::size_t index, Value value) const {
  if (index > size()) throw std::out_of_range("Array::insert: index beyond the end");
  storage_->elements.insert(storage_->elements.begin() + static_cast<std::ptrdiff_t>(index), std::move(value));
}

void Array::removeAt(std::size_t index) const {
  if (index >= size()) throw std::out_of_range("Array::removeAt: index beyond the end");
  storage_->elements.erase(storage_->elements.begin() + static_cast<std::ptrdiff_t>(index));
}

void Array::removeFirst(std::size_t count) const {
  auto& e = storage_->elements;
  e.erase(e.begin(), e.begin() + static_cast<std::ptrdiff_t>(std::min(count, e.size())));
}

void Array::clear() const { storage_->elements.clear(); }

const std::vector<Value>& Array::elements() const { return storage_->elements; }

Array Array::shallowCopy() const { return Array(storage_->elements); }

Array Array::deepCopy() const {
  Array copy;
  for (const Value& v : storage_->elements) copy.append(v.deepCopy());
  return copy;
}

bool operator==(const Array& a, const Array& b) {
  if (a.isSameObject(b)) return true;
  return a.elements() == b.elements();
}

// --- Value --------------------------------------------------------------------

const char* Value::typeName(Type type) {
  switch (type) {
    case Type::Null: return "Null";
    case Type::String: return "String";
    case Type::Integer: return "Integer";
    case Type::Real: return "Real";
    case Type::Boolean: return "Boolean";
    case Type::Date: return "Date";
    case Type::Data: return "Data";
    case Type::Dictionary: return "Dictionary";
    case Type::Array: return "Array";
  }
  return "Unknown";
}

Value Value::deepCopy() const {
  if (const Dictionary* d = asDictionary()) return Value(d->deepCopy());
  if (const Array* a = asArray()) return Value(a->deepCopy());
  return *this;
}

bool operator==(const Value& a, const Value& b) { return a.v_ == b.v_; }

}  // namespace corvane
