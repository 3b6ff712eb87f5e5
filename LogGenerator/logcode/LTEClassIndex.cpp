#include "LogGenerator/logcode/LTEClassIndex.h"

#include <cstdio>

#include "LogGenerator/gsm_umts/PDPContextList.h"
#include "LogGenerator/gsm_umts/SimInfo.h"
#include "LogGenerator/lte/ConnectedModeMeasurementMisc.h"
#include "LogGenerator/lte/DetectedCells.h"
#include "LogGenerator/lte/LTEServingCellInfo.h"
#include "LogGenerator/lte/MeasuredNeighborCells.h"
#include "LogGenerator/lte/NeighborCellsList.h"
#include "LogGenerator/lte/NeighborMeasurementMisc.h"
#include "LogGenerator/lte/ReselectionCandidatesList.h"
#include "LogGenerator/lte/ReselectionCandidatesMisc.h"
#include "LogGenerator/lte/ServingCellMeasurement.h"

namespace corvane {

LTEClassIndex::LTEClassIndex() {
  objLTEServingCellInfo = makeSection<LTEServingCellInfo>();
  objConnectedModeMeasurementMisc = makeSection<ConnectedModeMeasurementMisc>();
  objMeasuredNeighborCells = makeSection<MeasuredNeighborCells>();
  objDetectedCells = makeSection<DetectedCells>();
  objServingCellMeasurement = makeSection<ServingCellMeasurement>();
  objNeighborMeasurementMisc = makeSection<NeighborMeasurementMisc>();
  objNeighborCellsList = makeSection<NeighborCellsList>();
  objReselectionCandidatesMisc = makeSection<ReselectionCandidatesMisc>();
  objReselectionCandidatesList = makeSection<ReselectionCandidatesList>();
  objSimInfo = makeSection<SimInfo>();
  objPDPContextList = makeSection<PDPContextList>();
}

LTEClassIndex::~LTEClassIndex() {
  printTeardownLine("Deallocing LTEClassIndex");
  objLTEServingCellInfo.reset();
  objConnectedModeMeasurementMisc.reset();
  objMeasuredNeighborCells.reset();
  objDetectedCells.reset();
  objServingCellMeasurement.reset();
  objNeighborMeasurementMisc.reset();
  objNeighborCellsList.reset();
  objReselectionCandidatesMisc.reset();
  objReselectionCandidatesList.reset();
  objSimInfo.reset();
  objPDPContextList.reset();
}

}  // namespace corvane
