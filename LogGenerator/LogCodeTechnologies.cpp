#include "LogGenerator/LogCodeTechnologies.h"

#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"
#include "LogGenerator/lte/LTEClassIndex.h"
#include "LogGenerator/utran/UTRANClassIndex.h"
#include "platform/LogChannelTechnology.h"

namespace corvane {

std::span<const LogCodeTechnology> logCodeTechnologies() {
  static const LogCodeTechnology kTechnologies[] = {
      {kLogChannelTechnologyQuendraGSM, "QND_GSM", &QND_GSMClassIndex::sections},
      {kLogChannelTechnologyQuendraLTE, "LTE", &LTEClassIndex::sections},
      // The UTRAN generator searches the resources for its template; this is
      // the one installed with the application.
      {kLogChannelTechnologyQuendraUTRAN2, "UTRAN", &UTRANClassIndex::sections},
  };
  return kTechnologies;
}

}  // namespace corvane
