#include "LogGenerator/logcode/UTRANClassIndex.h"

#include "LogGenerator/gsm_umts/PDPContextList.h"
#include "LogGenerator/gsm_umts/SimInfo.h"

namespace corvane {

UTRANClassIndex::UTRANClassIndex() {
  pdpList = makeSection<PDPContextList>();
  simInfo = makeSection<SimInfo>();
}

UTRANClassIndex::~UTRANClassIndex() {
  pdpList.reset();
  simInfo.reset();
}

}  // namespace corvane
