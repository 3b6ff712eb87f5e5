#include "LogGenerator/gsm_umts/VirtualActiveSet.h"

namespace corvane {

VirtualActiveSet::VirtualActiveSet() : UnlistedCellSet("VirtualActiveSet") {}

}  // namespace corvane
