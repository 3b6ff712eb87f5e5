#include "LogGenerator/utran/UTRANClassIndex.h"

#include "LogGenerator/shared/SharedSections.h"
#include "LogGenerator/utran/CCTRCHSIRMeasurement.h"
#include "LogGenerator/utran/GSMNeighbhorMeasurements.h"
#include "LogGenerator/utran/RRC_State.h"
#include "LogGenerator/utran/TRCHBLERMeasurement.h"
#include "LogGenerator/utran/UTRANNeighbhorMeasurements.h"
#include "LogGenerator/utran/UTRANServingCellInfo.h"
#include "LogGenerator/utran/records/ChannelMeasurementRecord.h"
#include "LogGenerator/utran/records/GsmNeighborRecord.h"
#include "LogGenerator/utran/records/NeighborMeasurementRecord.h"
#include "LogGenerator/utran/records/RrcStateRecord.h"
#include "LogGenerator/utran/records/ServingCellRecord.h"

namespace corvane {

namespace {

using namespace utran;
constexpr auto kRows = SectionContainer::Rows;
constexpr auto kList = SectionContainer::List;

// The sections of this technology, in their order: "TRCH BLER" reads a
// channel measurement before "CCTRCH SIR" does.
constexpr SectionDescriptor kSections[] = {
    section<RRC_State>("rrc_state", "RRC Info", {rrc_state::kCode}, kRows),
    section<UTRANServingCellInfo>("servingCellInfo", "Serving Cell Info", {serving_cell::kCode, kExtraCodeCellList},
                                  kRows),
    section<UTRANNeighbhorMeasurements>("tdMeasurements", "Neighbor Cell List", {neighbor_measurement::kCode}, kList),
    section<GSMNeighbhorMeasurements>("gsmMeasurements", "GSM Neighbor Cell List", {gsm_neighbor::kCode}, kList),
    section<TRCHBLERMeasurement>("trchMeasurements", "TRCH BLER", {channel_measurement::kCode}, kList),
    section<CCTRCHSIRMeasurement>("cctrchMeasurements", "CCTRCH SIR", {channel_measurement::kCode}, kList),
    pdpContextListSection("pdpList"),
    simInfoSection("simInfo"),
};

}  // namespace

SectionTable UTRANClassIndex::sections() { return kSections; }

UTRANClassIndex::UTRANClassIndex() : ClassIndex(kSections) {}

// This index has no teardown line of its own.
UTRANClassIndex::~UTRANClassIndex() { releaseSections(); }

}  // namespace corvane
