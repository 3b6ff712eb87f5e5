#include "LogGenerator/GSM/GSMLogGenerator.h"

#include "platform/Assertion.h"
#include "platform/PropertyList.h"

namespace corvane {

namespace {
Value collapsed(Value processed) {
  Value single = GSMLogGenerator::canCollapse(processed);
  return single.isNull() ? processed : single;
}
}  // namespace

std::unique_ptr<LogGenerator> GSMLogGenerator::generator() { return std::make_unique<GSMLogGenerator>(); }

void GSMLogGenerator::updateState(const Dictionary& state, std::span<const std::uint8_t> data) {
  auto packet = plist::parse(data);
  if (!packet) raiseAssertionFailure("Could not deserialize the object", kSourceFile, kDeserializeLine);
  Value display = processObject(*packet);
  state.set(kStateDisplayState, std::move(*packet));
  state.set(kStateDisplay, std::move(display));
  state.set(kStateExtraInfo, Value(Dictionary()));
}

Value GSMLogGenerator::generateLogUsingState(const Dictionary& state) {
  updateHistoryInState(state);
  return state.get(kStateDisplay);
}

Dictionary GSMLogGenerator::getStartCommand() {
  Dictionary command;
  command.set("SetState", Value("Streaming"));
  return command;
}

Value GSMLogGenerator::getSaveContentsFromState(const Dictionary& state) {
  const Value* history = state.find(kStateHistory);
  if (history && history->isArray()) return Value(history->asArray()->shallowCopy());
  return Value(Array());
}

Value GSMLogGenerator::canCollapse(const Value& object) {
  const Dictionary* dict = object.asDictionary();
  if (!dict || dict->size() != 1) return Value();
  return dict->entries().front().second;
}

Value GSMLogGenerator::processObject(const Value& object) {
  if (object.isString()) return object;
  if (const Dictionary* dict = object.asDictionary()) {
    Dictionary out;
    out.reserve(dict->size());
    for (const auto& [key, value] : dict->entries()) out.set(key, collapsed(processObject(value)));
    return Value(out);
  }
  if (const Array* array = object.asArray()) {
    Array out;
    const auto& elements = array->elements();
    for (std::size_t i = 1; i < elements.size(); ++i) out.append(collapsed(processObject(elements[i])));
    return Value(out);
  }
  raiseAssertionFailure(std::string("Unknown object of type ") + object.typeName() + " encountered", kSourceFile,
                        kUnknownObjectLine);
}

}  // namespace corvane
