// "Serving Cell Measurements": eighteen rows from bit fields of 0xB17F.

#include "LogGenerator/lte/ServingCellMeasurement.h"

#include "lte/LteSectionFixture.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::logPacket;
using test::put16;
using test::put32;
using test::rowText;

using ServingMeasurement = test::LteSectionTest<ServingCellMeasurement>;

// The fields of one record, packed where the baseband puts them.
struct Fields {
  std::uint8_t version = 3;
  std::uint16_t earfcn = 6300;
  std::uint32_t physicalCellId = 301;  // 9 bits
  std::uint32_t layerPriority = 5;     // 4 bits
  std::uint32_t measuredRsrp = 100;    // 9 bits
  std::uint32_t averageRsrp = 120;     // 9 bits
  std::uint32_t measuredRsrq = 40;     // 7 bits
  std::uint32_t averageRsrq = 50;      // 7 bits
  std::uint32_t rssi = 200;            // 9 bits
  std::uint32_t qrxlevmin = 37;        // 6 bits
  std::uint32_t pMax = 53;             // 7 bits
  std::uint32_t maxTxPower = 53;       // 6 bits
  std::uint32_t srxlev = 70;           // 7 bits
  std::uint32_t drxCycles = 9;         // 6 bits
  std::uint32_t intraSearch = 31;      // 6 bits
  std::uint32_t nonIntraSearch = 12;   // 6 bits
  bool rulesUpdated = true;
  std::uint32_t rules = 11;  // 4 bits
};

Bytes packetOf(const Fields& f, std::size_t size = 33) {
  Bytes p = logPacket(0xB17F, 33);
  p[13] = f.version;
  put16(p, 17, f.earfcn);
  put16(p, 19, static_cast<std::uint16_t>(f.physicalCellId | (f.layerPriority << 9)));
  put32(p, 21, f.measuredRsrp | (f.averageRsrp << 9) | (f.measuredRsrq << 18) | (f.averageRsrq << 25));
  std::uint32_t at25 = f.rssi | (f.qrxlevmin << 9) | (f.pMax << 15) | (f.maxTxPower << 22);
  std::uint32_t at29 = f.srxlev | (f.drxCycles << 7) | (f.intraSearch << 13) | (f.nonIntraSearch << 19) |
                       (static_cast<std::uint32_t>(f.rulesUpdated) << 25) | (f.rules << 26);
  put32(p, 25, at25);
  put32(p, 29, at29);
  p.resize(size);
  return p;
}

TEST_F(ServingMeasurement, RegistersFor0xB17F) {
  EXPECT_EQ(classDict.at("Serving Cell Measurements"), section);
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"45439"}));
}

TEST_F(ServingMeasurement, WritesItsEighteenRowsInOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(packetOf(Fields{}), 0xB17F);
  const std::vector<std::pair<std::string, std::string>> expected = {
      {"Version", "3"},
      {"E-ARFCN", "6300"},
      {"Physical Cell ID", "301"},
      {"Serving Layer Priority", "5"},
      {"Measured RSRP", "-115.00 dBm"},
      {"Average RSRP", "-110.00 dBm"},
      {"Measured RSRQ", "-20.00 dB"},
      {"Average RSRQ", "-17.50 dB"},
      {"Measured RSSI", "-40.00 dBm"},
      {"Qrxlevmin", "-66 dBm"},
      {"P_Max", "23 dBm"},
      {"Max UE Tx Power", "23 dBm"},
      {"Srxlev", "40 dBm"},
      {"Num of Consecutive DRX Cycles of S < 0", "9"},
      {"S Intra Search", "62 dB"},
      {"S Non Intra Search", "24 dBm"},
      {"Measurement Rules Updated", "True"},
      {"Measurement Rules", "11"},
  };
  ASSERT_EQ(rows.size(), expected.size());
  for (std::size_t i = 0; i < expected.size(); ++i) {
    EXPECT_EQ(rows.entries()[i].first, expected[i].first);
    EXPECT_EQ(rowText(rows, expected[i].first), expected[i].second) << expected[i].first;
  }
  EXPECT_EQ(capture.lines(), test::warnings({"Serving Cell Measurements"}));
}

TEST_F(ServingMeasurement, PMaxOf64IsNotPresent) {
  const Dictionary rows = attachRows();
  Fields f;
  f.pMax = 64;
  feed(packetOf(f), 0xB17F);
  EXPECT_EQ(rowText(rows, "P_Max"), "Not Present");
  EXPECT_EQ(rowText(rows, "Max UE Tx Power"), "23 dBm");
}

