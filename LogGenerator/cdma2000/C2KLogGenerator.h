#pragma once

// The generator of the CDMA2000 technology (1x and EV-DO). It has no sections
// and no class index: its display is a copy of the "C2KTemplate" label
// template whose leaves name decoded values by a lookup key, and one decoder
// per subscribed log code writes its texts through the lookup dictionary
// built from the template. The raw packets it decoded go to "DisplayState" at
// each display generation, for the history and the saved DLF.

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>

#include "LogGenerator/logcode/QNDLogGenerator.h"

namespace corvane {

// State entries of the CDMA2000 generator (besides "Display", "ExtraInfo" and
// "DisplayState").
inline constexpr std::string_view kC2KStateTemplate = "Template";
inline constexpr std::string_view kC2KStateLookup = "Lookup";
inline constexpr std::string_view kC2KTemplateName = "C2KTemplate";
// A lookup record: the display label and the dictionary it stands in.
inline constexpr std::string_view kLookupRecordKey = "key";
inline constexpr std::string_view kLookupRecordDict = "dict";
inline constexpr std::string_view kSortedMarker = "_sorted";

class C2KLogGenerator final : public QNDLogGenerator {
 public:
  C2KLogGenerator();
  ~C2KLogGenerator() override;
  static std::unique_ptr<LogGenerator> generator();

  // {"SetState": "Streaming", "SetQuendraLogCodes": the eight codes}.
  Dictionary getStartCommand() override;
  void updateState(const Dictionary& state, std::span<const std::uint8_t> data) override;
  // Decodes one packet (after its optional 0x81 prefix) with the decoder of
  // its code and keeps its bytes; `lookup` may be nothing.
  void updateFromLog(std::span<const std::uint8_t> data, const Dictionary* lookup, const Dictionary& state);
  Value generateLogUsingState(const Dictionary& state) override;

  // Copies the template's shape into `display`: sub-dictionaries recursively,
  // "_sorted" as it is, and every other string leaf as "" with a lookup
  // record appended under lookup[leaf]. Other values make no entry.
  static void processTemplate(const Dictionary& templateDict, const Dictionary& display, const Dictionary& lookup);
  // The state's display, built once from the template; nothing when the
  // template cannot be loaded.
  static Value getDisplayFromState(const Dictionary& state);

  // The bytes kept since the last display generation.
  const Bytes& binData() const { return _binData; }
};

// Writes a value into every row whose template leaf is `key`, in template
// order; a key the template does not use is dropped. The string form writes
// into the rows' strings in place.
void SetLookupValue(std::string_view key, std::string_view text, const Dictionary* lookup);
void SetLookupValue(std::string_view key, const Value& value, const Dictionary* lookup);
inline void SetLookupValue(std::string_view key, const char* text, const Dictionary* lookup) {
  SetLookupValue(key, std::string_view(text), lookup);
}

}  // namespace corvane
