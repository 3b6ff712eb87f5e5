#pragma once

// How the service writes SIM file contents as text: hex digits, upper case,
// and PLMN identities as the SIM codes them. Shared by the simulator's SIM and
// the SIM files of a real modem.

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace corvane::telephonyd {

// `value` as `bytes` bytes of upper-case hex text, the most significant first.
std::string hexBytes(std::uint64_t value, int bytes);

// The PLMN identity of an operator code (the MCC and MNC digits, 5 or 6 of
// them) as SIM files code it: 3 bytes of swapped BCD, F filling a 2-digit MNC,
// as hex text. Nothing for another text.
std::optional<std::string> plmnIdentity(std::string_view operatorCode);

}  // namespace corvane::telephonyd
