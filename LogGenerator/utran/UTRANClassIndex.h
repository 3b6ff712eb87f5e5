#pragma once

// The sections of the UTRAN technology, made from its table in the order in
// which sections that share a log code are called.

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class UTRANClassIndex final : public ClassIndex {
 public:
  UTRANClassIndex();
  ~UTRANClassIndex() override;

  // One row per section, in the order they are made.
  static SectionTable sections();
};

}  // namespace corvane
