#include "LogGenerator/logcode/QND_GSMClassIndex.h"

#include <cstdio>

#include "LogGenerator/gsm_umts/CellChangeCounters.h"
#include "LogGenerator/gsm_umts/CodingScheme.h"
#include "LogGenerator/gsm_umts/PDPContextList.h"
#include "LogGenerator/gsm_umts/SimInfo.h"

namespace corvane {

QND_GSMClassIndex::QND_GSMClassIndex() {
  objCodingScheme = makeSection<CodingScheme>();
  objPDPContextList = makeSection<PDPContextList>();
  objCellChangeCounter = makeSection<CellChangeCounters>();
  objSimInfo = makeSection<SimInfo>();
}

QND_GSMClassIndex::~QND_GSMClassIndex() {
  printTeardownLine("Deallocing QND_GSMClassIndex");
  objCodingScheme.reset();
  objPDPContextList.reset();
  objCellChangeCounter.reset();
  objSimInfo.reset();
}

}  // namespace corvane
