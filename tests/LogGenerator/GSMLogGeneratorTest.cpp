#include "LogGenerator/GSM/GSMLogGenerator.h"

#include <gtest/gtest.h>

#include "platform/Assertion.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::S;

class IfxDecoder : public ::testing::Test {
 protected:
  Value display(const Value& packet, plist::Format format = plist::Format::XML) {
    generator_.updateState(state_, plist::serializeOrThrow(packet, format));
    return generator_.generateLogUsingState(state_);
  }

  GSMLogGenerator generator_;
  Dictionary state_;
};

TEST_F(IfxDecoder, AOneEntryDictionaryFoldsIntoItsValue) {
  EXPECT_EQ(display(D({{"Serving", D({{"ARFCN", S("62")}})}})), D({{"Serving", S("62")}}));
}

TEST_F(IfxDecoder, TheFirstElementOfEveryArrayIsLeftOut) {
  EXPECT_EQ(display(D({{"List", A({S("x"), S("y"), S("z")})}, {"More", S("m")}})),
            D({{"List", A({S("y"), S("z")})}, {"More", S("m")}}));
  EXPECT_EQ(display(D({{"One", A({S("only")})}, {"More", S("m")}})), D({{"One", A({})}, {"More", S("m")}}));
}

TEST_F(IfxDecoder, AOneEntryDictionaryAtTheTopStaysADictionary) {
  EXPECT_EQ(display(D({{"Serving", S("62")}})), D({{"Serving", S("62")}}));
}

TEST_F(IfxDecoder, AChainOfOneEntryDictionariesKeepsOnlyTheOutermostKey) {
  EXPECT_EQ(display(D({{"a", D({{"b", D({{"c", S("text")}})}})}, {"other", S("o")}})),
            D({{"a", S("text")}, {"other", S("o")}}));
}

TEST_F(IfxDecoder, ArrayElementsFoldToo) {
  EXPECT_EQ(display(A({S("header"), D({{"ARFCN", S("70")}}), D({{"ARFCN", S("71")}, {"BSIC", S("12")}})})),
            A({S("70"), D({{"ARFCN", S("71")}, {"BSIC", S("12")}})}));
}

TEST_F(IfxDecoder, BinaryPacketsAreDecodedLikeXml) {
  EXPECT_EQ(display(D({{"Serving", D({{"ARFCN", S("62")}})}}), plist::Format::Binary), D({{"Serving", S("62")}}));
}

TEST_F(IfxDecoder, ANumberAnywhereRaisesUnknownObject) {
  for (const Value& packet : {D({{"Serving", D({{"ARFCN", Value::integer(62)}})}}),
                              D({{"List", A({S("header"), Value::real(1.5)})}}),
                              D({{"On", Value::boolean(true)}})}) {
    try {
      generator_.updateState(state_, test::xmlBytes(packet));
      FAIL() << "no assertion failure";
    } catch (const AssertionFailure& failure) {
      EXPECT_EQ(failure.file(), "LogGenerator/GSM/GSMLogGenerator");
      EXPECT_EQ(failure.line(), 78);
      EXPECT_TRUE(failure.description() == "Unknown object of type Integer encountered" ||
                  failure.description() == "Unknown object of type Real encountered" ||
                  failure.description() == "Unknown object of type Boolean encountered")
          << failure.description();
    }
  }
}

TEST_F(IfxDecoder, ANumberInTheFirstArrayElementIsNeverLookedAt) {
  EXPECT_EQ(display(D({{"List", A({Value::integer(1), S("y")})}, {"x", S("x")}})),
            D({{"List", A({S("y")})}, {"x", S("x")}}));
}

TEST_F(IfxDecoder, DataThatIsNoPropertyListRaisesCouldNotDeserialize) {
  try {
    generator_.updateState(state_, test::bytesOf("\x81\x01 not a property list"));
    FAIL() << "no assertion failure";
  } catch (const AssertionFailure& failure) {
    EXPECT_EQ(failure.description(), "Could not deserialize the object");
    EXPECT_EQ(failure.file(), "LogGenerator/GSM/GSMLogGenerator");
    EXPECT_EQ(failure.line(), 90);
  }
  EXPECT_FALSE(state_.contains("Display")) << "nothing is stored for a packet that failed";
}

TEST_F(IfxDecoder, TheStateHoldsThePacketItsDisplayAndAnEmptyExtraInfo) {
  const Value packet = D({{"Serving", D({{"ARFCN", S("62")}})}, {"List", A({S("h"), S("a")})}});
  generator_.updateState(state_, test::xmlBytes(packet));
  EXPECT_EQ(state_.get("DisplayState"), packet);
  EXPECT_EQ(state_.get("Display"), D({{"Serving", S("62")}, {"List", A({S("a")})}}));
  EXPECT_EQ(state_.get("ExtraInfo"), D({}));
  EXPECT_FALSE(state_.contains("History")) << "history grows only when a display is generated";
}

TEST_F(IfxDecoder, EachPacketReplacesThePreviousEntirely) {
  display(D({{"Serving", S("62")}, {"Old", S("gone")}}));
  EXPECT_EQ(display(D({{"Serving", S("70")}})), D({{"Serving", S("70")}}));
}

TEST_F(IfxDecoder, GeneratingADisplayAppendsAHistorySnapshot) {
  display(D({{"Serving", S("62")}}));
  display(D({{"Serving", S("63")}}));
  const Array& history = *state_.find("History")->asArray();
  ASSERT_EQ(history.size(), 2u);
  EXPECT_EQ(history.at(1).asDictionary()->get("Display"), D({{"Serving", S("63")}}));
}

TEST_F(IfxDecoder, StartCommandAsksForStreaming) {
  EXPECT_EQ(Value(generator_.getStartCommand()), D({{"SetState", S("Streaming")}}));
}

TEST_F(IfxDecoder, SaveContentsWithoutHistoryIsAnEmptyArray) {
  EXPECT_EQ(generator_.getSaveContentsFromState(state_), A({}));
}

TEST_F(IfxDecoder, SaveContentsIsANewArraySharingTheSnapshots) {
  display(D({{"Serving", S("62")}}));
  const Value contents = generator_.getSaveContentsFromState(state_);
  const Array& history = *state_.find("History")->asArray();
  ASSERT_EQ(contents.asArray()->size(), 1u);
  EXPECT_FALSE(contents.asArray()->isSameObject(history));
  EXPECT_TRUE(contents.asArray()->at(0).asDictionary()->isSameObject(*history.at(0).asDictionary()));
  display(D({{"Serving", S("63")}}));
  EXPECT_EQ(contents.asArray()->size(), 1u) << "a snapshot of the list at the time";
}

TEST(IfxCanCollapse, OnlyADictionaryOfExactlyOneEntryCollapses) {
  EXPECT_EQ(GSMLogGenerator::canCollapse(D({{"a", S("x")}})), S("x"));
  EXPECT_TRUE(GSMLogGenerator::canCollapse(D({})).isNull());
  EXPECT_TRUE(GSMLogGenerator::canCollapse(D({{"a", S("x")}, {"b", S("y")}})).isNull());
  EXPECT_TRUE(GSMLogGenerator::canCollapse(S("x")).isNull());
  EXPECT_TRUE(GSMLogGenerator::canCollapse(A({S("x")})).isNull());
}

}  // namespace
}  // namespace corvane
