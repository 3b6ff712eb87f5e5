#pragma once

// The generator of the GSM/UMTS technology: the "QND_GSM" display template and
// the GSM/UMTS class index.

#include <memory>

#include "LogGenerator/logcode/QNDLogGenerator2.h"

namespace corvane {

class QND_GSMLogGenerator final : public QNDLogGenerator2 {
 public:
  QND_GSMLogGenerator();
  ~QND_GSMLogGenerator() override;
  static std::unique_ptr<LogGenerator> generator();

 private:
  static Configuration configuration();
};

}  // namespace corvane
