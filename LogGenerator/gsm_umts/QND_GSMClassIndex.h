#pragma once

// The sections of the GSM/UMTS technology, made from its table in the order in
// which sections that share a log code are called.

#include "LogGenerator/logcode/ClassIndex.h"

namespace corvane {

class QND_GSMClassIndex final : public ClassIndex {
 public:
  QND_GSMClassIndex();
  // Prints "Deallocing QND_GSMClassIndex" on standard output.
  ~QND_GSMClassIndex() override;

  // One row per section, in the order they are made.
  static SectionTable sections();
};

}  // namespace corvane
