#pragma once

// The generator of the LTE technology: the "LTE" display template and the LTE
// class index.

#include <memory>

#include "LogGenerator/logcode/QNDLogGenerator2.h"

namespace corvane {

class LTELogGenerator final : public QNDLogGenerator2 {
 public:
  LTELogGenerator();
  ~LTELogGenerator() override;
  static std::unique_ptr<LogGenerator> generator();

 private:
  static Configuration configuration();
};

}  // namespace corvane
