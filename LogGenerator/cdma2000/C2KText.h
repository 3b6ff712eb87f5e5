#pragma once

// A display text of the CDMA2000 decoders, printed into the object itself:
// making one costs no heap allocation.

#include <algorithm>
#include <array>
#include <cstdarg>
#include <cstdio>
#include <string_view>

#include "LogGenerator/records/Field.h"

namespace corvane::c2k {

class PrintedText {
 public:
  PrintedText(const char* format, ...) __attribute__((format(printf, 2, 3))) {  // NOLINT: printf-like
    va_list args;
    va_start(args, format);
    const int n = std::vsnprintf(chars_.data(), chars_.size(), format, args);
    va_end(args);
    size_ = n < 0 ? 0 : std::min<std::size_t>(static_cast<std::size_t>(n), chars_.size() - 1);
  }
  std::string_view view() const { return {chars_.data(), size_}; }
  operator std::string_view() const { return view(); }

 private:
  std::array<char, 64> chars_{};
  std::size_t size_ = 0;
};

// A table field's text; a value outside the table shows the fallback with
// the value in place of its %d.
inline PrintedText tableText(const records::Field& field, std::uint32_t raw) {
  const auto& c = field.conversion;
  for (const auto& entry : c.table) {
    if (entry.value == raw) return PrintedText("%.*s", static_cast<int>(entry.text.size()), entry.text.data());
  }
  const std::size_t at = c.fallback.find("%d");
  const std::string_view before = c.fallback.substr(0, at);
  const std::string_view after = at == std::string_view::npos ? std::string_view() : c.fallback.substr(at + 2);
  return PrintedText("%.*s%d%.*s", static_cast<int>(before.size()), before.data(), static_cast<int>(raw),
                     static_cast<int>(after.size()), after.data());
}

}  // namespace corvane::c2k
