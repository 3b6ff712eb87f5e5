#include "LogGenerator/gsm_umts/DetectedSet.h"

namespace corvane {

DetectedSet::DetectedSet() : UnlistedCellSet("DetectedSet") {}

}  // namespace corvane
