#include <gtest/gtest.h>

#include "telephonyd/PacketSource.h"

namespace corvane::telephonyd {
namespace {

SourcePacket packet(std::optional<std::uint32_t> code) { return {std::make_shared<const Bytes>(), code}; }

Value codes(std::initializer_list<std::int64_t> list) {
  Array array;
  for (auto c : list) array.append(Value::integer(c));
  return Value(array);
}

TEST(PacketFilterTest, PacketsWithoutACodeAlwaysPass) {
  Dictionary command;
  command.set("SetState", Value("Streaming"));
  EXPECT_TRUE(PacketFilter::fromStartCommand(command).accepts(packet(std::nullopt)));
}

TEST(PacketFilterTest, OnlyTheListedLogAndExtraCodesPass) {
  Dictionary command;
  command.set("SetState", Value("Streaming"));
  command.set("SetQuendraLogCodes", codes({0xD0E0, 0xD0E2}));
  command.set("SetTsExtraCodes", codes({1}));
  const PacketFilter filter = PacketFilter::fromStartCommand(command);
  EXPECT_TRUE(filter.accepts(packet(0xD0E0)));
  EXPECT_TRUE(filter.accepts(packet(0xD0E2)));
  EXPECT_FALSE(filter.accepts(packet(0xD0E1)));
  EXPECT_TRUE(filter.accepts(packet(0xFF0001)));
  EXPECT_FALSE(filter.accepts(packet(0xFF0000)));
  EXPECT_FALSE(filter.accepts(packet(0xFF0002)));
}

TEST(PacketFilterTest, MissingListsAskForNoCodes) {
  Dictionary command;
  command.set("SetState", Value("Streaming"));
  command.set("SetQuendraLogCodes", codes({0x108A}));
  const PacketFilter filter = PacketFilter::fromStartCommand(command);
  EXPECT_TRUE(filter.accepts(packet(0x108A)));
  EXPECT_FALSE(filter.accepts(packet(0xFF0000)));
}

TEST(PacketFilterTest, EntriesThatAreNotCodesAreIgnored) {
  Dictionary command;
  Array mixed;
  mixed.append(Value("0x4005"));
  mixed.append(Value::integer(-1));
  mixed.append(Value::integer(0x4005));
  command.set("SetQuendraLogCodes", Value(mixed));
  command.set("SetTsExtraCodes", Value("not a list"));
  const PacketFilter filter = PacketFilter::fromStartCommand(command);
  EXPECT_EQ(filter.logCodes(), (std::set<std::uint32_t>{0x4005}));
  EXPECT_TRUE(filter.extraCodes().empty());
}

}  // namespace
}  // namespace corvane::telephonyd
