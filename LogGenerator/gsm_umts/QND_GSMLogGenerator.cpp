#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"

#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"
#include "platform/Log.h"

namespace corvane {

QNDLogGenerator2::Configuration QND_GSMLogGenerator::configuration() {
  log::printf(log::kError, "Creating QND_GSMLogGenerator object");
  return {"QND_GSM", std::make_unique<QND_GSMClassIndex>()};
}

QND_GSMLogGenerator::QND_GSMLogGenerator() : QNDLogGenerator2(configuration()) {}

QND_GSMLogGenerator::~QND_GSMLogGenerator() {
  log::printf(log::kWarning, "QND_GSMLogGenerator is destructed %s", log::pointerText(this).c_str());
}

std::unique_ptr<LogGenerator> QND_GSMLogGenerator::generator() { return std::make_unique<QND_GSMLogGenerator>(); }

}  // namespace corvane
