#pragma once

// The sections of the LTE technology, made from its table in the order in
// which sections that share a log code are called.

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class LTEClassIndex final : public ClassIndex {
 public:
  LTEClassIndex();
  // Prints "Deallocing LTEClassIndex" on standard output.
  ~LTEClassIndex() override;

  // One row per section, in the order they are made.
  static SectionTable sections();
};

}  // namespace corvane
