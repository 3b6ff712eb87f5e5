// Captures as field engineers bring them back: framed diagnostic-port streams
// and DLFs, read as streams, told apart by their bytes, and what corvane-decode
// says about input it cannot read.

#include <gtest/gtest.h>

#include <fcntl.h>
#include <unistd.h>

#include <fstream>
#include <sstream>
#include <thread>

#include "CaptureReader.h"
#include "PacketInput.h"
#include "Progress.h"
#include "platform/DiagFrames.h"
#include "support/LogRecords.h"
#include "support/Process.h"

namespace corvane {
namespace {

const std::string kDecode = CORVANE_DECODE_BINARY;
const std::string kSample = std::string(CORVANE_SOURCE_DIR) + "/tools/samples/lte-session.hex";

std::string asText(const Bytes& b) { return std::string(b.begin(), b.end()); }

// The packets of the LTE sample: a type byte, then the record.
std::vector<Bytes> samplePackets() {
  std::ifstream in(kSample);
  std::vector<Bytes> packets;
  std::string line;
  while (std::getline(in, line)) {
    if (line.empty() || line[0] == '#') continue;
    std::string reason;
    auto packet = tools::parseHexLine(line, reason);
    EXPECT_TRUE(packet) << reason;
    if (packet) packets.push_back(*packet);
  }
  return packets;
}

Bytes recordOf(const Bytes& packet) { return Bytes(packet.begin() + 1, packet.end()); }

// A log frame's payload: command 0x10, a reserved byte, the record's length, the record.
Bytes logFramePayload(const Bytes& record) {
  Bytes payload{0x10, 0x00, static_cast<std::uint8_t>(record.size() & 0xFF), static_cast<std::uint8_t>(record.size() >> 8)};
  payload.insert(payload.end(), record.begin(), record.end());
  return payload;
}

// A record of a code no section reads, whose payload holds flag and escape
// bytes and whose frame's CRC holds one too.
Bytes recordWithEscapesEverywhere() {
  for (std::uint32_t n = 0;; ++n) {
    const Bytes record = test::logRecord(0x1234, 0x0006651728988000ULL, {0x7E, 0x7D, static_cast<std::uint8_t>(n),
                                                                         static_cast<std::uint8_t>(n >> 8)});
    const std::uint16_t crc = diag::crc16(logFramePayload(record));
    auto special = [](std::uint8_t b) { return b == 0x7E || b == 0x7D; };
    if (special(crc & 0xFF) || special(crc >> 8)) return record;
  }
}

struct Captures {
  Bytes dlf;
  Bytes framed;
  std::size_t records = 0;
};

// The same records as a DLF and as a framed stream that holds, besides them,
// leading garbage, an empty frame, a frame with a bad CRC and a frame of
// another command.
Captures capturesOf(const std::vector<Bytes>& packets, std::size_t repeat = 1) {
  Captures c;
  c.framed = {0x12, 0x34, 0x7E, 0x7E};
  const Bytes special = recordWithEscapesEverywhere();
  for (std::size_t r = 0; r < repeat; ++r) {
    for (std::size_t i = 0; i < packets.size(); ++i) {
      const Bytes record = i == 3 ? special : recordOf(packets[i]);
      c.dlf.insert(c.dlf.end(), record.begin(), record.end());
      diag::appendFrame(c.framed, logFramePayload(record));
      ++c.records;
      if (r == 0 && i == 5) {
        diag::appendFrame(c.framed, Bytes{0x4B, 0x0F, 0x00, 0x00});  // another command
        Bytes bad;
        diag::appendFrame(bad, logFramePayload(recordOf(packets[0])));
        bad[8] ^= 0x40;
        c.framed.insert(c.framed.end(), bad.begin(), bad.end());
      }
    }
  }
  return c;
}

TEST(FramedCapture, DecodesToTheSameTreeAsTheDlfOfTheSameRecords) {
  const Captures c = capturesOf(samplePackets());
  test::TemporaryDirectory dir;
  const auto fromDlf = test::runProcess({kDecode, "-q", "-t", "Quendra_LTE", dir.write("c.dlf", asText(c.dlf))});
  const std::string framedPath = dir.write("c.bin", asText(c.framed));
  const auto fromFramed = test::runProcess({kDecode, "-t", "Quendra_LTE", framedPath});
  ASSERT_EQ(fromDlf.exitCode, 0) << fromDlf.err;
  ASSERT_EQ(fromFramed.exitCode, 0) << fromFramed.err;
  EXPECT_EQ(fromFramed.out, fromDlf.out);
  EXPECT_NE(fromDlf.out.find("20 MHz"), std::string::npos) << fromDlf.out;
  EXPECT_NE(fromFramed.err.find("corvane-decode: " + framedPath + ": " + std::to_string(c.records) +
                                " packets from " + std::to_string(c.framed.size()) + " bytes of framed stream"),
            std::string::npos)
      << fromFramed.err;
  EXPECT_NE(fromFramed.err.find("corvane-decode: log codes no section reads: 0x1234 (1)\n"), std::string::npos)
      << fromFramed.err;
  // Good frames: the log frames and the one of another command.
  EXPECT_NE(fromFramed.err.find("corvane-decode: frames: " + std::to_string(c.records + 1) +
                                " good; skipped: 1 with a bad CRC; 1 of other commands (0x4B: 1); 2 bytes before "
                                "the first flag\n"),
            std::string::npos)
      << fromFramed.err;
  // Kept, the frame with the bad CRC is one more packet.
  const auto kept = test::runProcess({kDecode, "-t", "Quendra_LTE", "--keep-bad-crc", framedPath});
  EXPECT_NE(kept.err.find(": " + std::to_string(c.records + 1) + " packets from "), std::string::npos) << kept.err;
}

TEST(FramedCapture, FramesSplitAcrossReadsOfAPipeReadTheSame) {
  const std::vector<Bytes> packets = samplePackets();
  const Captures c = capturesOf(packets, 20);  // beyond the first 64 KiB that tell the format
  ASSERT_GT(c.framed.size(), std::size_t{64} << 10);
  int pipeEnds[2];
  ASSERT_EQ(::pipe(pipeEnds), 0);
  std::thread writer([&] {
    for (std::size_t at = 0; at < c.framed.size(); at += 7) {
      const std::size_t n = std::min<std::size_t>(7, c.framed.size() - at);
      if (::write(pipeEnds[1], c.framed.data() + at, n) != static_cast<ssize_t>(n)) break;
    }
    ::close(pipeEnds[1]);
  });
  tools::InputError error;
  auto file = tools::CaptureFile::open("/dev/fd/" + std::to_string(pipeEnds[0]), error);
  ASSERT_TRUE(file) << error.message;
  std::vector<Bytes> read;
  tools::CaptureCounts counts;
  const auto result = tools::readCapture(
      *file, {}, [&](std::span<const std::uint8_t> p) { read.emplace_back(p.begin(), p.end()); }, counts, error);
  writer.join();
  ::close(pipeEnds[0]);
  ASSERT_TRUE(result) << error.message;
  EXPECT_EQ(result->format, tools::InputFormat::Framed);
  ASSERT_EQ(read.size(), c.records);
  EXPECT_EQ(read[0], packets[0]);
  EXPECT_EQ(read[packets.size() + 7], packets[7]);
  EXPECT_EQ(counts.frames.badCrc, 1u);
  EXPECT_EQ(counts.otherCommands[0x4B], 1u);
  EXPECT_EQ(counts.bytes, c.framed.size());
}

TEST(FramedCapture, AnEmptyFileIsAnErrorThatSaysSo) {
  test::TemporaryDirectory dir;
  const std::string file = dir.write("empty.bin", "");
  const auto r = test::runProcess({kDecode, "-t", "Quendra_LTE", file});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.out, "");
  EXPECT_EQ(r.err, "corvane-decode: " + file + ": is empty: there is nothing to decode\n");
}

TEST(FramedCapture, RandomBytesAreNoCapture) {
  std::string random(1 << 20, '\0');
  std::uint64_t x = 88172645463325252ULL;
  for (char& c : random) {
    x ^= x << 13;
    x ^= x >> 7;
    x ^= x << 17;
    c = static_cast<char>(x);
  }
  test::TemporaryDirectory dir;
  const std::string file = dir.write("random.bin", random);
  const auto r = test::runProcess({kDecode, "-t", "Quendra_LTE", file});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.out, "");
  EXPECT_NE(r.err.find(file + ": not a capture corvane-decode reads: not a DLF"), std::string::npos) << r.err;
  EXPECT_NE(r.err.find("say which with --input-format"), std::string::npos) << r.err;
}

