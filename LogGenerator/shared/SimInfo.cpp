#include "LogGenerator/shared/SimInfo.h"

#include <array>
#include <string_view>

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "platform/Log.h"

namespace corvane {

namespace {

struct SimFileRow {
  std::string_view payloadKey;
  std::string_view row;
};

// In the order the rows are copied.
constexpr std::array<SimFileRow, 14> kSimFileRows = {{
    {"kSimFile_ICCID", "EF-ICCID"},
    {"kSimFile_MSISDN", "EF-MSISDN"},
    {"kSimFile_MBDN", "EF-3GPP MAIL BOX DIALING NUMBER"},
    {"kSimFile_HPPLMN", "EF-HPPLMN SEARCH PERIOD"},
    {"kSimFile_LOCI", "EF-LOCI"},
    {"kSimFile_PSLOCI", "EF-GPRS/PS-LOCI"},
    {"kSimFile_ACC", "EF-ACCESS CONTROL CLASS"},
    {"kSimFile_AD", "EF-ADMINISTRATIVE DATA"},
    {"kSimFile_FPLMN", "EF-FPLMN"},
    {"kSimFile_AHPLMN", "EF-ACTING HPLMN"},
    {"kSimFile_RATMODE", "EF-RAT MODE"},
    {"kSimFile_PNN", "EF-PLMN NETWORK NAME"},
    {"kSimFile_OPL", "EF-OPERATOR PLMN LIST"},
    {"kSimFile_OPLMNAcT", "EF-OPLMNAcT"},
}};

}  // namespace

void SimInfo::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::printf(log::kWarning, "SimInfo");
  if (logCode != kExtraCodeSimFiles) return;
  // Throws, after its message, when the payload is not a dictionary.
  const LogCode_0xFF0000 simFiles(data);
  for (const auto& row : kSimFileRows) {
    Value value = simFiles.valueForKey(row.payloadKey);
    if (!value.isNull()) setRow(row.row, std::move(value));
  }
}

}  // namespace corvane
