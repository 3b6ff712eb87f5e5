#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"

#include "LogGenerator/gsm_umts/ActiveSet.h"
#include "LogGenerator/gsm_umts/BLER.h"
#include "LogGenerator/gsm_umts/DetectedSet.h"
#include "LogGenerator/gsm_umts/EquivalentPLMNList.h"
#include "LogGenerator/gsm_umts/GPRSInformation.h"
#include "LogGenerator/gsm_umts/GSMRRInfo.h"
#include "LogGenerator/gsm_umts/GSMServingCell.h"
#include "LogGenerator/gsm_umts/GSMSet.h"
#include "LogGenerator/gsm_umts/HSDPAInformation.h"
#include "LogGenerator/gsm_umts/MobileAllocation.h"
#include "LogGenerator/gsm_umts/MonitoredSet.h"
#include "LogGenerator/gsm_umts/NeighboringCells.h"
#include "LogGenerator/gsm_umts/NonRankedGSMSet.h"
#include "LogGenerator/gsm_umts/NonRankedUMTSSet.h"
#include "LogGenerator/gsm_umts/ProcessCO.h"
#include "LogGenerator/gsm_umts/ProcessCS.h"
#include "LogGenerator/gsm_umts/ProcessPS.h"
#include "LogGenerator/gsm_umts/ServingPLMN.h"
#include "LogGenerator/gsm_umts/UMTSRRInfo.h"
#include "LogGenerator/gsm_umts/UMTSRRMeasurement.h"
#include "LogGenerator/gsm_umts/UMTSSet.h"
#include "LogGenerator/gsm_umts/VirtualActiveSet.h"
#include "LogGenerator/gsm_umts/records/ArfcnBsicRecord.h"
#include "LogGenerator/gsm_umts/records/BlerRecord.h"
#include "LogGenerator/gsm_umts/records/CellSetRecord.h"
#include "LogGenerator/gsm_umts/records/CipheringRecord.h"
#include "LogGenerator/gsm_umts/records/DedicatedMobileAllocationRecord.h"
#include "LogGenerator/gsm_umts/records/DtxRecord.h"
#include "LogGenerator/gsm_umts/records/EquivalentPlmnRecord.h"
#include "LogGenerator/gsm_umts/records/GmmStateRecord.h"
#include "LogGenerator/gsm_umts/records/GprsCellAccessRecord.h"
#include "LogGenerator/gsm_umts/records/GprsCellOptionsRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellIdentityRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellMeasurementRecord.h"
#include "LogGenerator/gsm_umts/records/HsdpaStatisticsRecord.h"
#include "LogGenerator/gsm_umts/records/MmStateRecord.h"
#include "LogGenerator/gsm_umts/records/MobileAllocationRecord.h"
#include "LogGenerator/gsm_umts/records/PacketSystemInfoRecord.h"
#include "LogGenerator/gsm_umts/records/PbcchRecord.h"
#include "LogGenerator/gsm_umts/records/PlmnSelectionModeRecord.h"
#include "LogGenerator/gsm_umts/records/RankedCellsRecord.h"
#include "LogGenerator/gsm_umts/records/RegistrationRecord.h"
#include "LogGenerator/gsm_umts/records/RrStateRecord.h"
#include "LogGenerator/gsm_umts/records/RrcStateRecord.h"
#include "LogGenerator/gsm_umts/records/Si13PositionRecord.h"
#include "LogGenerator/gsm_umts/records/TransmitPowerRecord.h"
#include "LogGenerator/gsm_umts/records/UmtsCellRecord.h"
#include "LogGenerator/shared/CellChangeCounters.h"
#include "LogGenerator/shared/CodingScheme.h"
#include "LogGenerator/shared/SharedSections.h"

