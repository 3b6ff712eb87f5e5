#pragma once

// The generator of the log-code technologies (GSM/UMTS, LTE, UTRAN). It copies
// the technology's display template into the state once, handing every section
// its container on the way; dispatches each packet by its log code to the
// sections subscribed to it; and asks the telephony service for exactly the
// codes its sections want.

#include <cstdint>
#include <memory>
#include <span>
#include <string>

#include "LogGenerator/logcode/ClassIndex.h"
#include "LogGenerator/logcode/QNDLogGenerator.h"

namespace corvane {

inline constexpr std::string_view kStateTemplate = "Template";
inline constexpr std::string_view kStartSetState = "SetState";
inline constexpr std::string_view kStartStreaming = "Streaming";
inline constexpr std::string_view kStartLogCodes = "SetQuendraLogCodes";
inline constexpr std::string_view kStartExtraCodes = "SetTsExtraCodes";

class QNDLogGenerator2 : public QNDLogGenerator {
 public:
  // What a technology generator hands over: its template name and its class
  // index. Made before the generator, so that a technology's own trace comes
  // first.
  struct Configuration {
    std::string pListName;
    std::unique_ptr<ClassIndex> cIndex;
  };

  // initWithPListName:cIndexObj:
  explicit QNDLogGenerator2(Configuration configuration);
  // For a technology that found no template: no name, no index.
  struct Unconfigured {};
  explicit QNDLogGenerator2(Unconfigured);
  ~QNDLogGenerator2() override;

  // Decodes one packet and dispatches it to the sections of its code.
  void updateWithData(std::span<const std::uint8_t> data);
  void updateState(const Dictionary& state, std::span<const std::uint8_t> data) override;
  // A fresh copy of a template node; sections named by a key get their container.
  Value processTemplate(const Value& object);
  void printDict(const Value& object) const;
  // The display of the state, or nothing on the call that builds it.
  Value getDisplayFromState(const Dictionary& state);
  Value generateLogUsingState(const Dictionary& state) override;
  Dictionary getStartCommand() override;

  const std::string& templateName() const { return pListName; }
  ClassIndex* classIndex() const { return cIndex.get(); }

 private:
  struct Announced {};
  static Announced announce(const ClassIndex* index);
  QNDLogGenerator2(Announced, Configuration&& configuration);

  std::string pListName;
  std::unique_ptr<ClassIndex> cIndex;
};

}  // namespace corvane
