#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"

#include "LogGenerator/shared/CellChangeCounters.h"
#include "LogGenerator/shared/CodingScheme.h"
#include "LogGenerator/shared/SharedSections.h"

namespace corvane {

namespace {

constexpr auto kPlaceholder = SectionContainer::Placeholder;

// The sections of this technology that are decoded so far, in their order.
constexpr SectionDescriptor kSections[] = {
    section<CodingScheme>("objCodingScheme", "Coding Scheme", {}, kPlaceholder),
    pdpContextListSection("objPDPContextList"),
    section<CellChangeCounters>("objCellChangeCounter", "Cell Change Counters", {}, kPlaceholder),
    simInfoSection("objSimInfo"),
};

}  // namespace

SectionTable QND_GSMClassIndex::sections() { return kSections; }

QND_GSMClassIndex::QND_GSMClassIndex() : ClassIndex(kSections) {}

QND_GSMClassIndex::~QND_GSMClassIndex() {
  printTeardownLine("Deallocing QND_GSMClassIndex");
  releaseSections();
}

}  // namespace corvane
