#pragma once

// One LTE section made and registered as its class index makes it, with a
// container of its own, and readers of what it wrote.

#include "LogGenerator/lte/LTEClassIndex.h"
#include "support/SectionFixture.h"

namespace corvane::test {

template <class Section>
std::shared_ptr<Section> makeLteSection(ClassDictionary& classDict, CodeDictionary& codeDict) {
  return makeSection<Section>(LTEClassIndex::sections(), classDict, codeDict);
}

template <class Section>
using LteSectionTest = SectionTest<Section, &LTEClassIndex::sections>;

}  // namespace corvane::test
