#include "LogGenerator/logcode/QNDLogGenerator.h"

#include <gtest/gtest.h>

#include <cstring>

#include "LogGenerator/logcode/QNDLogGenerator2.h"
#include "logcode/TestSections.h"
#include "platform/Log.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::D;
using test::S;

std::uint16_t le16(const Bytes& b, std::size_t at) { return static_cast<std::uint16_t>(b.at(at) | (b.at(at + 1) << 8)); }
std::uint32_t le32(const Bytes& b, std::size_t at) { return le16(b, at) | (static_cast<std::uint32_t>(le16(b, at + 2)) << 16); }
std::string textAt(const Bytes& b, std::size_t at, std::size_t width) {
  std::string s(reinterpret_cast<const char*>(b.data() + at), width);
  return s.substr(0, s.find('\0'));
}
bool zeroRange(const Bytes& b, std::size_t from, std::size_t to) {
  for (std::size_t i = from; i < to; ++i) {
    if (b.at(i) != 0) return false;
  }
  return true;
}

class Dlf : public ::testing::Test {
 protected:
  void SetUp() override {
    generator_ = std::make_unique<QNDLogGenerator2>(QNDLogGenerator2::Configuration{
        "None", std::make_unique<test::RecordingIndex>(std::vector<std::pair<std::string, std::vector<std::uint32_t>>>{},
                                                        nullptr)});
    inputs_.bundleVersion = "1.0";
    inputs_.secondsSince1970 = 1794816000;
    inputs_.utcOffsetSeconds = 3600;
    inputs_.daylightSaving = false;
    inputs_.buildDateText = "Jan 16 2017 23:26:21";
    generator_->setHeaderInputsSource([this] { return inputs_; });
  }

  static Dictionary stateWithHistory(std::vector<Value> displayStates) {
    Array history;
    for (auto& ds : displayStates) {
      Dictionary entry;
      if (!ds.isNull()) entry.set("DisplayState", ds);
      entry.set("Description", S("Snapshot"));
      history.append(Value(entry));
    }
    Dictionary state;
    state.set("History", Value(history));
    return state;
  }

  std::unique_ptr<QNDLogGenerator2> generator_;
  DlfHeaderInputs inputs_;
};

TEST_F(Dlf, AStateWithoutHistoryGivesTheVersionReportAlone) {
  Dictionary state;
  auto dlf = generator_->generateDlfFromState(state);
  ASSERT_TRUE(dlf.has_value());
  EXPECT_EQ(dlf->size(), 161u);

  const Value contents = generator_->getSaveContentsFromState(state);
  ASSERT_EQ(contents.asArray()->size(), 1u);
  const Dictionary& entry = *contents.asArray()->at(0).asDictionary();
  EXPECT_EQ(*entry.find("Description")->asString(), "DLF binary (161 bytes)");
  EXPECT_EQ(entry.find("DLF")->asData()->size(), 161u);
}

TEST_F(Dlf, TheVersionReportHoldsEveryFieldAtItsOffset) {
  const Bytes dlf = *generator_->generateDlfFromState(Dictionary());
  EXPECT_EQ(le16(dlf, 0), 161);
  EXPECT_EQ(le16(dlf, 2), 0x1FFD);
  EXPECT_TRUE(zeroRange(dlf, 4, 12));
  EXPECT_EQ(le16(dlf, 12), 1);
  EXPECT_EQ(le16(dlf, 14), 1);
  // "Corvane 1.0" cut to six characters, then NUL.
  EXPECT_EQ(textAt(dlf, 16, 7), "Corvan");
  EXPECT_EQ(dlf[22], 0);
  EXPECT_EQ(textAt(dlf, 23, 16), "EXECUTABLE_NAME");
  EXPECT_EQ(dlf[38], 0);
  EXPECT_TRUE(zeroRange(dlf, 39, 63));
  EXPECT_EQ(textAt(dlf, 63, 18), "Jan 16 2017 23:26");
  EXPECT_TRUE(zeroRange(dlf, 80, 81));
  EXPECT_EQ(le32(dlf, 81), 1794816000u);
  EXPECT_EQ(static_cast<std::int16_t>(le16(dlf, 85)), 60);
  EXPECT_EQ(le16(dlf, 87), 0);
  EXPECT_TRUE(zeroRange(dlf, 89, 161));
}

TEST_F(Dlf, WithoutABundleVersionTheVersionFieldSaysNone) {
  inputs_.bundleVersion.reset();
  const Bytes dlf = *generator_->generateDlfFromState(Dictionary());
  EXPECT_EQ(textAt(dlf, 16, 7), "(none)");
}

