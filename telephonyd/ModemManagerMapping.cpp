#include "telephonyd/ModemManagerMapping.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <span>

#include "platform/CellMonitor.h"
#include "telephonyd/SimFileCoding.h"

namespace corvane::telephonyd::modem {

namespace {

// How a ModemManager cell field becomes a cell-monitor number.
enum class Conversion {
  HexNumber,  // an identity ModemManager gives as hex text (LAC, TAC, cell id, PCI, SID ...)
  Number,     // a whole number (a channel number, a scrambling code)
  Decibels,   // a level in dBm or dB, rounded to a whole number
  RxLevel,    // a GSM RXLEV (0-63, -110 dBm and up), as the cell monitor's RSSI: half the dBm
  Mcc,        // the country code of the operator id
  Mnc,        // the network code of the operator id
  LteBand,    // the band of a downlink E-ARFCN
};

struct CellKeyRow {
  std::string_view field;  // in ModemManager's cell dictionary
  std::string_view key;    // in the cell-monitor dictionary
  Conversion conversion;
};

constexpr CellKeyRow kGsmRows[] = {
    {"operator-id", CellMonitorMCC, Conversion::Mcc},  {"operator-id", CellMonitorMNC, Conversion::Mnc},
    {"lac", CellMonitorLAC, Conversion::HexNumber},    {"ci", CellMonitorCellId, Conversion::HexNumber},
    {"arfcn", CellMonitorARFCN, Conversion::Number},   {"rx-level", CellMonitorRSSI, Conversion::RxLevel},
};
constexpr CellKeyRow kUmtsRows[] = {
    {"operator-id", CellMonitorMCC, Conversion::Mcc}, {"operator-id", CellMonitorMNC, Conversion::Mnc},
    {"lac", CellMonitorLAC, Conversion::HexNumber},   {"ci", CellMonitorCellId, Conversion::HexNumber},
    {"uarfcn", CellMonitorUARFCN, Conversion::Number}, {"psc", CellMonitorSCN, Conversion::Number},
    {"rscp", CellMonitorRSCP, Conversion::Decibels},  {"ecio", CellMonitorECN0, Conversion::Decibels},
};
// TD-SCDMA is the UTRAN2 phone's access technology; its cell parameter id stands where UMTS has the scrambling code.
constexpr CellKeyRow kTdscdmaRows[] = {
    {"operator-id", CellMonitorMCC, Conversion::Mcc},  {"operator-id", CellMonitorMNC, Conversion::Mnc},
    {"lac", CellMonitorLAC, Conversion::HexNumber},    {"ci", CellMonitorCellId, Conversion::HexNumber},
    {"uarfcn", CellMonitorUARFCN, Conversion::Number}, {"cell-parameter-id", CellMonitorSCN, Conversion::Number},
    {"rscp", CellMonitorRSCP, Conversion::Decibels},
};
// The LTE sections read the E-ARFCN under CellMonitorUARFCN. RSRP and RSRQ have no cell-monitor key.
constexpr CellKeyRow kLteRows[] = {
    {"operator-id", CellMonitorMCC, Conversion::Mcc},      {"operator-id", CellMonitorMNC, Conversion::Mnc},
    {"tac", CellMonitorTAC, Conversion::HexNumber},        {"ci", CellMonitorCellId, Conversion::HexNumber},
    {"physical-ci", CellMonitorPID, Conversion::HexNumber}, {"earfcn", CellMonitorUARFCN, Conversion::Number},
    {"earfcn", CellMonitorBandInfo, Conversion::LteBand},
};
// As the CDMA2000 cell list holds them: the SID as the LAC, the base station
// id as the cell id, the PN offset as the PID.
constexpr CellKeyRow kCdmaRows[] = {
    {"sid", CellMonitorLAC, Conversion::HexNumber},
    {"base-station-id", CellMonitorCellId, Conversion::HexNumber},
    {"ref-pn", CellMonitorPID, Conversion::HexNumber},
};

struct CellTypeRow {
  CellType type;
  std::string_view technology;
  std::span<const CellKeyRow> rows;
};

constexpr CellTypeRow kCellTypes[] = {
    {CellType::Gsm, CellMonitorRadioAccessTechnologyGSM, kGsmRows},
    {CellType::Umts, CellMonitorRadioAccessTechnologyUMTS, kUmtsRows},
    {CellType::Tdscdma, CellMonitorRadioAccessTechnologyUTRAN2, kTdscdmaRows},
    {CellType::Lte, CellMonitorRadioAccessTechnologyLTE, kLteRows},
    {CellType::Cdma, CellMonitorRadioAccessTechnologyCDMA, kCdmaRows},
};

// Downlink E-ARFCN ranges of the LTE bands.
struct LteBandRange {
  int band;
  std::uint64_t first;
  std::uint64_t last;
};
constexpr LteBandRange kLteBands[] = {
    {1, 0, 599},           {2, 600, 1199},        {3, 1200, 1949},       {4, 1950, 2399},       {5, 2400, 2649},
    {6, 2650, 2749},       {7, 2750, 3449},       {8, 3450, 3799},       {9, 3800, 4149},       {10, 4150, 4749},
    {11, 4750, 4949},      {12, 5010, 5179},      {13, 5180, 5279},      {14, 5280, 5379},      {17, 5730, 5849},
    {18, 5850, 5999},      {19, 6000, 6149},      {20, 6150, 6449},      {21, 6450, 6599},      {22, 6600, 7399},
    {23, 7500, 7699},      {24, 7700, 8039},      {25, 8040, 8689},      {26, 8690, 9039},      {27, 9040, 9209},
    {28, 9210, 9659},      {29, 9660, 9769},      {30, 9770, 9869},      {31, 9870, 9919},      {32, 9920, 10359},
    {33, 36000, 36199},    {34, 36200, 36349},    {35, 36350, 36949},    {36, 36950, 37549},    {37, 37550, 37749},
    {38, 37750, 38249},    {39, 38250, 38649},    {40, 38650, 39649},    {41, 39650, 41589},    {42, 41590, 43589},
    {43, 43590, 45589},    {44, 45590, 46589},    {45, 46590, 46789},    {46, 46790, 54539},    {47, 54540, 55239},
    {48, 55240, 56739},    {65, 65536, 66435},    {66, 66436, 67335},    {67, 67336, 67535},    {68, 67536, 67835},
    {69, 67836, 68335},    {70, 68336, 68585},    {71, 68586, 68935},
};

// ModemManager's access technologies as the 2-byte access technology identifier of a PLMN selector entry.
struct AccessTechnologyRow {
  std::uint32_t modemBits;
  std::uint16_t selectorBits;
};
constexpr AccessTechnologyRow kAccessTechnologies[] = {
    {kAccessUmts, 0x8000}, {kAccessLte, 0x4000}, {kAccess5gNr, 0x0800},
    {kAccessGsm, 0x0080},  {kAccessGsmCompact, 0x0040},
};

struct IpTypeRow {
  std::uint32_t family;
  std::string_view text;
};
constexpr IpTypeRow kIpTypes[] = {
    {kIpFamilyIpv4, "IPv4"}, {kIpFamilyIpv6, "IPv6"}, {kIpFamilyIpv4v6, "IPv4v6"}, {kIpFamilyNonIp, "Non-IP"}};

const std::string* text(const Field& field) { return std::get_if<std::string>(&field); }

std::optional<double> number(const Field& field) {
  if (const auto* u = std::get_if<std::uint64_t>(&field)) return static_cast<double>(*u);
  if (const auto* i = std::get_if<std::int64_t>(&field)) return static_cast<double>(*i);
  if (const auto* d = std::get_if<double>(&field)) return *d;
  return std::nullopt;
}

std::optional<std::uint64_t> wholeNumber(const Field& field) {
  if (const auto* u = std::get_if<std::uint64_t>(&field)) return *u;
  if (const auto* i = std::get_if<std::int64_t>(&field); i && *i >= 0) return static_cast<std::uint64_t>(*i);
  return std::nullopt;
}

std::optional<std::uint64_t> hexNumber(const Field& field) {
  const std::string* s = text(field);
  if (!s || s->empty()) return std::nullopt;
  std::uint64_t value = 0;
  const auto [end, error] = std::from_chars(s->data(), s->data() + s->size(), value, 16);
  if (error != std::errc() || end != s->data() + s->size()) return std::nullopt;
  return value;
}

bool allDigits(std::string_view s) {
  return !s.empty() && std::all_of(s.begin(), s.end(), [](char c) { return c >= '0' && c <= '9'; });
}

std::optional<std::int64_t> operatorPart(const Field& field, bool country) {
  const std::string* s = text(field);
  if (!s || (s->size() != 5 && s->size() != 6) || !allDigits(*s)) return std::nullopt;
  const std::string part = country ? s->substr(0, 3) : s->substr(3);
  return std::stoll(part);
}

// A number the cell monitor can read (as a signed 32-bit integer); nothing for a larger one.
std::optional<std::int64_t> fitting(std::optional<std::uint64_t> value) {
  if (!value || *value > static_cast<std::uint64_t>(std::numeric_limits<std::int32_t>::max())) return std::nullopt;
  return static_cast<std::int64_t>(*value);
}

std::optional<std::int64_t> convert(const Field& field, Conversion conversion) {
  switch (conversion) {
    case Conversion::HexNumber:
      return fitting(hexNumber(field));
    case Conversion::Number:
      return fitting(wholeNumber(field));
    case Conversion::Decibels:
      if (auto v = number(field); v && std::isfinite(*v) && std::abs(*v) < 1000) return std::lround(*v);
      return std::nullopt;
    case Conversion::RxLevel:
      if (auto v = wholeNumber(field); v && *v <= 63) return std::lround((static_cast<double>(*v) - 110) / 2);
      return std::nullopt;
    case Conversion::Mcc:
      return operatorPart(field, true);
    case Conversion::Mnc:
      return operatorPart(field, false);
    case Conversion::LteBand:
      if (auto v = wholeNumber(field)) {
        if (auto band = lteBandOfEarfcn(*v)) return *band;
      }
      return std::nullopt;
  }
  return std::nullopt;
}

const CellTypeRow* cellTypeRow(const Fields& cell) {
  const auto it = cell.find("cell-type");
  if (it == cell.end()) return nullptr;
  const auto type = wholeNumber(it->second);
  if (!type) return nullptr;
  for (const CellTypeRow& row : kCellTypes) {
    if (static_cast<std::uint64_t>(row.type) == *type) return &row;
  }
  return nullptr;
}

bool isServing(const Fields& cell) {
  const auto it = cell.find("serving");
  const bool* serving = it == cell.end() ? nullptr : std::get_if<bool>(&it->second);
  return serving && *serving;
}

std::string_view ipTypeText(std::uint32_t family) {
  for (const IpTypeRow& row : kIpTypes) {
    if (row.family == family) return row.text;
  }
  return {};
}

}  // namespace

std::optional<int> lteBandOfEarfcn(std::uint64_t earfcn) {
  for (const LteBandRange& range : kLteBands) {
    if (earfcn >= range.first && earfcn <= range.last) return range.band;
  }
  return std::nullopt;
}

Dictionary simFiles(const SimState& sim) {
  Dictionary files;
  if (sim.iccid && !sim.iccid->empty()) files.set("kSimFile_ICCID", Value(*sim.iccid));
  std::string numbers;
  for (const std::string& number : sim.ownNumbers) {
    if (number.empty()) continue;
    numbers += (numbers.empty() ? "" : ", ") + number;
  }
  if (!numbers.empty()) files.set("kSimFile_MSISDN", Value(numbers));
  if (sim.operatorIdentifier) {
    if (auto home = plmnIdentity(*sim.operatorIdentifier)) files.set("kSimFile_AHPLMN", Value(*home));
  }
  std::string selector;
  for (const PreferredNetwork& network : sim.preferredNetworks) {
    const auto identity = plmnIdentity(network.operatorCode);
    if (!identity) continue;
    std::uint16_t access = 0;
    for (const AccessTechnologyRow& row : kAccessTechnologies) {
      if (network.accessTechnologies & row.modemBits) access |= row.selectorBits;
    }
    selector += *identity + hexBytes(access, 2);
  }
  if (!selector.empty()) files.set("kSimFile_OPLMNAcT", Value(selector));
  return files;
}

std::optional<Dictionary> cellMonitorCell(const Fields& cell) {
  const CellTypeRow* type = cellTypeRow(cell);
  if (!type) return std::nullopt;
  Dictionary fields;
  fields.set(CellMonitorCellRadioAccessTechnology, Value(type->technology));
  fields.set(CellMonitorCellType, Value(isServing(cell) ? CellMonitorCellTypeServing : CellMonitorCellTypeNeighbor));
  for (const CellKeyRow& row : type->rows) {
    const auto it = cell.find(row.field);
    if (it == cell.end()) continue;
    if (const auto value = convert(it->second, row.conversion)) fields.set(row.key, Value::integer(*value));
  }
  return fields;
}

Array cellMonitorList(const std::vector<Fields>& cells) {
  Array list;
  for (const bool serving : {true, false}) {
    for (const Fields& cell : cells) {
      if (isServing(cell) != serving) continue;
      if (auto fields = cellMonitorCell(cell)) list.append(Value(*fields));
    }
  }
  return list;
}

Array pdpContexts(const std::vector<Profile>& profiles, const std::vector<Bearer>& bearers) {
  auto context = [](std::optional<int> id, const std::optional<std::string>& apn, std::uint32_t ipType,
                    const Bearer* bearer) {
    Dictionary fields;
    if (id) fields.set("Context ID", Value(std::to_string(*id)));
    const std::optional<std::string>& name = apn ? apn : bearer ? bearer->apn : apn;
    if (name) fields.set("APN", Value(*name));
    const std::string_view type = ipTypeText(ipType ? ipType : bearer ? bearer->ipType : 0);
    if (!type.empty()) fields.set("PDP Type", Value(type));
    fields.set("Connected", Value(bearer && bearer->connected ? "Yes" : "No"));
    if (bearer && bearer->connected) {
      std::string addresses;
      for (const auto* address : {&bearer->ipv4Address, &bearer->ipv6Address}) {
        if (*address && !(*address)->empty()) addresses += (addresses.empty() ? "" : ", ") + **address;
      }
      if (!addresses.empty()) fields.set("PDP Address", Value(addresses));
      if (bearer->interface && !bearer->interface->empty()) fields.set("Interface", Value(*bearer->interface));
    }
    return Value(fields);
  };

  std::vector<const Profile*> ordered;
  for (const Profile& profile : profiles) ordered.push_back(&profile);
  std::stable_sort(ordered.begin(), ordered.end(), [](const Profile* a, const Profile* b) { return a->id < b->id; });
  Array contexts;
  std::vector<bool> described(bearers.size(), false);
  for (const Profile* profile : ordered) {
    // The bearer of the profile: a connected one before one that is not.
    const Bearer* bearer = nullptr;
    for (std::size_t i = 0; i < bearers.size(); ++i) {
      if (bearers[i].profileId != profile->id) continue;
      described[i] = true;
      if (!bearer || (!bearer->connected && bearers[i].connected)) bearer = &bearers[i];
    }
    contexts.append(context(profile->id, profile->apn, profile->ipType, bearer));
  }
  for (std::size_t i = 0; i < bearers.size(); ++i) {
    if (!described[i]) contexts.append(context(bearers[i].profileId, std::nullopt, 0, &bearers[i]));
  }
  return contexts;
}

std::optional<std::size_t> chooseModem(const std::vector<ModemCandidate>& modems, std::string_view choice,
                                       const std::vector<std::string>& diagPorts, std::string& why) {
  if (modems.empty()) {
    why = "ModemManager knows no modem";
    return std::nullopt;
  }
  if (!choice.empty()) {
    for (std::size_t i = 0; i < modems.size(); ++i) {
      const std::string& path = modems[i].path;
      const std::size_t slash = path.rfind('/');
      const std::string_view index = slash == std::string::npos ? std::string_view() : std::string_view(path).substr(slash + 1);
      if (index == choice || path == choice || modems[i].equipmentIdentifier == choice) return i;
    }
    why = "ModemManager knows no modem " + std::string(choice);
    return std::nullopt;
  }
  for (std::size_t i = 0; i < modems.size(); ++i) {
    for (const std::string& port : modems[i].ports) {
      if (std::find(diagPorts.begin(), diagPorts.end(), port) != diagPorts.end()) return i;
    }
  }
  if (modems.size() == 1) return 0;
  why = "ModemManager knows " + std::to_string(modems.size()) +
        " modems and none has the diagnostic port among its ports; choose one with --modem";
  return std::nullopt;
}

}  // namespace corvane::telephonyd::modem
