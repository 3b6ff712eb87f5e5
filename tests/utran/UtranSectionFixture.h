#pragma once

// One UTRAN section made and registered as its class index makes it, with a
// container of its own; packets laid out by hand.

#include <memory>

#include "LogGenerator/utran/UTRANClassIndex.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"
#include "support/Packets.h"
#include "support/SectionFixture.h"

namespace corvane::test {

template <class Section>
using UtranSectionTest = SectionTest<Section, &UTRANClassIndex::sections>;

inline const std::string kUtran2(CellMonitorRadioAccessTechnologyUTRAN2);

}  // namespace corvane::test
