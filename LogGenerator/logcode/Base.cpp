#include "LogGenerator/logcode/Base.h"

#include "LogGenerator/logcode/ArrayLock.h"
#include "LogGenerator/records/EcIoTable.h"
#include "platform/Assertion.h"
#include "platform/Log.h"

namespace corvane {

// --- CodeDictionary ---

const CodeDictionary::Subscribers* CodeDictionary::find(const std::string& code) const {
  auto it = index_.find(code);
  return it == index_.end() ? nullptr : &entries_[it->second].second;
}

CodeDictionary::Subscribers& CodeDictionary::subscribersFor(const std::string& code) {
  auto [it, inserted] = index_.try_emplace(code, entries_.size());
  if (inserted) entries_.emplace_back(code, Subscribers{});
  return entries_[it->second].second;
}

std::vector<std::string> CodeDictionary::keys() const {
  std::vector<std::string> out;
  out.reserve(entries_.size());
  for (const auto& entry : entries_) out.push_back(entry.first);
  return out;
}

void CodeDictionary::clear() {
  entries_.clear();
  index_.clear();
}

// --- Base ---

namespace {

class ArrayLockHolder {
 public:
  ArrayLockHolder() { ArrayLock::lockArray(); }
  ~ArrayLockHolder() { ArrayLock::unlockArray(); }
  ArrayLockHolder(const ArrayLockHolder&) = delete;
  ArrayLockHolder& operator=(const ArrayLockHolder&) = delete;
};

}  // namespace

std::shared_ptr<Base> Base::initWithDict(const SectionDescriptor& descriptor, ClassDictionary& classDict,
                                         CodeDictionary& codeDict) {
  std::shared_ptr<Base> section = descriptor.make();
  section->descriptor_ = &descriptor;
  classDict[std::string(descriptor.name)] = section;
  section->updateLogCodeDict(codeDict);
  return section;
}

std::string Base::getSectionName() const {
  if (!descriptor_) {
    raiseAssertionFailure("getSectionName: a section without a table row must name itself", __FILE__, __LINE__);
  }
  return std::string(descriptor_->name);
}

std::vector<std::uint32_t> Base::getLogCodeArray() const {
  if (!descriptor_) {
    raiseAssertionFailure("getLogCodeArray: a section without a table row must list its codes", __FILE__, __LINE__);
  }
  return {descriptor_->codes.begin(), descriptor_->codes.end()};
}

void Base::updateSectionRef(const Value& container) {
  if (const Dictionary* d = container.asDictionary()) {
    sectionRef = Dictionary::Weak(*d);
  } else if (const Array* a = container.asArray()) {
    sectionRef = Array::Weak(*a);
  } else {
    sectionRef = std::monostate{};
  }
  log::printf(log::kWarning, "%s", getSectionName().c_str());
}

void Base::updateLogCodeDict(CodeDictionary& codeDict) {
  const auto codes = getLogCodeArray();
  log::printf(log::kWarning, "Array Count: %d", static_cast<int>(codes.size()));
  for (std::uint32_t code : codes) {
    codeDict.subscribersFor(std::to_string(code)).push_back(shared_from_this());
  }
}

void Base::clearElementsInArray(const Array& array) {
  ArrayLockHolder hold;
  array.clear();
}

void Base::replaceArray(const Array& target, const Array& source) {
  ArrayLockHolder hold;
  // Emptying the target first empties a source that is the target itself.
  target.clear();
  for (const auto& element : source.elements()) target.append(element);
}

std::int16_t Base::lookUpECNO(std::uint32_t value) { return records::ecIoDecibels(value); }

std::optional<Dictionary> Base::sectionDictionary() const {
  if (const auto* weak = std::get_if<Dictionary::Weak>(&sectionRef)) return weak->lock();
  return std::nullopt;
}

std::optional<Array> Base::sectionArray() const {
  if (const auto* weak = std::get_if<Array::Weak>(&sectionRef)) return weak->lock();
  return std::nullopt;
}

void Base::setRow(std::string_view key, Value value) const {
  if (auto d = sectionDictionary()) d->set(key, std::move(value));
}

void Base::removeRow(std::string_view key) const {
  if (auto d = sectionDictionary()) d->remove(key);
}

void Base::logUnknownCode(std::uint32_t logCode) {
  log::printf(log::kError, "Received an unknown log message: %d", static_cast<std::int32_t>(logCode));
}

std::optional<PacketView> Base::acceptPacket(std::string_view trace, std::span<const std::uint8_t> data,
                                             std::uint32_t logCode, std::uint32_t ownCode, std::size_t minimumLength) {
  log::write(log::kWarning, trace);
  if (logCode != ownCode) {
    logUnknownCode(logCode);
    return std::nullopt;
  }
  if (data.size() < minimumLength) return std::nullopt;
  return PacketView(data);
}

}  // namespace corvane
