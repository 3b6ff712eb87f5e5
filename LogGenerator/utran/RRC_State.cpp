#include "LogGenerator/utran/RRC_State.h"

#include <string>

#include "LogGenerator/logcode/DisplayText.h"
#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/utran/records/RrcStateRecord.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace utran::rrc_state;

// A display value as the message log shows it: strings quoted, dictionaries
// as { key = value; }, arrays as ( a, b ).
void describe(const Value& value, std::string& out) {
  if (const std::string* text = value.asString()) {
    out += '"';
    out += *text;
    out += '"';
  } else if (const Dictionary* rows = value.asDictionary()) {
    out += '{';
    for (const auto& [key, row] : rows->entries()) {
      out += ' ';
      out += key;
      out += " = ";
      describe(row, out);
      out += ';';
    }
    out += " }";
  } else if (const Array* list = value.asArray()) {
    out += '(';
    const char* separator = " ";
    for (const Value& element : list->elements()) {
      out += separator;
      describe(element, out);
      separator = ", ";
    }
    out += " )";
  } else {
    out += "(null)";
  }
}

}  // namespace

std::uint32_t RRC_State::stateNumber(const PacketView& packet) {
  return kVersion.raw(packet) == kUnderstoodVersion ? kState.raw(packet) : kUnknownState;
}

void RRC_State::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "RRC Info");
  if (logCode != kCode) return;
  const PacketView packet(data);
  // A short record is read all the same: its missing bytes read as zero.
  if (packet.size() < kExpectedLength) {
    log::printf(log::kWarning, "LogCode_0xD0E0 is length is %ld expected size %ld", static_cast<long>(packet.size()),
                static_cast<long>(kExpectedLength));
  }
  const std::uint32_t state = stateNumber(packet);
  const std::string_view text = textFor(kStates, state, kUnknownStateText);
  RowWriter(*this).set("State", text);
  if (!log::wants(log::kMessage)) return;
  const std::optional<Dictionary> rows = sectionDictionary();
  std::string shown;
  describe(rows ? Value(*rows) : Value(), shown);
  log::printf(log::kMessage, "Display Dict = %s, rrc mode = %d %.*s", shown.c_str(), static_cast<int>(state),
              static_cast<int>(text.size()), text.data());
}

}  // namespace corvane
