#pragma once

// The sections of the LTE technology, made in the order in which sections that
// share a log code are called.

#include <memory>

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class LTEServingCellInfo;
class ConnectedModeMeasurementMisc;
class MeasuredNeighborCells;
class DetectedCells;
class ServingCellMeasurement;
class NeighborMeasurementMisc;
class NeighborCellsList;
class ReselectionCandidatesMisc;
class ReselectionCandidatesList;
class SimInfo;
class PDPContextList;

class LTEClassIndex final : public ClassIndex {
 public:
  LTEClassIndex();
  // Prints "Deallocing LTEClassIndex" on standard output.
  ~LTEClassIndex() override;

 private:
  std::shared_ptr<LTEServingCellInfo> objLTEServingCellInfo;
  std::shared_ptr<ConnectedModeMeasurementMisc> objConnectedModeMeasurementMisc;
  std::shared_ptr<MeasuredNeighborCells> objMeasuredNeighborCells;
  std::shared_ptr<DetectedCells> objDetectedCells;
  std::shared_ptr<ServingCellMeasurement> objServingCellMeasurement;
  std::shared_ptr<NeighborMeasurementMisc> objNeighborMeasurementMisc;
  std::shared_ptr<NeighborCellsList> objNeighborCellsList;
  std::shared_ptr<ReselectionCandidatesMisc> objReselectionCandidatesMisc;
  std::shared_ptr<ReselectionCandidatesList> objReselectionCandidatesList;
  std::shared_ptr<SimInfo> objSimInfo;
  std::shared_ptr<PDPContextList> objPDPContextList;
};

}  // namespace corvane
