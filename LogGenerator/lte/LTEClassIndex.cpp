#include "LogGenerator/lte/LTEClassIndex.h"

#include "LogGenerator/lte/ConnectedModeMeasurementMisc.h"
#include "LogGenerator/lte/DetectedCells.h"
#include "LogGenerator/lte/LTEServingCellInfo.h"
#include "LogGenerator/lte/MeasuredNeighborCells.h"
#include "LogGenerator/lte/NeighborCellsList.h"
#include "LogGenerator/lte/NeighborMeasurementMisc.h"
#include "LogGenerator/lte/ReselectionCandidatesList.h"
#include "LogGenerator/lte/ReselectionCandidatesMisc.h"
#include "LogGenerator/lte/ServingCellMeasurement.h"
#include "LogGenerator/lte/records/IntraFrequencyMeasurementRecord.h"
#include "LogGenerator/lte/records/NeighborMeasurementRecord.h"
#include "LogGenerator/lte/records/ReselectionCandidatesRecord.h"
#include "LogGenerator/lte/records/ServingCellIdentityRecord.h"
#include "LogGenerator/lte/records/ServingCellMeasurementRecord.h"
#include "LogGenerator/shared/SharedSections.h"

namespace corvane {

namespace {

using namespace lte;
constexpr auto kRows = SectionContainer::Rows;
constexpr auto kList = SectionContainer::List;

constexpr SectionDescriptor kSections[] = {
    section<LTEServingCellInfo>("objLTEServingCellInfo", "Serving Cell Info",
                                {cell_identity::kCode, antenna_info::kCode, kExtraCodeCellList}, kRows),
    section<ConnectedModeMeasurementMisc>("objConnectedModeMeasurementMisc",
                                          "Connected mode LTE Intra-frequency Measurement",
                                          {intra_frequency::kCode}, kRows),
    section<MeasuredNeighborCells>("objMeasuredNeighborCells", "Measured Neighbor Cells", {intra_frequency::kCode},
                                   kList),
    section<DetectedCells>("objDetectedCells", "Detected Cells", {intra_frequency::kCode}, kList),
    section<ServingCellMeasurement>("objServingCellMeasurement", "Serving Cell Measurements",
                                    {serving_measurement::kCode}, kRows),
    section<NeighborMeasurementMisc>("objNeighborMeasurementMisc", "Neighbor Measurements",
                                     {neighbor_measurement::kCode}, kRows),
    section<NeighborCellsList>("objNeighborCellsList", "Neighbor Cells List", {neighbor_measurement::kCode}, kList),
    section<ReselectionCandidatesMisc>("objReselectionCandidatesMisc", "Reselection Candidates",
                                       {reselection::kCode}, kRows),
    section<ReselectionCandidatesList>("objReselectionCandidatesList", "Reselection Candidates List",
                                       {reselection::kCode}, kList),
    simInfoSection("objSimInfo"),
    pdpContextListSection("objPDPContextList"),
};

}  // namespace

SectionTable LTEClassIndex::sections() { return kSections; }

LTEClassIndex::LTEClassIndex() : ClassIndex(kSections) {}

LTEClassIndex::~LTEClassIndex() {
  printTeardownLine("Deallocing LTEClassIndex");
  releaseSections();
}

}  // namespace corvane
