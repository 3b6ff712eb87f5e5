#include "LogGenerator/logcode/QNDLogGenerator2.h"

#include <charconv>

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/TemplateResource.h"
#include "platform/Log.h"

namespace corvane {

namespace {

constexpr std::uint8_t kPrefixMarker = 0x81;
constexpr std::size_t kPrefixSize = 2;
constexpr std::uint8_t kTypeLogCode = 0x01;
constexpr std::uint8_t kTypeExtraCode = 0xFF;

}  // namespace

QNDLogGenerator2::Announced QNDLogGenerator2::announce(const ClassIndex* index) {
  log::printf(log::kError, "Creating QNDLogGenerator2 object with %s", log::pointerText(index).c_str());
  return {};
}

QNDLogGenerator2::QNDLogGenerator2(Configuration configuration)
    : QNDLogGenerator2(announce(configuration.cIndex.get()), std::move(configuration)) {}

QNDLogGenerator2::QNDLogGenerator2(Announced, Configuration&& configuration)
    : pListName(std::move(configuration.pListName)), cIndex(std::move(configuration.cIndex)) {
  // The generator is the index's one owner.
  log::printf(log::kError, "Class Index: %ld", cIndex ? 1L : 0L);
}

QNDLogGenerator2::QNDLogGenerator2(Unconfigured) {}

QNDLogGenerator2::~QNDLogGenerator2() {
  // Every log-code technology writes this same line.
  log::printf(log::kWarning, "QND_GSMLogGenerator is destructed %s", log::pointerText(this).c_str());
  cIndex.reset();
}

void QNDLogGenerator2::updateWithData(std::span<const std::uint8_t> data) {
  if (data.size() < kLogRecordHeaderSize) return;
  if (data[0] == kPrefixMarker) data = data.subspan(kPrefixSize);
  const PacketView packet(data);
  const std::uint8_t type = packet.u8(0);
  if (type != kTypeLogCode && type != kTypeExtraCode) {
    log::printf(log::kError, "Invalid log type: %x. Dropping.", type);
    return;
  }
  std::uint32_t code = packet.le16(3);
  if (type == kTypeExtraCode) code |= kExtraCodeBase;
  if (!cIndex) return;
  const auto* subscribers = cIndex->getSubscribers(static_cast<std::int32_t>(code));
  if (!subscribers) return;
  // A section never subscribes while packets flow, so the array is stable here.
  for (const auto& section : *subscribers) section->updateWithData(data, code);
}

void QNDLogGenerator2::updateState(const Dictionary& state, std::span<const std::uint8_t> data) {
  getDisplayFromState(state);
  updateWithData(data);
  _binData.insert(_binData.end(), data.begin(), data.end());
}

Value QNDLogGenerator2::processTemplate(const Value& object) {
  if (const std::string* s = object.asString()) return Value(*s);
  if (const Array* a = object.asArray()) {
    Array copy;
    for (const Value& element : a->elements()) {
      Value processed = processTemplate(element);
      if (!processed.isNull()) copy.append(std::move(processed));
    }
    return Value(copy);
  }
  if (const Dictionary* d = object.asDictionary()) {
    Dictionary copy;
    copy.reserve(d->size());
    for (const auto& [key, value] : d->entries()) {
      Value processed = processTemplate(value);
      if (cIndex) {
        if (Base* section = cIndex->getClass(key)) section->updateSectionRef(processed);
      }
      // A node of an unsupported type yields nothing and leaves no entry.
      if (!processed.isNull()) copy.set(key, std::move(processed));
    }
    return Value(copy);
  }
  log::printf(log::kError, "Received an object of unknown type");
  log::printf(log::kWarning, "Processing the template");
  return Value();
}

void QNDLogGenerator2::printDict(const Value& object) const {
  if (object.isString()) return;
  if (const Dictionary* d = object.asDictionary()) {
    for (const auto& entry : d->entries()) printDict(entry.second);
    return;
  }
  if (const Array* a = object.asArray()) {
    for (const Value& element : a->elements()) printDict(element);
    return;
  }
  log::printf(log::kError, "Received an object of unknown type");
}

Value QNDLogGenerator2::getDisplayFromState(const Dictionary& state) {
  if (const Value* display = state.find(kStateDisplay); display && !display->isNull()) return *display;

  Value templateObject = state.get(kStateTemplate);
  if (templateObject.isNull()) {
    auto loaded = loadTemplateResource(pListName);
    if (!loaded) {
      log::printf(log::kError, "Cannot load template for display");
      return Value();
    }
    templateObject = Value(*loaded);
    state.set(kStateTemplate, templateObject);
  }

  log::printf(log::kWarning, "Initialized class index: %s, Self: %s", log::pointerText(cIndex.get()).c_str(),
              log::pointerText(this).c_str());
  if (cIndex) cIndex->status();

  Value display = processTemplate(templateObject);
  printDict(display);
  state.set(kStateDisplay, display);
  state.set(kStateExtraInfo, Value(Dictionary()));
  // The call that builds the display shows nothing yet; later calls return it.
  return Value();
}

Value QNDLogGenerator2::generateLogUsingState(const Dictionary& state) {
  Value display = getDisplayFromState(state);
  state.set(kStateDisplayState, Value(std::move(_binData)));
  _binData = Bytes();
  updateHistoryInState(state);
  return display;
}

Dictionary QNDLogGenerator2::getStartCommand() {
  Array logCodes;
  Array extraCodes;
  if (cIndex) {
    for (const std::string& text : cIndex->getAllLogCodes()) {
      std::int64_t code = 0;
      std::from_chars(text.data(), text.data() + text.size(), code);
      if (code >= static_cast<std::int64_t>(kExtraCodeBase)) {
        extraCodes.append(Value::integer(code - kExtraCodeBase));
      } else {
        logCodes.append(Value::integer(code));
      }
    }
  }
  Dictionary command;
  command.set(kStartSetState, Value(kStartStreaming));
  command.set(kStartLogCodes, Value(logCodes));
  command.set(kStartExtraCodes, Value(extraCodes));
  return command;
}

}  // namespace corvane
