#include "presenter/SnapshotSaver.h"

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>

#include "platform/DevicePaths.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::S;

constexpr std::int64_t kOpened = 1'794'816'000'250'000;  // 2026-11-16 08:00:00.25 UTC

struct TemporaryDirectory {
  std::filesystem::path path;
  TemporaryDirectory() {
    char pattern[] = "/tmp/corvane-presenter-XXXXXX";
    path = mkdtemp(pattern);
  }
  ~TemporaryDirectory() { std::filesystem::remove_all(path); }
};

Value history() {
  return A({D({{"Description", S("History 1")}, {"DisplayState", S("a")}}), D({{"DisplayState", S("b")}}),
            D({{"Description", Value::integer(3)}})});
}

TEST(SnapshotSaver, KeepsACopyOfTheSaveContentsAsTheyWereWhenOpened) {
  const Value contents = history();
  const SnapshotSaver saver(contents, "/x", Date{kOpened});
  contents.asArray()->append(S("later"));
  EXPECT_EQ(saver.saveHistory().asArray()->size(), 3u);
  EXPECT_EQ(saver.timeStamp(), Date{kOpened});
}

TEST(SnapshotSaver, ListsEachEntrysDescriptionEmptyWhereThereIsNoText) {
  const SnapshotSaver saver(history(), "/x", Date{kOpened});
  EXPECT_EQ(saver.entryDescriptions(), (std::vector<std::string>{"History 1", "", ""}));
  EXPECT_TRUE(SnapshotSaver(Value(), "/x", Date{kOpened}).entryDescriptions().empty());
}

TEST(SnapshotSaver, FileIsNamedAfterTheWholeSecondRoundedDownBefore1970Too) {
  const SnapshotSaver saver(Value(), "/var/log/corvane/snapshots", Date{kOpened});
  EXPECT_EQ(saver.snapshotFileAt(Date{1794816000'999'999}),
            "/var/log/corvane/snapshots/CorvaneSnapshot-1794816000.corvane");
  EXPECT_EQ(saver.snapshotFileAt(Date{-1}), "/var/log/corvane/snapshots/CorvaneSnapshot--1.corvane");
}

TEST(SnapshotSaver, SnapshotHoldsTimestampDataAndDescriptionInThatOrder) {
  const SnapshotSaver saver(history(), "/x", Date{kOpened});
  const Value made = saver.snapshot("In the car park");
  const Dictionary* snapshot = made.asDictionary();
  ASSERT_NE(snapshot, nullptr);
  std::vector<std::string> keys;
  for (const auto& entry : snapshot->entries()) keys.push_back(entry.first);
  EXPECT_EQ(keys, (std::vector<std::string>{"Timestamp", "Data", "Description"}));
  EXPECT_EQ(*snapshot->find("Timestamp")->asString(), "2026-11-16 08:00:00 +0000");
  EXPECT_EQ(*snapshot->find("Description")->asString(), "In the car park");
}

TEST(SnapshotSaver, WithoutSaveContentsTheSnapshotHoldsOnlyTheTimestamp) {
  const SnapshotSaver saver(Value(), "/x", Date{kOpened});
  const Value made = saver.snapshot("ignored");
  const Dictionary* snapshot = made.asDictionary();
  ASSERT_NE(snapshot, nullptr);
  EXPECT_EQ(snapshot->size(), 1u);
  EXPECT_NE(snapshot->find("Timestamp"), nullptr);
}

TEST(SnapshotSaver, SaveWritesAnXmlPropertyListThatReadsBack) {
  const TemporaryDirectory directory;
  const SnapshotSaver saver(history(), directory.path, Date{kOpened});
  std::string file;
  ASSERT_TRUE(saver.save("Roof", Date{kOpened + 5'000'000}, &file));
  EXPECT_EQ(file, (directory.path / "CorvaneSnapshot-1794816005.corvane").string());
  std::ifstream in(file, std::ios::binary);
  const std::string text((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  EXPECT_EQ(text.rfind("<?xml", 0), 0u);
  const Value read = plist::parseOrThrow(Bytes(text.begin(), text.end()));
  EXPECT_EQ(*read.asDictionary()->find("Description")->asString(), "Roof");
  EXPECT_EQ(read.asDictionary()->find("Data")->asArray()->size(), 3u);
}

TEST(SnapshotSaver, UnwritableDirectoryLogsTheFileAndReportsFailure) {
  auto capture = std::make_shared<log::CapturingSink>();
  log::setSink(capture);
  const SnapshotSaver saver(history(), "/nonexistent/corvane", Date{kOpened});
  EXPECT_FALSE(saver.save("x", Date{kOpened}));
  log::setSink(log::makeSystemLogSink());
  EXPECT_EQ(capture->lines(), (std::vector<log::Line>{
                                  {log::kError, "Unable to write snapshot to "
                                                "/nonexistent/corvane/CorvaneSnapshot-1794816000.corvane"}}));
}

TEST(SnapshotSaver, DestinationNamesTheDirectoryAndTheFileForm) {
  const SnapshotSaver saver(Value(), "/d/snapshots", Date{kOpened});
  EXPECT_EQ(saver.destinationText(),
            "Written to /d/snapshots as CorvaneSnapshot-<seconds since 1970>.corvane, an XML property list.");
}

TEST(SnapshotSaver, SavingIsOfferedOnlyWhereTheMarkerIsBelowTheDeviceRoot) {
  const TemporaryDirectory root;
  EXPECT_FALSE(saveOffered(root.path));
  const std::filesystem::path marker = devicePath(kSaveEnablingMarkerPath, root.path);
  std::filesystem::create_directories(marker);
  EXPECT_TRUE(saveOffered(root.path));
  EXPECT_FALSE(saveOffered("/nonexistent/corvane-root"));
}

}  // namespace
}  // namespace corvane
