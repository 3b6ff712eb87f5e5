#pragma once

// What ModemManager tells of a modem, as plain values, and the tables that
// turn it into the service's three extra codes: the SIM files (0xFF0000), the
// cell-monitor cell list (0xFF0001) and the PDP contexts (0xFF0002).
//
// Nothing here knows D-Bus: the client (ModemManagerClient) fills these
// structures from ModemManager's objects, and what ModemManager does not say
// stays missing here and is left out of the dictionaries, never made up.

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "platform/Value.h"

namespace corvane::telephonyd::modem {

// One value of a ModemManager dictionary (a{sv}), as it came.
using Field = std::variant<std::string, std::uint64_t, std::int64_t, double, bool>;
// A ModemManager dictionary by key, such as one cell of the modem's cell information.
using Fields = std::map<std::string, Field, std::less<>>;

// ModemManager's cell types (the "cell-type" of a cell's dictionary).
enum class CellType : std::uint32_t { Unknown = 0, Cdma = 1, Gsm = 2, Umts = 3, Tdscdma = 4, Lte = 5, Nr5g = 6 };

// ModemManager's access-technology bits, as far as a preferred network lists them.
inline constexpr std::uint32_t kAccessGsm = 1u << 1;
inline constexpr std::uint32_t kAccessGsmCompact = 1u << 2;
inline constexpr std::uint32_t kAccessUmts = 1u << 5;
inline constexpr std::uint32_t kAccessLte = 1u << 14;
inline constexpr std::uint32_t kAccess5gNr = 1u << 15;

// ModemManager's IP families of a bearer or profile.
inline constexpr std::uint32_t kIpFamilyIpv4 = 1u << 0;
inline constexpr std::uint32_t kIpFamilyIpv6 = 1u << 1;
inline constexpr std::uint32_t kIpFamilyIpv4v6 = 1u << 2;
inline constexpr std::uint32_t kIpFamilyNonIp = 1u << 3;

struct PreferredNetwork {
  std::string operatorCode;            // MCC and MNC digits, such as "00101"
  std::uint32_t accessTechnologies = 0;  // kAccess... bits
  friend bool operator==(const PreferredNetwork&, const PreferredNetwork&) = default;
};

// The SIM and the modem's own numbers.
struct SimState {
  std::optional<std::string> iccid;               // the SIM identifier
  std::vector<std::string> ownNumbers;            // the modem's own numbers (MSISDN)
  std::optional<std::string> operatorIdentifier;  // the home network's MCC and MNC digits
  std::vector<PreferredNetwork> preferredNetworks;
  friend bool operator==(const SimState&, const SimState&) = default;
};

// A 3GPP profile of the modem's profile manager.
struct Profile {
  int id = 0;
  std::optional<std::string> apn;
  std::uint32_t ipType = 0;  // kIpFamily... bits; 0 when not said
  friend bool operator==(const Profile&, const Profile&) = default;
};

// A bearer of the modem.
struct Bearer {
  std::optional<int> profileId;  // the profile it was connected with, when ModemManager says
  std::optional<std::string> apn;
  std::uint32_t ipType = 0;
  bool connected = false;
  std::optional<std::string> interface;  // the network interface, while connected
  std::optional<std::string> ipv4Address;
  std::optional<int> ipv4Prefix;
  std::optional<std::string> ipv6Address;
  std::optional<int> ipv6Prefix;
  friend bool operator==(const Bearer&, const Bearer&) = default;
};

// The SIM-file dictionary: "kSimFile_ICCID" from the SIM identifier,
// "kSimFile_MSISDN" from the own numbers (comma-separated), "kSimFile_AHPLMN"
// as the coded PLMN identity of the home network, "kSimFile_OPLMNAcT" as the
// coded preferred networks with their access technologies. Keys without a
// source are left out.
Dictionary simFiles(const SimState& sim);

// One cell-monitor cell dictionary; nothing for a cell type the cell monitor
// has no technology value for (5G NR, unknown).
std::optional<Dictionary> cellMonitorCell(const Fields& cell);
// The cell-monitor list: the serving cells first, then the neighbours, each
// group in ModemManager's order; cells of types without a technology value
// are left out.
Array cellMonitorList(const std::vector<Fields>& cells);

// The PDP contexts: one per profile and one per bearer that no profile
// describes, in profile id order, then the bearers in their order. Each
// context is a dictionary of strings: "Context ID", "APN", "PDP Type",
// "Connected" ("Yes" or "No"), "PDP Address" (the addresses with their
// prefix lengths, IPv4 first) and "Interface", each only when known.
Array pdpContexts(const std::vector<Profile>& profiles, const std::vector<Bearer>& bearers);

// A modem ModemManager knows of, as far as choosing one needs.
struct ModemCandidate {
  std::string path;                 // its object path, such as /org/freedesktop/ModemManager1/Modem/0
  std::string equipmentIdentifier;  // the IMEI (or ESN, MEID)
  std::vector<std::string> ports;   // port names, such as "ttyUSB0" or "wwan0qcdm0"
};

// The modem to use, by its place in `modems`. `choice` (--modem) names it by
// the index ending its object path, by its object path or by its IMEI; empty:
// the one whose ports include one of `diagPorts` (the names of the diagnostic
// device and of what it links to), else the only one. Nothing, with `why` set
// to a sentence for the log, when none fits.
std::optional<std::size_t> chooseModem(const std::vector<ModemCandidate>& modems, std::string_view choice,
                                       const std::vector<std::string>& diagPorts, std::string& why);

// The LTE band of a downlink E-ARFCN; nothing for one outside the bands known.
std::optional<int> lteBandOfEarfcn(std::uint64_t earfcn);

}  // namespace corvane::telephonyd::modem