namespace corvane {

namespace {

using namespace gsm_umts;
constexpr auto kRows = SectionContainer::Rows;
constexpr auto kList = SectionContainer::List;
constexpr auto kPlaceholder = SectionContainer::Placeholder;

// The sections of this technology, in their order.
constexpr SectionDescriptor kSections[] = {
    section<ActiveSet>("objActiveSet", "Active Set", {cell_set::kCode}, kList),
    section<CodingScheme>("objCodingScheme", "Coding Scheme", {}, kPlaceholder),
    section<GPRSInformation>("objGPRSInformation", "GPRS Information",
                             {gprs_access::kCode, registration::kCode, gprs_cell_options::kCode, pbcch::kCode,
                              packet_system_info::kCode, si13_position::kCode, gsm_cell_measurement::kCode},
                             kRows),
    section<GSMServingCell>("objGSMServingCell", "GSM Serving Cell",
                            {gsm_cell_identity::kCode, gsm_cell_measurement::kCode, dedicated_allocation::kCode,
                             kExtraCodeCellList},
                            kRows),
    section<MobileAllocation>("objMobileAllocation", "Mobile Allocation", {mobile_allocation::kCode}, kRows),
    section<NeighboringCells>("objNeighboringCells", "Neighboring Cells",
                              {gsm_cell_measurement::kCode, arfcn_bsic::kCode, kExtraCodeCellList}, kList),
    pdpContextListSection("objPDPContextList"),
    section<ProcessPS>("objProcessPS", "Process PS", {gmm_state::kCode, plmn_selection::kCode}, kRows),
    section<UMTSRRMeasurement>("objUMTSRRMeasurement", "UMTS RR Measurement", {}, kPlaceholder),
    section<CellChangeCounters>("objCellChangeCounter", "Cell Change Counters", {}, kPlaceholder),
    section<DetectedSet>("objDetectedSet", "Detected Set", {cell_set::kCode}, kList),
    section<GSMSet>("objGSMSet", "GSM Set", {ranked_cells::kCode}, kList),
    section<NonRankedGSMSet>("objNonRankedGSMSet", "Non-Ranked GSM Set", {}, kPlaceholder),
    section<ProcessCO>("objProcessCO", "Process CO", {mm_state::kCode, plmn_selection::kCode}, kRows),
    section<ServingPLMN>("objServingPLMN", "Serving PLMN",
                         {registration::kCode, plmn_selection::kCode, kExtraCodeCellList}, kRows),
    section<UMTSSet>("objUMTSSet", "UMTS Set", {ranked_cells::kCode, kExtraCodeCellList}, kList),
    section<EquivalentPLMNList>("objEquivalentPLMNList", "Equivalent PLMN List", {equivalent_plmn::kCode}, kList),
    section<GSMRRInfo>("objGSMRRInfo", "GSM RR Info",
                       {rr_state::kCode, gsm_cell_measurement::kCode, dtx::kCode, gprs_cell_options::kCode}, kRows),
    section<MonitoredSet>("objMonitoredSet", "Monitored Set", {cell_set::kCode}, kList),
    section<NonRankedUMTSSet>("objNonRankedUMTSSet", "Non-Ranked UMTS Set", {}, kPlaceholder),
    section<ProcessCS>("objProcessCS", "Process CS", {mm_state::kCode, plmn_selection::kCode}, kRows),
    section<UMTSRRInfo>("objUMTSRRInfo", "UMTS RR Info",
                        {rrc_state::kCode, transmit_power::kCode, umts_cell::kCode, ciphering::kCode,
                         kExtraCodeCellList},
                        kRows),
    section<BLER>("objBLER", "BLER", {bler::kCode}, kRows),
    section<VirtualActiveSet>("objVirtualActiveSet", "Virtual Active Set", {cell_set::kCode}, kList),
    simInfoSection("objSimInfo"),
    section<HSDPAInformation>("objHSDPAInformation", "HSDPA Info", {hsdpa_statistics::kCode}, kRows),
};

}  // namespace

SectionTable QND_GSMClassIndex::sections() { return kSections; }

QND_GSMClassIndex::QND_GSMClassIndex() : ClassIndex(kSections) {}

QND_GSMClassIndex::~QND_GSMClassIndex() {
  printTeardownLine("Deallocing QND_GSMClassIndex");
  releaseSections();
}

}  // namespace corvane
