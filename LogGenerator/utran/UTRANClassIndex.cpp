#include "LogGenerator/utran/UTRANClassIndex.h"

#include "LogGenerator/shared/SharedSections.h"

namespace corvane {

namespace {

// The sections of this technology that are decoded so far, in their order.
constexpr SectionDescriptor kSections[] = {
    pdpContextListSection("pdpList"),
    simInfoSection("simInfo"),
};

}  // namespace

SectionTable UTRANClassIndex::sections() { return kSections; }

UTRANClassIndex::UTRANClassIndex() : ClassIndex(kSections) {}

// This index has no teardown line of its own.
UTRANClassIndex::~UTRANClassIndex() { releaseSections(); }

}  // namespace corvane
