#pragma once

// The sections of the UTRAN technology, made in the order in which sections
// that share a log code are called.

#include <memory>

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class PDPContextList;
class SimInfo;

class UTRANClassIndex final : public ClassIndex {
 public:
  UTRANClassIndex();
  ~UTRANClassIndex() override;

 private:
  std::shared_ptr<PDPContextList> pdpList;
  std::shared_ptr<SimInfo> simInfo;
};

}  // namespace corvane
