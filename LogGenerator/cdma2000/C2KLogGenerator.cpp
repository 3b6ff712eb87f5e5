#include "LogGenerator/cdma2000/C2KLogGenerator.h"

#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "LogGenerator/cdma2000/records/DataRateRecords.h"
#include "LogGenerator/cdma2000/records/EvdoPilotsRecord.h"
#include "LogGenerator/cdma2000/records/EvdoStatusRecord.h"
#include "LogGenerator/cdma2000/records/FingerRecord.h"
#include "LogGenerator/cdma2000/records/OneXSystemRecord.h"
#include "LogGenerator/cdma2000/records/SubpacketRecord.h"
#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/QNDLogGenerator2.h"
#include "LogGenerator/logcode/TemplateResource.h"
#include "platform/Log.h"

namespace corvane {

namespace {

// Shorter packets cannot hold a log record's header.
constexpr std::size_t kShortestPacket = 13;
constexpr std::uint8_t kPrefixMarker = 0x81;
constexpr std::size_t kPrefixSize = 2;
constexpr std::uint8_t kTypeLogCode = 0x01;
constexpr std::uint8_t kTypeExtraCode = 0xFF;

}  // namespace

namespace c2k {

const CodeDecoder kDecoders[8] = {
    {records::finger::kCode, &decodeFingers},
    {records::evdo_status::kCode, &decodeEvdoStatus},
    {records::forward_rate::kCode, &decodeForwardLinkRate},
    {records::evdo_pilots::kCode, &decodeEvdoPilots},
    {records::onex_status::kCode, &decode1xStatus},
    {records::onex_traffic::kCode, &decode1xTrafficFER},
    {records::reverse_rate::kCode, &decodeReverseLinkRate},
    {records::onex_system::kCode, &decode1xSystem},
};

Decoder decoderFor(std::uint32_t code) {
  for (const CodeDecoder& row : kDecoders) {
    if (row.code == code) return row.decoder;
  }
  return nullptr;
}

}  // namespace c2k

C2KLogGenerator::C2KLogGenerator() = default;
C2KLogGenerator::~C2KLogGenerator() = default;

std::unique_ptr<LogGenerator> C2KLogGenerator::generator() { return std::make_unique<C2KLogGenerator>(); }

Dictionary C2KLogGenerator::getStartCommand() {
  Array codes;
  for (const c2k::CodeDecoder& row : c2k::kDecoders) codes.append(Value::integer(row.code));
  Dictionary command;
  command.set(kStartSetState, Value(kStartStreaming));
  command.set(kStartLogCodes, Value(codes));
  return command;
}

void C2KLogGenerator::processTemplate(const Dictionary& templateDict, const Dictionary& display,
                                      const Dictionary& lookup) {
  for (const auto& [label, value] : templateDict.entries()) {
    if (const Dictionary* sub = value.asDictionary()) {
      Dictionary subDisplay;
      processTemplate(*sub, subDisplay, lookup);
      display.set(label, Value(subDisplay));
    } else if (const std::string* leaf = value.asString()) {
      if (*leaf == kSortedMarker) {
        display.set(label, value);
        continue;
      }
      display.set(label, Value(""));
      Dictionary record;
      record.set(kLookupRecordKey, Value(label));
      record.set(kLookupRecordDict, Value(display));
      Value* rows = lookup.findMutable(*leaf);
      if (!rows || !rows->isArray()) {
        lookup.set(*leaf, Value(Array()));
        rows = lookup.findMutable(*leaf);
      }
      rows->asArray()->append(Value(record));
    }
  }
  log::printf(log::kWarning, "Processing the template");
}

Value C2KLogGenerator::getDisplayFromState(const Dictionary& state) {
  if (const Value* display = state.find(kStateDisplay); display && !display->isNull()) return *display;

  Value templateObject = state.get(kC2KStateTemplate);
  if (!templateObject.isDictionary()) {
    auto loaded = loadTemplateResource(kC2KTemplateName);
    if (!loaded) {
      log::printf(log::kError, "Cannot load C2K template for display");
      return Value();
    }
    templateObject = Value(*loaded);
    state.set(kC2KStateTemplate, templateObject);
  }

  Dictionary lookup;
  Dictionary display;
  processTemplate(*templateObject.asDictionary(), display, lookup);
  state.set(kStateDisplay, Value(display));
  state.set(kC2KStateLookup, Value(lookup));
  state.set(kStateExtraInfo, Value(Dictionary()));
  return Value(display);
}

void C2KLogGenerator::updateState(const Dictionary& state, std::span<const std::uint8_t> data) {
  getDisplayFromState(state);
  // A handle of its own: the decoders add entries to the state, which may move its values.
  const Value lookup = state.get(kC2KStateLookup);
  updateFromLog(data, lookup.asDictionary(), state);
}

void C2KLogGenerator::updateFromLog(std::span<const std::uint8_t> data, const Dictionary* lookup,
                                    const Dictionary& state) {
  if (data.size() < kShortestPacket) return;
  if (data[0] == kPrefixMarker) data = data.subspan(kPrefixSize);
  const PacketView packet(data);
  const std::uint8_t type = packet.u8(0);
  // The type is reported but decides nothing: the code alone does.
  if (type != kTypeLogCode) log::printf(log::kError, "Invalid log type: %x. Dropping.", type);
  std::uint32_t code = packet.le16(3);
  if (type == kTypeExtraCode) code |= kExtraCodeBase;
  const c2k::Decoder decoder = c2k::decoderFor(code);
  if (!decoder) return;
  decoder(data, state, lookup);
  _binData.insert(_binData.end(), data.begin(), data.end());
}

Value C2KLogGenerator::generateLogUsingState(const Dictionary& state) {
  Value display = getDisplayFromState(state);
  state.set(kStateDisplayState, Value(std::move(_binData)));
  _binData = Bytes();
  updateHistoryInState(state);
  return display;
}

namespace {

// Calls write(dict, label) for each lookup record of the key, in order,
// until a record that holds no dictionary or no label.
template <class Write>
void forEachLookupRow(std::string_view key, const Dictionary* lookup, Write write) {
  const Value* rows = lookup ? lookup->find(key) : nullptr;
  const Array* records = rows ? rows->asArray() : nullptr;
  if (!records) return;
  for (const Value& element : records->elements()) {
    const Dictionary* record = element.asDictionary();
    const Value* dict = record ? record->find(kLookupRecordDict) : nullptr;
    const Value* label = record ? record->find(kLookupRecordKey) : nullptr;
    if (!dict || !dict->isDictionary() || !label || !label->isString()) return;
    write(*dict->asDictionary(), *label->asString());
  }
}

}  // namespace

void SetLookupValue(std::string_view key, std::string_view text, const Dictionary* lookup) {
  forEachLookupRow(key, lookup, [text](const Dictionary& dict, const std::string& label) {
    std::size_t hint = 0;
    dict.setString(label, text, hint);
  });
}

void SetLookupValue(std::string_view key, const Value& value, const Dictionary* lookup) {
  forEachLookupRow(key, lookup, [&value](const Dictionary& dict, const std::string& label) { dict.set(label, value); });
}

}  // namespace corvane
