#pragma once

// The rows that the three mobility management sections ("Process CO",
// "Process CS", "Process PS") share: each shows the registration service
// state of 0x7132 as "MM Service State".

#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/PlmnSelectionModeRecord.h"

namespace corvane::gsm_umts {

inline constexpr RowField kServiceStateRows[] = {{"MM Service State", plmn_selection::kServiceState}};

// The service state of a 0x7132 record, dropped when the record is short.
inline void writeServiceState(const Base& section, const PacketView& packet) {
  writeRecordRows<kServiceStateRows>(section, packet, plmn_selection::kMinimumLength);
}

}  // namespace corvane::gsm_umts
