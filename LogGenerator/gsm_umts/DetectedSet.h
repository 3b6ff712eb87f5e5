#pragma once

// "Detected Set": reads every UMTS set log, cell by cell, and lists none of its
// cells (see UnlistedCellSet).

#include "LogGenerator/gsm_umts/CellSetLog.h"

namespace corvane {

class DetectedSet final : public UnlistedCellSet {
 public:
  DetectedSet();
};

}  // namespace corvane
