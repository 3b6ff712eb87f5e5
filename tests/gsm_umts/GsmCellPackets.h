#pragma once

// GSM cell records laid out by hand for the tests of "GSM Serving Cell",
// "Neighboring Cells", "GSM RR Info" and "GPRS Information".

#include <cstdint>
#include <vector>

#include "support/Packets.h"

namespace corvane::test {

struct GsmNeighbor {
  std::uint16_t arfcn = 0;
  std::uint8_t rssi = 0;
  std::int32_t c1 = 0;
};

// 0x5137: the serving cell's RSSI at 15, C1 at 16, C2 at 20 (32 bits each),
// the number of neighbours at 28, then 14 bytes a neighbour from 29: ARFCN
// (16 bits), RSSI (8 bits), C1 (32 bits), seven bytes not shown.
inline Bytes gsmMeasurementPacket(std::uint8_t servingRssi, std::int32_t c1, std::int32_t c2,
                                  const std::vector<GsmNeighbor>& neighbors = {}) {
  Bytes p = logPacket(0x5137, 29 + 14 * neighbors.size());
  p[15] = servingRssi;
  put32(p, 16, static_cast<std::uint32_t>(c1));
  put32(p, 20, static_cast<std::uint32_t>(c2));
  p[28] = static_cast<std::uint8_t>(neighbors.size());
  std::size_t at = 29;
  for (const GsmNeighbor& n : neighbors) {
    put16(p, at, n.arfcn);
    p[at + 2] = n.rssi;
    put32(p, at + 3, static_cast<std::uint32_t>(n.c1));
    for (std::size_t unshown = 7; unshown < 14; ++unshown) p[at + unshown] = 0xEE;
    at += 14;
  }
  return p;
}

// 0x51F6, the GPRS cell options: T3192 at 15, the DRX timer at 16, the
// access burst type at 17; 24 bytes.
inline Bytes gprsCellOptionsPacket(std::uint8_t t3192, std::uint8_t drx = 0, std::uint8_t burst = 0) {
  Bytes p = logPacket(0x51F6, 24);
  p[15] = t3192;
  p[16] = drx;
  p[17] = burst;
  return p;
}

}  // namespace corvane::test
