#include "LogGenerator/gsm_umts/MonitoredSet.h"

namespace corvane {

MonitoredSet::MonitoredSet() : UnlistedCellSet("MonitoredSet") {}

}  // namespace corvane