TEST_F(Dlf, TimeZoneMinutesGoTowardZero) {
  inputs_.utcOffsetSeconds = -90 * 60;
  inputs_.daylightSaving = true;
  Bytes dlf = *generator_->generateDlfFromState(Dictionary());
  EXPECT_EQ(static_cast<std::int16_t>(le16(dlf, 85)), -90);
  EXPECT_EQ(le16(dlf, 87), 1);
  inputs_.utcOffsetSeconds = -30;
  dlf = *generator_->generateDlfFromState(Dictionary());
  EXPECT_EQ(static_cast<std::int16_t>(le16(dlf, 85)), 0);
  inputs_.utcOffsetSeconds = -89;
  dlf = *generator_->generateDlfFromState(Dictionary());
  EXPECT_EQ(static_cast<std::int16_t>(le16(dlf, 85)), -1);
}

TEST_F(Dlf, EachHistoryEntryAddsItsBytesButTheFirst) {
  const Dictionary state = stateWithHistory({Value(Bytes{0x01, 0xAA, 0xBB}), Value(Bytes{0x09}), Value(),
                                             Value(Bytes{0x01, 0xCC}), Value(Bytes{})});
  const Bytes dlf = *generator_->generateDlfFromState(state);
  ASSERT_EQ(dlf.size(), 161u + 2u + 1u);
  EXPECT_EQ(Bytes(dlf.begin() + 161, dlf.end()), (Bytes{0xAA, 0xBB, 0xCC}));
}

TEST_F(Dlf, ADisplayStateThatIsAStringAbortsTheWholeDlf) {
  const Dictionary state = stateWithHistory({Value(Bytes{0x01, 0xAA}), S("not bytes")});
  log::ScopedCapture capture;
  EXPECT_FALSE(generator_->generateDlfFromState(state).has_value());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{
                                 {16, "Got wrong class writing history to DLF; aborting writing the DLF file"}}));
  const Value contents = generator_->getSaveContentsFromState(state);
  ASSERT_EQ(contents.asArray()->size(), 2u);
  EXPECT_FALSE(contents.asArray()->at(1).asDictionary()->contains("DLF"));
}

TEST_F(Dlf, SaveContentsAreACopyOfTheHistoryFollowedByTheDlf) {
  const Dictionary state = stateWithHistory({Value(Bytes{0x01, 0xAA}), Value(Bytes{0x01, 0xBB, 0xCC})});
  const Value contents = generator_->getSaveContentsFromState(state);
  const Array& entries = *contents.asArray();
  ASSERT_EQ(entries.size(), 3u);
  EXPECT_FALSE(entries.isSameObject(*state.find("History")->asArray()));
  EXPECT_EQ(entries.at(0), state.find("History")->asArray()->at(0));
  EXPECT_EQ(*entries.at(2).asDictionary()->find("Description")->asString(), "DLF binary (164 bytes)");
}

TEST(DlfVersionReport, ABufferBelow161BytesGetsResultThreeAndNothingWritten) {
  std::uint8_t buffer[160];
  std::memset(buffer, 0x5A, sizeof buffer);
  std::size_t written = 99;
  EXPECT_EQ(QNVDLFAddVersionReport(buffer, sizeof buffer, &written, 1, 1, "v", "e", "d", DlfTimeRecord{}), 3);
  EXPECT_EQ(written, 0u);
  for (auto b : buffer) EXPECT_EQ(b, 0x5A);
}

TEST(DlfVersionReport, ExactlyLongTextsAreCutToLeaveTheirNul) {
  std::uint8_t buffer[200];
  std::memset(buffer, 0x5A, sizeof buffer);
  std::size_t written = 0;
  EXPECT_EQ(QNVDLFAddVersionReport(buffer, sizeof buffer, &written, 7, 9, "1234567", "ABCDEFGHIJKLMNOPQRS",
                                   "Jan 16 2017 23:26:21", DlfTimeRecord{1, -1, 1}),
            0);
  EXPECT_EQ(written, 161u);
  const Bytes b(buffer, buffer + 200);
  EXPECT_EQ(textAt(b, 16, 7), "123456");
  EXPECT_EQ(textAt(b, 23, 16), "ABCDEFGHIJKLMNO");
  EXPECT_EQ(le16(b, 12), 7);
  EXPECT_EQ(le16(b, 14), 9);
  EXPECT_EQ(le16(b, 85), 0xFFFF);
  // Nothing past the record is touched.
  EXPECT_EQ(b[161], 0x5A);
}

TEST(DlfHeader, TheCurrentInputsNameThisProgramsVersionAndBuild) {
  const DlfHeaderInputs inputs = QNDLogGenerator::currentHeaderInputs();
  ASSERT_TRUE(inputs.bundleVersion.has_value());
  EXPECT_FALSE(inputs.bundleVersion->empty());
  EXPECT_EQ(inputs.buildDateText.size(), 20u);  // "Mmm dd yyyy hh:mm:ss"
  EXPECT_GT(inputs.secondsSince1970, 1700000000u);
}

}  // namespace
}  // namespace corvane
