#include "telephonyd/SimFileCoding.h"

#include <algorithm>

namespace corvane::telephonyd {

std::string hexBytes(std::uint64_t value, int bytes) {
  static constexpr char kDigits[] = "0123456789ABCDEF";
  std::string out;
  for (int i = bytes * 2 - 1; i >= 0; --i) out += kDigits[(value >> (4 * i)) & 0xF];
  return out;
}

std::optional<std::string> plmnIdentity(std::string_view operatorCode) {
  if (operatorCode.size() != 5 && operatorCode.size() != 6) return std::nullopt;
  if (!std::all_of(operatorCode.begin(), operatorCode.end(), [](char c) { return c >= '0' && c <= '9'; })) {
    return std::nullopt;
  }
  auto digit = [&](std::size_t i) -> std::uint64_t {
    return i < operatorCode.size() ? static_cast<std::uint64_t>(operatorCode[i] - '0') : 0xF;
  };
  // MCC 1 2 3, MNC 1 2 [3]: bytes MCC2|MCC1, MNC3|MCC3, MNC2|MNC1.
  return hexBytes((digit(1) << 4 | digit(0)) << 16 | (digit(5) << 4 | digit(2)) << 8 | (digit(4) << 4 | digit(3)),
                  3);
}

}  // namespace corvane::telephonyd
