#pragma once

// The table rows of the sections that every log-code technology shows: the
// SIM files and the PDP contexts that the telephony service reports as extra
// codes. Each technology's table holds its own row for them (each index has
// its own section objects), under the member name that index gives them.

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/SectionTable.h"
#include "LogGenerator/shared/PDPContextList.h"
#include "LogGenerator/shared/SimInfo.h"

namespace corvane {

constexpr SectionDescriptor simInfoSection(std::string_view field) {
  return section<SimInfo>(field, "SIM Info", {kExtraCodeSimFiles}, SectionContainer::Rows);
}

constexpr SectionDescriptor pdpContextListSection(std::string_view field) {
  return section<PDPContextList>(field, "PDP Context Info", {kExtraCodePDPContexts}, SectionContainer::List);
}

}  // namespace corvane