// A 6-bit field tested against 64: all ones is the most it can hold.
TEST_F(ServingMeasurement, MaxUeTxPowerIsNeverNotPresent) {
  const Dictionary rows = attachRows();
  Fields f;
  f.maxTxPower = 63;
  f.pMax = 127;
  feed(packetOf(f), 0xB17F);
  EXPECT_EQ(rowText(rows, "Max UE Tx Power"), "33 dBm");
  EXPECT_EQ(rowText(rows, "P_Max"), "97 dBm");
}

TEST_F(ServingMeasurement, SIntraSearchOf32IsNotPresent) {
  const Dictionary rows = attachRows();
  Fields f;
  f.intraSearch = 32;
  f.nonIntraSearch = 32;
  feed(packetOf(f), 0xB17F);
  EXPECT_EQ(rowText(rows, "S Intra Search"), "Not Present");
  EXPECT_EQ(rowText(rows, "S Non Intra Search"), "Not Present");
}

TEST_F(ServingMeasurement, SearchField5Shows10DbForIntraAnd10DbmForNonIntra) {
  const Dictionary rows = attachRows();
  Fields f;
  f.intraSearch = 5;
  f.nonIntraSearch = 5;
  feed(packetOf(f), 0xB17F);
  EXPECT_EQ(rowText(rows, "S Intra Search"), "10 dB");
  EXPECT_EQ(rowText(rows, "S Non Intra Search"), "10 dBm");
}

TEST_F(ServingMeasurement, QrxlevminOf0IsMinus140DbmAndSrxlevOf0IsMinus30Dbm) {
  const Dictionary rows = attachRows();
  Fields f;
  f.qrxlevmin = 0;
  f.srxlev = 0;
  f.pMax = 0;
  feed(packetOf(f), 0xB17F);
  EXPECT_EQ(rowText(rows, "Qrxlevmin"), "-140 dBm");
  EXPECT_EQ(rowText(rows, "Srxlev"), "-30 dBm");
  EXPECT_EQ(rowText(rows, "P_Max"), "-30 dBm");
}

TEST_F(ServingMeasurement, FieldsOfZeroShowTheBottomOfEachScale) {
  const Dictionary rows = attachRows();
  feed(packetOf(Fields{0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, false, 0}), 0xB17F);
  EXPECT_EQ(rowText(rows, "Measured RSRP"), "-140.00 dBm");
  EXPECT_EQ(rowText(rows, "Average RSRQ"), "-30.00 dB");
  EXPECT_EQ(rowText(rows, "Measured RSSI"), "-140.00 dBm");
  EXPECT_EQ(rowText(rows, "S Intra Search"), "0 dB");
  EXPECT_EQ(rowText(rows, "Measurement Rules Updated"), "False");
}

TEST_F(ServingMeasurement, FieldsAllOnesStayWithinTheirBits) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0xB17F, 33);
  for (std::size_t i = 13; i < 33; ++i) p[i] = 0xFF;
  feed(p, 0xB17F);
  EXPECT_EQ(rowText(rows, "Version"), "255");
  EXPECT_EQ(rowText(rows, "E-ARFCN"), "65535");
  EXPECT_EQ(rowText(rows, "Physical Cell ID"), "511");
  EXPECT_EQ(rowText(rows, "Serving Layer Priority"), "15");
  EXPECT_EQ(rowText(rows, "Measured RSRP"), "-12.25 dBm");
  EXPECT_EQ(rowText(rows, "Average RSRQ"), "1.75 dB");
  EXPECT_EQ(rowText(rows, "Measured RSSI"), "115.50 dBm");
  EXPECT_EQ(rowText(rows, "Qrxlevmin"), "-14 dBm");
  EXPECT_EQ(rowText(rows, "Srxlev"), "97 dBm");
  EXPECT_EQ(rowText(rows, "Num of Consecutive DRX Cycles of S < 0"), "63");
  EXPECT_EQ(rowText(rows, "S Intra Search"), "126 dB");
  EXPECT_EQ(rowText(rows, "Measurement Rules"), "15");
}

TEST_F(ServingMeasurement, A32BytePacketChangesNothing) {
  const Dictionary rows = test::Dict({{"Version", test::S("-")}});
  section->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  feed(packetOf(Fields{}, 32), 0xB17F);
  EXPECT_EQ(Value(rows), test::D({{"Version", test::S("-")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Serving Cell Measurements"}));
}

TEST_F(ServingMeasurement, AnotherCodeIsLoggedAndChangesNothing) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(packetOf(Fields{}), 0xB180);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Serving Cell Measurements"},
                                                     {log::kError, "Received an unknown log message: 45440"}}));
}

}  // namespace
}  // namespace corvane
