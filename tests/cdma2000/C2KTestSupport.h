#pragma once

// The CDMA2000 generator over a template whose "Rows" dictionary names every
// lookup key under a label equal to the key, and packets laid out by hand from
// the record tables: the 17-byte header of the sub-packet records and their
// sub-packets (id, a spare byte, 16-bit size including these four bytes).

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "platform/Log.h"
#include "support/Packets.h"

namespace corvane::test {

inline const std::vector<std::string>& c2kLookupKeys() {
  static const std::vector<std::string> kKeys = {
      "kChannel",        "k1xEVDODeviceState", "kBandClass",       "kRxAGC0",         "kRxAGC1",
      "kTxAGC",          "kServingPNOffset",   "kSessionState",    "kUATI24",         "kColorCode",
      "kActiveSetPilots", "kFingerC2I",        "k1xDeviceState",   "k1xRx0BandClass", "k1xRx0ChanNum",
      "k1xRxAGC0",       "k1xRx1BandClass",    "k1xRx1ChanNum",    "k1xRxAGC1",       "k1xTxAGC",
      "k1xActiveSetInfo", "k1xTrafficFER",     "k1xRoamingHome",   "kSystemId",       "kNetworkId",
      "kPacketZoneId",   "kBaseId",            "kProtocolRevision", "kFLDataRate",    "kRLDataRate",
  };
  return kKeys;
}

// A sub-packet of `size` bytes: its header, the rest zero.
inline Bytes subpacket(std::uint8_t id, std::size_t size) {
  Bytes s(size, 0);
  s.at(0) = id;
  s.at(2) = static_cast<std::uint8_t>(size & 0xFF);
  s.at(3) = static_cast<std::uint8_t>(size >> 8);
  return s;
}

// A sub-packet record: the 17-byte header with the count at 14, then the sub-packets.
inline Bytes subpacketRecord(std::uint16_t code, const std::vector<Bytes>& subpackets) {
  std::size_t size = 17;
  for (const Bytes& s : subpackets) size += s.size();
  Bytes p = logPacket(code, size);
  p[14] = static_cast<std::uint8_t>(subpackets.size());
  std::size_t at = 17;
  for (const Bytes& s : subpackets) {
    std::copy(s.begin(), s.end(), p.begin() + static_cast<std::ptrdiff_t>(at));
    at += s.size();
  }
  return p;
}

class C2KTest : public ::testing::Test {
 protected:
  C2KTest() {
    log::ScopedCapture quiet;
    Dictionary rows;
    for (const std::string& key : c2kLookupKeys()) rows.set(key, Value(key));
    Dictionary root;
    root.set("Rows", Value(rows));
    state.set("Template", Value(root));
    C2KLogGenerator::getDisplayFromState(state);
  }

  void feed(const Bytes& packet) { generator.updateState(state, packet); }

  Dictionary rows() const {
    const Value display = state.get("Display");
    const Value rows = display.asDictionary()->get("Rows");
    return *rows.asDictionary();
  }
  std::string row(const std::string& key) const {
    const Value v = rows().get(key);
    return v.asString() ? *v.asString() : "<not a string>";
  }
  // A per-pilot list as "key=text" lines in the dictionary's order.
  std::vector<std::string> list(const std::string& key) const {
    std::vector<std::string> lines;
    const Value v = rows().get(key);
    if (const Dictionary* d = v.asDictionary()) {
      for (const auto& [k, text] : d->entries()) lines.push_back(k + "=" + (text.asString() ? *text.asString() : "?"));
    }
    return lines;
  }
  Dictionary extraInfo() const {
    const Value extra = state.get("ExtraInfo");
    return *extra.asDictionary();
  }

  C2KLogGenerator generator;
  Dictionary state;
};

}  // namespace corvane::test
