#pragma once

// "Virtual Active Set": reads every UMTS set log, cell by cell, and lists none of its
// cells (see UnlistedCellSet).

#include "LogGenerator/gsm_umts/CellSetLog.h"

namespace corvane {

class VirtualActiveSet final : public UnlistedCellSet {
 public:
  VirtualActiveSet();
};

}  // namespace corvane
