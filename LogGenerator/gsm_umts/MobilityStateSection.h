#pragma once

// What the three mobility management sections ("Process CO", "Process CS",
// "Process PS") have in common: each shows the rows of one state record (MM
// or GMM) and the registration service state of 0x7132 as "MM Service State";
// a record shorter than 16 bytes is dropped without a message, another code
// is logged.

#include <cstdint>
#include <span>
#include <string_view>

#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/PlmnSelectionModeRecord.h"
#include "platform/Log.h"

namespace corvane {

class MobilityStateSection : public Base {
 protected:
  // Traces the section, then writes the state record's rows (StateRows, for
  // a record of stateCode) or the service state.
  template <const auto& StateRows>
  void updateStates(std::string_view trace, std::uint32_t stateCode, std::size_t stateMinimumLength,
                    std::span<const std::uint8_t> data, std::uint32_t logCode) const {
    log::write(log::kWarning, trace);
    const PacketView packet(data);
    if (logCode == stateCode) {
      writeRecordRows<StateRows>(*this, packet, stateMinimumLength);
    } else if (logCode == gsm_umts::plmn_selection::kCode) {
      writeRecordRows<kServiceStateRows>(*this, packet, gsm_umts::plmn_selection::kMinimumLength);
    } else {
      logUnknownCode(logCode);
    }
  }

 private:
  static constexpr RowField kServiceStateRows[] = {{"MM Service State", gsm_umts::plmn_selection::kServiceState}};
};

}  // namespace corvane