TEST(FramedCapture, EveryTechnologyHasADecoderSoOnlyTheMissingInputIsReported) {
  const auto r = test::runProcess({kDecode, "-t", "Quendra_CDMA", "/nonexistent/capture.bin"});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.err.find("no decoder"), std::string::npos) << r.err;
  EXPECT_NE(r.err.find("/nonexistent/capture.bin"), std::string::npos) << r.err;
}

TEST(FramedCapture, ADlfDamagedInTheMiddleIsDecodedUpToTheDamageWhichIsNamed) {
  const std::vector<Bytes> packets = samplePackets();
  Bytes dlf;
  for (std::size_t i = 0; i < 10; ++i) {
    const Bytes record = recordOf(packets[i]);
    dlf.insert(dlf.end(), record.begin(), record.end());
  }
  const std::size_t damagedAt = dlf.size();
  dlf.insert(dlf.end(), {0x03, 0x00, 0xAA, 0xBB});  // a length no record has
  const Bytes more = recordOf(packets[10]);
  dlf.insert(dlf.end(), more.begin(), more.end());
  test::TemporaryDirectory dir;
  const std::string file = dir.write("damaged.dlf", asText(dlf));
  const auto r = test::runProcess({kDecode, "-q", "-t", "Quendra_LTE", file});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_NE(r.out.find("Serving Cell"), std::string::npos) << r.out;
  EXPECT_EQ(r.err, "corvane-decode: " + file + ": no log record at offset " + std::to_string(damagedAt) +
                       ": the DLF is damaged there; the records before it were decoded\n");
}

