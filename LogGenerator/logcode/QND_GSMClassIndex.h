#pragma once

// The sections of the GSM/UMTS technology, made in the order in which sections
// that share a log code are called.

#include <memory>

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class CodingScheme;
class PDPContextList;
class CellChangeCounters;
class SimInfo;

class QND_GSMClassIndex final : public ClassIndex {
 public:
  QND_GSMClassIndex();
  // Prints "Deallocing QND_GSMClassIndex" on standard output.
  ~QND_GSMClassIndex() override;

 private:
  std::shared_ptr<CodingScheme> objCodingScheme;
  std::shared_ptr<PDPContextList> objPDPContextList;
  std::shared_ptr<CellChangeCounters> objCellChangeCounter;
  std::shared_ptr<SimInfo> objSimInfo;
};

}  // namespace corvane
