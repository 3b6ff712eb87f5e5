// corvane-decode, run as a user runs it.

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "platform/Version.h"
#include "support/LogRecords.h"
#include "support/Process.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::runProcess;
using test::S;

const std::string kDecode = CORVANE_DECODE_BINARY;
const std::string kSample = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/ifx-gsm-serving-cell.plist";

std::string asText(const Bytes& b) { return std::string(b.begin(), b.end()); }

std::string hexLine(const Bytes& b) {
  static const char* digits = "0123456789abcdef";
  std::string out;
  for (std::uint8_t c : b) {
    if (!out.empty()) out += ' ';
    out += digits[c >> 4];
    out += digits[c & 15];
  }
  return out;
}

TEST(DecodeTool, JsonOfAnXmlPacketIsTheFoldedTree) {
  const std::string packet = asText(test::xmlBytes(D({
      {"Serving", D({{"ARFCN", S("62")}})},
      {"Neighbours", A({S("header"), D({{"ARFCN", S("70")}, {"RxLev", S("-80")}}), S("z")})},
  })));
  test::TemporaryDirectory dir;
  const auto r = runProcess({kDecode, "-q", "--technology", "IFX", "--format", "json", dir.write("p.plist", packet)});
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.err, "");
  const auto expected = nlohmann::ordered_json::parse(R"({"name": "Corvane", "children": [
      {"name": "Serving", "value": "62"},
      {"name": "Neighbours", "children": [
        {"name": "0", "children": [{"name": "ARFCN", "value": "70"}, {"name": "RxLev", "value": "-80"}]},
        {"name": "1", "value": "z"}]}]})");
  EXPECT_EQ(nlohmann::ordered_json::parse(r.out), expected);
  EXPECT_EQ(r.out.find("\"name\""), r.out.find('{') + 4) << "name comes first in each object:\n" << r.out;
}

TEST(DecodeTool, TextIsAnIndentedTreeWithNameValueLeaves) {
  const auto r = runProcess({kDecode, "--technology", "IFX", kSample});
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.out.substr(0, r.out.find("  Neighbour")),
            "Corvane\n"
            "  Serving Cell\n"
            "    PLMN: 262-01\n"
            "    LAC: 0x1A2B\n"
            "    Cell ID: 40961\n"
            "    ARFCN: 62\n"
            "    BSIC: 5-3\n"
            "    RxLev: -71 dBm\n"
            "    RxQual: 0\n"
            "    Band: GSM 900\n");
  EXPECT_NE(r.out.find("    2: 523\n"), std::string::npos) << r.out;
}

TEST(DecodeTool, PacketsFoldInOrderAndOnlyTheLastShows) {
  const std::string hex = "# two packets\n" + hexLine(test::xmlBytes(D({{"Serving", S("62")}}))) + "\n" +
                          hexLine(test::binaryBytes(D({{"Serving", S("70")}}))) + "\n";
  const auto r = runProcess({kDecode, "-t", "IFX"}, hex);
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.out, "Corvane\n  Serving: 70\n");
}

TEST(DecodeTool, ADashReadsStandardInput) {
  const auto r = runProcess({kDecode, "-t", "IFX", "-"}, asText(test::xmlBytes(D({{"Serving", S("62")}}))));
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.out, "Corvane\n  Serving: 62\n");
}

TEST(DecodeTool, NoPacketsShowsTheEmptyStateAndSaysSo) {
  const auto r = runProcess({kDecode, "-q", "-t", "IFX"}, "# nothing yet\n");
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.out, "Corvane: (unknown)\n");
  EXPECT_EQ(r.err, "corvane-decode: warning: standard input: holds no packets\n");
}

TEST(DecodeTool, ANumberEndsItWithTheAssertionMessage) {
  test::TemporaryDirectory dir;
  const auto file = dir.write("n.plist", asText(test::xmlBytes(D({{"Serving", D({{"ARFCN", Value::integer(62)}})}}))));
  const auto r = runProcess({kDecode, "--technology", "IFX", "--format", "json", file});
  EXPECT_NE(r.exitCode, 0);
  EXPECT_EQ(r.exitCode, 3);
  EXPECT_EQ(r.out, "");
  EXPECT_EQ(r.err,
            "corvane-decode: assertion failure in LogGenerator/GSM/GSMLogGenerator:78: "
            "Unknown object of type Integer encountered\n");
}

