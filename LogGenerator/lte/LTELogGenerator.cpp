#include "LogGenerator/lte/LTELogGenerator.h"

#include "LogGenerator/lte/LTEClassIndex.h"
#include "platform/Log.h"

namespace corvane {

QNDLogGenerator2::Configuration LTELogGenerator::configuration() {
  log::printf(log::kError, "Creating LTELogGenerator object");
  return {"LTE", std::make_unique<LTEClassIndex>()};
}

LTELogGenerator::LTELogGenerator() : QNDLogGenerator2(configuration()) {}

LTELogGenerator::~LTELogGenerator() {
  log::printf(log::kWarning, "LTELogGenerator is destructed %s", log::pointerText(this).c_str());
}

std::unique_ptr<LogGenerator> LTELogGenerator::generator() { return std::make_unique<LTELogGenerator>(); }

}  // namespace corvane
