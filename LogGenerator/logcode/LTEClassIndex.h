#pragma once

// The sections of the LTE technology, made in the order in which sections that
// share a log code are called.

#include <memory>

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class SimInfo;
class PDPContextList;

class LTEClassIndex final : public ClassIndex {
 public:
  LTEClassIndex();
  // Prints "Deallocing LTEClassIndex" on standard output.
  ~LTEClassIndex() override;

 private:
  std::shared_ptr<SimInfo> objSimInfo;
  std::shared_ptr<PDPContextList> objPDPContextList;
};

}  // namespace corvane