TEST(DecodeTool, AHexPacketThatIsNoPropertyListEndsItWithTheDeserializeAssertion) {
  const auto r = runProcess({kDecode, "-t", "IFX"}, "81 01 02 03\n");
  EXPECT_EQ(r.exitCode, 3);
  EXPECT_NE(r.err.find("Could not deserialize the object"), std::string::npos) << r.err;
}

TEST(DecodeTool, LogToStandardErrorWritesTheDecodersLinesThere) {
  const auto r = runProcess({kDecode, "-q", "-t", "IFX", "--log=stderr", kSample});
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.err.rfind("<4> Creating Log object: 0x", 0), 0u) << r.err;
  // Without --log no decoder line is made; the summary is corvane-decode's own.
  const auto plain = runProcess({kDecode, "-t", "IFX", kSample});
  EXPECT_EQ(plain.err.find("<"), std::string::npos) << plain.err;
  EXPECT_EQ(plain.err.rfind("corvane-decode: " + kSample + ": 1 packets from ", 0), 0u) << plain.err;
  const auto quiet = runProcess({kDecode, "-q", "-t", "IFX", kSample});
  EXPECT_EQ(quiet.err, "");
  // To the system log: nothing on standard error.
  const auto syslog = runProcess({kDecode, "-q", "-t", "IFX", "--log", kSample});
  EXPECT_EQ(syslog.exitCode, 0);
  EXPECT_EQ(syslog.err, "");
  const auto bad = runProcess({kDecode, "-t", "IFX", "--log=printer", kSample});
  EXPECT_EQ(bad.exitCode, 2);
  EXPECT_EQ(bad.err.rfind("corvane-decode: unknown log destination \"printer\" (syslog or stderr)\n", 0), 0u)
      << bad.err;
}

TEST(DecodeTool, ABadHexLineNamesItsLineNumberAndExitsWithOneAfterTheLinesBeforeIt) {
  const std::string hex = hexLine(test::xmlBytes(D({{"Serving", S("62")}}))) + "\n\n0x03\n";
  const auto r = runProcess({kDecode, "-q", "-t", "IFX"}, hex);
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.out, "Corvane\n  Serving: 62\n");
  EXPECT_EQ(r.err,
            "corvane-decode: standard input:3: bad hex line: 'x' is not a hex digit (column 2); the lines before it "
            "were decoded\n");
}

TEST(DecodeTool, AnUnreadableFileExitsWithOne) {
  const auto r = runProcess({kDecode, "-t", "IFX", "/nonexistent/capture.hex"});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.err, "corvane-decode: /nonexistent/capture.hex: cannot open: No such file or directory\n");
}

TEST(DecodeTool, AMalformedPropertyListFileExitsWithOne) {
  test::TemporaryDirectory dir;
  const auto r = runProcess({kDecode, "-t", "IFX", dir.write("bad.plist", "<?xml version=\"1.0\"?><plist><dict>")});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_NE(r.err.find("bad.plist: malformed XML property list"), std::string::npos) << r.err;
}

// A SIM-file extra code, as the service sends it.
Bytes simFilesPacket(const std::string& iccid) {
  return test::withType(0xFF, test::logRecord(0x0000, 7, test::binaryBytes(D({{"kSimFile_ICCID", S(iccid)}}))));
}

TEST(DecodeTool, ADlfFileIsReplayedThroughTheLogCodeGenerator) {
  const Bytes dlf =
      test::dlfOfIntervals({{simFilesPacket("89001010000000000018")}, {simFilesPacket("89001012345678901234")}});
  test::TemporaryDirectory dir;
  const auto r = runProcess({kDecode, "-q", "-t", "Quendra_LTE", dir.write("capture", asText(dlf))});
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.err, "");
  EXPECT_NE(r.out.find("\n  SIM Info\n    EF-ICCID: 89001012345678901234\n"), std::string::npos) << r.out;
}

TEST(DecodeTool, ASnapshotFileReplaysItsHistory) {
  const Value snapshot = D({{"Timestamp", S("2026-11-16 08:00:00 +0000")},
                            {"Data", A({D({{"DisplayState", Value(simFilesPacket("89001012345678901234"))}}),
                                        D({{"Description", S("DLF binary (161 bytes)")},
                                           {"DLF", Value(test::dlfVersionReport())}})})},
                            {"Description", S("drive test")}});
  test::TemporaryDirectory dir;
  const auto r = runProcess({kDecode, "-t", "Quendra_GSM", dir.write("CorvaneSnapshot-1.corvane",
                                                                     asText(test::xmlBytes(snapshot)))});
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_NE(r.out.find("\n    EF-ICCID: 89001012345678901234\n"), std::string::npos) << r.out;
}

