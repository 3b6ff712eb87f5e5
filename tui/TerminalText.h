#pragma once

// Text for a terminal cell grid: UTF-8 turned into wide characters that each
// take their display width, and cut to a number of columns. On a terminal
// that is not UTF-8, or for bytes that are no valid UTF-8, what cannot be
// shown becomes "?".

#include <string>
#include <string_view>

namespace corvane::tui {

std::wstring widen(std::string_view utf8);
// Columns that `text` takes.
int columns(std::wstring_view text);
// The part of `text` that starts `skip` columns in and fits `width` columns.
std::wstring slice(std::wstring_view text, int skip, int width);
// `text` fitted into `width` columns: cut with `ellipsis` at the end when too long.
std::wstring fit(std::wstring_view text, int width, std::wstring_view ellipsis);

}  // namespace corvane::tui
