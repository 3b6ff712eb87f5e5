// When the modem's extra codes are sent, on a virtual clock with a modem client of the test's own.

#include "telephonyd/ModemExtraCodes.h"

#include <gtest/gtest.h>

#include <map>

#include "platform/PropertyList.h"
#include "platform/VirtualRunLoop.h"
#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd {
namespace {

using namespace std::chrono_literals;

class FakeModem final : public ModemClient {
 public:
  void setChangeHandler(std::function<void(Part)> changed) override { changed_ = std::move(changed); }
  void refresh(Part part) override { ++refreshes[part]; }
  std::optional<modem::SimState> sim() const override { return simState; }
  std::optional<std::vector<modem::Fields>> cells() const override { return cellList; }
  std::optional<Contexts> contexts() const override { return contextList; }
  void change(Part part) {
    if (changed_) changed_(part);
  }

  std::optional<modem::SimState> simState;
  std::optional<std::vector<modem::Fields>> cellList;
  std::optional<Contexts> contextList;
  std::map<Part, int> refreshes;

 private:
  std::function<void(Part)> changed_;
};

class ModemExtraCodesTest : public ::testing::Test {
 protected:
  ModemExtraCodesTest() {
    auto fake = std::make_unique<FakeModem>();
    modem_ = fake.get();
    modem_->simState = modem::SimState{"8949", {"+4917"}, "26201", {}};
    modem_->cellList = std::vector<modem::Fields>{
        {{"cell-type", std::uint64_t{5}}, {"serving", true}, {"physical-ci", std::string("12D")}}};
    modem_->contextList = ModemClient::Contexts{{{1, "internet", modem::kIpFamilyIpv4}}, {}};
    codes_ = std::make_unique<ModemExtraCodes>(loop_, std::move(fake));
    codes_->setEmitter([this](const SourcePacket& packet) {
      ASSERT_TRUE(packet.code);
      ASSERT_GE(packet.data->size(), kLogPacketHeaderSize);
      EXPECT_EQ((*packet.data)[0], kLogTypeExtraCode);
      payloads_.push_back(plist::parseOrThrow(std::span(*packet.data).subspan(kLogPacketHeaderSize)));
      sent_.push_back(*packet.code - kExtraCodeBase);
    });
  }

  int count(std::uint32_t code) const { return static_cast<int>(std::count(sent_.begin(), sent_.end(), code)); }

  VirtualRunLoop loop_;
  FakeModem* modem_ = nullptr;
  std::unique_ptr<ModemExtraCodes> codes_;
  std::vector<std::uint32_t> sent_;
  std::vector<Value> payloads_;
};

TEST_F(ModemExtraCodesTest, NothingIsSentOrAskedWhileNoChannelWantsTheCodes) {
  codes_->setWantedCodes({});
  loop_.runPending();
  loop_.advanceBy(30s);
  modem_->change(ModemClient::Part::Sim);
  EXPECT_TRUE(sent_.empty());
  EXPECT_TRUE(modem_->refreshes.empty());
}

TEST_F(ModemExtraCodesTest, SimAndContextsAreSentAtOnceAndTheCellsReadWhenAChannelStarts) {
  codes_->setWantedCodes({0, 1, 2, 5});
  loop_.runPending();
  EXPECT_EQ(sent_, (std::vector<std::uint32_t>{0, 2}));
  EXPECT_EQ(modem_->refreshes[ModemClient::Part::Cells], 1);
  const Dictionary* files = payloads_[0].asDictionary();
  ASSERT_TRUE(files);
  const Value* iccid = files->find("kSimFile_ICCID");
  ASSERT_TRUE(iccid && iccid->asString());
  EXPECT_EQ(*iccid->asString(), "8949");
  ASSERT_TRUE(payloads_[1].asArray());
  EXPECT_EQ(payloads_[1].asArray()->size(), 1u);
  // The cells read: the list goes out.
  modem_->change(ModemClient::Part::Cells);
  EXPECT_EQ(sent_.back(), 1u);
  ASSERT_TRUE(payloads_.back().asArray());
  EXPECT_EQ(payloads_.back().asArray()->size(), 1u);
}

TEST_F(ModemExtraCodesTest, CellsAreReadEverySecondContextsSentEveryFiveAndSimFilesEveryTen) {
  codes_->setWantedCodes({0, 1, 2});
  loop_.runPending();
  sent_.clear();
  modem_->refreshes.clear();
  loop_.advanceBy(10s);
  EXPECT_EQ(modem_->refreshes[ModemClient::Part::Cells], 10);
  EXPECT_EQ(modem_->refreshes[ModemClient::Part::Contexts], 2);
  EXPECT_EQ(count(2), 2);
  EXPECT_EQ(count(0), 1);
  EXPECT_EQ(count(1), 0);  // sent when the modem has read them, not by the clock
}

TEST_F(ModemExtraCodesTest, ChangesAreSentOnlyForTheCodesWanted) {
  codes_->setWantedCodes({2});
  loop_.runPending();
  sent_.clear();
  modem_->change(ModemClient::Part::Sim);
  modem_->change(ModemClient::Part::Cells);
  modem_->change(ModemClient::Part::Contexts);
  EXPECT_EQ(sent_, (std::vector<std::uint32_t>{2}));
  EXPECT_EQ(modem_->refreshes[ModemClient::Part::Cells], 0);
}

TEST_F(ModemExtraCodesTest, WithoutAModemNothingIsSentAndTheCodesComeWhenItIsBack) {
  modem_->simState.reset();
  modem_->cellList.reset();
  modem_->contextList.reset();
  codes_->setWantedCodes({0, 1, 2});
  loop_.runPending();
  loop_.advanceBy(10s);
  modem_->change(ModemClient::Part::Cells);
  EXPECT_TRUE(sent_.empty());
  modem_->simState = modem::SimState{};
  modem_->change(ModemClient::Part::Sim);
  EXPECT_EQ(sent_, (std::vector<std::uint32_t>{0}));
  ASSERT_TRUE(payloads_[0].asDictionary());
  EXPECT_TRUE(payloads_[0].asDictionary()->empty());  // a SIM that told nothing: an empty dictionary, nothing made up
}

TEST_F(ModemExtraCodesTest, TheTimerStopsWhenNoChannelWantsTheCodesAnyMore) {
  codes_->setWantedCodes({1});
  loop_.runPending();
  codes_->setWantedCodes({});
  modem_->refreshes.clear();
  loop_.advanceBy(5s);
  EXPECT_TRUE(modem_->refreshes.empty());
}

}  // namespace
}  // namespace corvane::telephonyd