TEST(DecodeTool, AnIfxSnapshotShowsItsLastReport) {
  const Value snapshot = D({{"Timestamp", S("2026-11-16 08:00:00 +0000")},
                            {"Data", A({D({{"DisplayState", D({{"Serving", S("62")}})}}),
                                        D({{"DisplayState", D({{"Serving", S("70")}})}})})}});
  const auto r = runProcess({kDecode, "-t", "IFX"}, asText(test::xmlBytes(snapshot)));
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.out, "Corvane\n  Serving: 70\n");
}

TEST(DecodeTool, ATruncatedDlfIsReadUpToItsLastWholeRecordWithAWarning) {
  Bytes dlf = test::dlfOfIntervals({{simFilesPacket("89001012345678901234")}});
  const std::size_t cutAt = dlf.size();
  const Bytes next = simFilesPacket("89001010000000000018");
  dlf.insert(dlf.end(), next.begin(), next.begin() + 20);
  test::TemporaryDirectory dir;
  const std::string file = dir.write("cut.dlf", asText(dlf));
  const auto r = runProcess({kDecode, "-q", "-t", "Quendra_LTE", file});
  ASSERT_EQ(r.exitCode, 0) << r.err;
  EXPECT_EQ(r.err, "corvane-decode: warning: " + file + ": truncated record at offset " + std::to_string(cutAt) +
                       "; its 20 bytes are left out\n");
  EXPECT_NE(r.out.find("EF-ICCID: 89001012345678901234\n"), std::string::npos) << r.out;
}

TEST(DecodeTool, BinaryThatIsNoCaptureExitsWithOneNamingWhatWasTried) {
  test::TemporaryDirectory dir;
  const std::string file = dir.write("random.bin", std::string("\x00\x00\x17\xFF\x80", 5));
  const auto r = runProcess({kDecode, "-t", "Quendra_LTE", file});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.out, "");
  EXPECT_EQ(r.err, "corvane-decode: " + file +
                       ": not a capture corvane-decode reads: not a DLF (no run of log records from byte 0), not a "
                       "framed stream (more bad frames than good ones), not a property list or snapshot, not hex "
                       "text; if it is one of them, say which with --input-format\n");
}

TEST(DecodeTool, BadUsageExitsWithTwo) {
  for (const auto& args : std::vector<std::vector<std::string>>{
           {kDecode},
           {kDecode, "--technology"},
           {kDecode, "--technology", "WiMAX"},
           {kDecode, "-t", "IFX", "--format", "xml"},
           {kDecode, "-t", "IFX", "--bogus"},
       }) {
    const auto r = runProcess(args);
    EXPECT_EQ(r.exitCode, 2) << args.back();
    EXPECT_EQ(r.err.rfind("corvane-decode: ", 0), 0u) << r.err;
    EXPECT_NE(r.err.find("Usage: corvane-decode"), std::string::npos) << r.err;
  }
}

TEST(DecodeTool, HelpAndVersion) {
  for (const char* option : {"--help", "-h"}) {
    const auto help = runProcess({kDecode, option});
    EXPECT_EQ(help.exitCode, 0);
    EXPECT_EQ(help.out.rfind("Usage: corvane-decode --technology NAME", 0), 0u);
    EXPECT_EQ(help.err, "");
  }
  for (const char* option : {"--version", "-V"}) {
    const auto version = runProcess({kDecode, option});
    EXPECT_EQ(version.exitCode, 0);
    EXPECT_EQ(version.out, std::string("corvane-decode ") + kVersion + "\n");
  }
}

TEST(DecodeTool, AnUnknownOptionIsNamedOnStandardErrorWithStatusTwo) {
  const auto r = runProcess({kDecode, "-t", "IFX", "--bogus"});
  EXPECT_EQ(r.exitCode, 2);
  EXPECT_EQ(r.out, "");
  EXPECT_EQ(r.err.rfind("corvane-decode: unknown option '--bogus'\nUsage: corvane-decode", 0), 0u) << r.err;
}

}  // namespace
}  // namespace corvane