TEST(FramedCapture, AForcedInputFormatIsUsedAsGiven) {
  const Captures c = capturesOf(samplePackets());
  test::TemporaryDirectory dir;
  const std::string framed = dir.write("c.bin", asText(c.framed));
  // Read as a DLF, the frames are records of nonsense lengths.
  const auto asDlf = test::runProcess({kDecode, "-t", "Quendra_LTE", "--input-format", "dlf", framed});
  EXPECT_NE(asDlf.err.find(" bytes of DLF"), std::string::npos) << asDlf.err;
  const auto asFramed = test::runProcess({kDecode, "-t", "Quendra_LTE", "--input-format", "framed", framed});
  EXPECT_EQ(asFramed.exitCode, 0) << asFramed.err;
  EXPECT_NE(asFramed.err.find(" bytes of framed stream"), std::string::npos) << asFramed.err;
  const auto bad = test::runProcess({kDecode, "-t", "Quendra_LTE", "--input-format", "pcap", framed});
  EXPECT_EQ(bad.exitCode, 2);
  EXPECT_EQ(bad.err.rfind("corvane-decode: unknown input format \"pcap\" (dlf, framed, hex, plist or snapshot)\n", 0),
            0u)
      << bad.err;
}

TEST(FramedCapture, TheProgressLineShowsBytesRateAndTimeLeft) {
  EXPECT_EQ(tools::progressLine(std::uint64_t{512} << 20, std::uint64_t{1} << 30, 3'000'000, 2.0),
            "  512.0 MiB of 1.00 GiB   50%  1.50 M packets/s  0:02 left");
  EXPECT_EQ(tools::progressLine(std::uint64_t{3} << 20, std::nullopt, 1500, 1.0), "  3.0 MiB  1.5 k packets/s");
}

}  // namespace
}  // namespace corvane
