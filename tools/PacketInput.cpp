#include "PacketInput.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>

#include "platform/PropertyList.h"

namespace corvane::tools {

namespace {

int hexDigit(char c) {
  if (c >= '0' && c <= '9') return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  if (c >= 'A' && c <= 'F') return c - 'A' + 10;
  return -1;
}

bool isSeparator(char c) { return c == ' ' || c == '\t' || c == ':'; }

std::string_view trim(std::string_view s) {
  while (!s.empty() && (s.front() == ' ' || s.front() == '\t')) s.remove_prefix(1);
  while (!s.empty() && (s.back() == ' ' || s.back() == '\t' || s.back() == '\r')) s.remove_suffix(1);
  return s;
}

bool isText(std::span<const std::uint8_t> contents) {
  for (std::uint8_t b : contents) {
    if (b == 0 || (b < 0x20 && b != '\n' && b != '\r' && b != '\t')) return false;
  }
  return true;
}

}  // namespace

std::optional<Bytes> parseHexLine(std::string_view line, std::string& reason) {
  Bytes out;
  if (!parseHexLineInto(line, out, reason)) return std::nullopt;
  return out;
}

bool parseHexLineInto(std::string_view line, Bytes& out, std::string& reason) {
  out.clear();
  int pending = -1;  // the high nibble of a byte being read
  for (std::size_t i = 0; i < line.size(); ++i) {
    const char c = line[i];
    if (isSeparator(c)) {
      if (pending >= 0) {
        reason = "separator inside a byte at column " + std::to_string(i + 1);
        return false;
      }
      continue;
    }
    const int d = hexDigit(c);
    if (d < 0) {
      reason = "'" + std::string(1, c) + "' is not a hex digit (column " + std::to_string(i + 1) + ")";
      return false;
    }
    if (pending < 0) {
      pending = d;
    } else {
      out.push_back(static_cast<std::uint8_t>(pending * 16 + d));
      pending = -1;
    }
  }
  if (pending >= 0) {
    reason = "odd number of hex digits";
    return false;
  }
  return true;
}

InputFormat detectInputFormat(std::span<const std::uint8_t> contents) {
  if (plist::looksLikePropertyList(contents)) {
    const auto root = plist::parse(contents);
    return root && isSnapshot(*root) ? InputFormat::Snapshot : InputFormat::PropertyList;
  }
  return isText(contents) ? InputFormat::HexText : InputFormat::Dlf;
}

std::optional<PacketList> packetsFromContents(std::span<const std::uint8_t> contents, const std::string& source,
                                              InputError& error) {
  if (plist::looksLikePropertyList(contents)) {
    std::string reason;
    const auto root = plist::parse(contents, &reason);
    if (!root) {
      error.message = source + ": " + reason;
      return std::nullopt;
    }
    if (isSnapshot(*root)) return packetsFromSnapshot(*root, source, error);
    return PacketList{{Bytes(contents.begin(), contents.end())}, {}};
  }
  if (!isText(contents)) return packetsFromDlf(contents, source, error);

  PacketList list;
  const std::string_view text(reinterpret_cast<const char*>(contents.data()), contents.size());
  std::size_t lineNumber = 0;
  std::size_t start = 0;
  while (start < text.size()) {
    std::size_t end = text.find('\n', start);
    if (end == std::string_view::npos) end = text.size();
    ++lineNumber;
    const std::string_view line = trim(text.substr(start, end - start));
    start = end + 1;
    if (line.empty() || line.front() == '#') continue;
    std::string reason;
    auto packet = parseHexLine(line, reason);
    if (!packet) {
      error.message = source + ":" + std::to_string(lineNumber) + ": bad hex line: " + reason;
      return std::nullopt;
    }
    list.packets.push_back(std::move(*packet));
  }
  return list;
}

std::optional<Bytes> readInput(const std::string& path, InputError& error) {
  if (path == "-") {
    std::cin >> std::noskipws;
    std::istreambuf_iterator<char> begin(std::cin), end;
    std::string s(begin, end);
    if (std::cin.bad()) {
      error.message = "standard input: cannot read";
      return std::nullopt;
    }
    return Bytes(s.begin(), s.end());
  }
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    error.message = path + ": cannot open: " + std::strerror(errno);
    return std::nullopt;
  }
  std::string s((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  if (in.bad()) {
    error.message = path + ": cannot read: " + std::strerror(errno);
    return std::nullopt;
  }
  return Bytes(s.begin(), s.end());
}

}  // namespace corvane::tools
