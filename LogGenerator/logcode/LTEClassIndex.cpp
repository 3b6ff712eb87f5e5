#include "LogGenerator/logcode/LTEClassIndex.h"

#include <cstdio>

#include "LogGenerator/gsm_umts/PDPContextList.h"
#include "LogGenerator/gsm_umts/SimInfo.h"

namespace corvane {

LTEClassIndex::LTEClassIndex() {
  objSimInfo = makeSection<SimInfo>();
  objPDPContextList = makeSection<PDPContextList>();
}

LTEClassIndex::~LTEClassIndex() {
  std::puts("Deallocing LTEClassIndex");
  std::fflush(stdout);
  objSimInfo.reset();
  objPDPContextList.reset();
}

}  // namespace corvane
