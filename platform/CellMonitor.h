#pragma once

// The cell-monitor keys and values of the cell list (extra code 0xFF0001),
// shared by the service that writes the list and the decoders that read it.
// Each key and each value is the text of its name.

#include <cstdint>
#include <string_view>

namespace corvane {

// Keys of a cell dictionary.
inline constexpr std::string_view CellMonitorCellRadioAccessTechnology = "CellMonitorCellRadioAccessTechnology";
inline constexpr std::string_view CellMonitorCellType = "CellMonitorCellType";
inline constexpr std::string_view CellMonitorMCC = "CellMonitorMCC";
inline constexpr std::string_view CellMonitorMNC = "CellMonitorMNC";
inline constexpr std::string_view CellMonitorLAC = "CellMonitorLAC";
inline constexpr std::string_view CellMonitorTAC = "CellMonitorTAC";
inline constexpr std::string_view CellMonitorCellId = "CellMonitorCellId";
inline constexpr std::string_view CellMonitorPID = "CellMonitorPID";
inline constexpr std::string_view CellMonitorARFCN = "CellMonitorARFCN";
inline constexpr std::string_view CellMonitorUARFCN = "CellMonitorUARFCN";
inline constexpr std::string_view CellMonitorBandInfo = "CellMonitorBandInfo";
inline constexpr std::string_view CellMonitorRSSI = "CellMonitorRSSI";
inline constexpr std::string_view CellMonitorSCN = "CellMonitorSCN";
inline constexpr std::string_view CellMonitorRSCP = "CellMonitorRSCP";
inline constexpr std::string_view CellMonitorECN0 = "CellMonitorECN0";

// Values of CellMonitorCellRadioAccessTechnology.
inline constexpr std::string_view CellMonitorRadioAccessTechnologyGSM = "CellMonitorRadioAccessTechnologyGSM";
inline constexpr std::string_view CellMonitorRadioAccessTechnologyUMTS = "CellMonitorRadioAccessTechnologyUMTS";
inline constexpr std::string_view CellMonitorRadioAccessTechnologyUTRAN2 = "CellMonitorRadioAccessTechnologyUTRAN2";
inline constexpr std::string_view CellMonitorRadioAccessTechnologyLTE = "CellMonitorRadioAccessTechnologyLTE";
inline constexpr std::string_view CellMonitorRadioAccessTechnologyCDMA = "CellMonitorRadioAccessTechnologyCDMA";

// Values of CellMonitorCellType.
inline constexpr std::string_view CellMonitorCellTypeServing = "CellMonitorCellTypeServing";
inline constexpr std::string_view CellMonitorCellTypeNeighbor = "CellMonitorCellTypeNeighbor";

// A measured value (RSSI, RSCP, ECN0) that was not measured.
inline constexpr std::int64_t kCellMonitorNotMeasured = 32767;

}  // namespace corvane
