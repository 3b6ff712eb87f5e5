#include "tui/TerminalText.h"

#include <cwchar>

namespace corvane::tui {

namespace {

int charColumns(wchar_t c) {
  const int width = ::wcwidth(c);
  return width < 0 ? 1 : width;
}

}  // namespace

std::wstring widen(std::string_view utf8) {
  std::wstring out;
  out.reserve(utf8.size());
  std::mbstate_t state{};
  std::size_t at = 0;
  while (at < utf8.size()) {
    wchar_t c = 0;
    const std::size_t used = std::mbrtowc(&c, utf8.data() + at, utf8.size() - at, &state);
    if (used == static_cast<std::size_t>(-1) || used == static_cast<std::size_t>(-2)) {
      out.push_back(L'?');
      state = std::mbstate_t{};
      ++at;
      continue;
    }
    at += used == 0 ? 1 : used;
    // Control characters and what the terminal cannot show take one "?" each.
    out.push_back(::wcwidth(c) < 0 ? L'?' : c);
  }
  return out;
}

int columns(std::wstring_view text) {
  int total = 0;
  for (wchar_t c : text) total += charColumns(c);
  return total;
}

std::wstring slice(std::wstring_view text, int skip, int width) {
  std::wstring out;
  int column = 0;
  for (wchar_t c : text) {
    const int w = charColumns(c);
    if (column >= skip) {
      if (column - skip + w > width) break;
      out.push_back(c);
    }
    column += w;
  }
  return out;
}

std::wstring fit(std::wstring_view text, int width, std::wstring_view ellipsis) {
  if (width <= 0) return {};
  if (columns(text) <= width) return std::wstring(text);
  const int room = width - columns(ellipsis);
  if (room <= 0) return slice(text, 0, width);
  return slice(text, 0, room) + std::wstring(ellipsis);
}

}  // namespace corvane::tui
