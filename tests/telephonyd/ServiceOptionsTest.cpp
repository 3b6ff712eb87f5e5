#include "telephonyd/ServiceOptions.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/Version.h"

namespace corvane::telephonyd {
namespace {

ParsedOptions parse(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "corvane-telephonyd");
  std::vector<char*> argv;
  for (auto& a : arguments) argv.push_back(a.data());
  argv.push_back(nullptr);
  return parseServiceOptions(static_cast<int>(arguments.size()), argv.data());
}

TEST(ServiceOptionsTest, DefaultsSimulateIFXAtTwoPacketsPerSecond) {
  const ParsedOptions parsed = parse({});
  EXPECT_FALSE(parsed.exit);
  EXPECT_EQ(parsed.options.technology, "IFX");
  EXPECT_EQ(parsed.options.seed, 1u);
  EXPECT_EQ(parsed.options.rate, 2.0);
  EXPECT_EQ(parsed.options.packetLimit, 0u);
  EXPECT_FALSE(parsed.options.clockStart);
}

TEST(ServiceOptionsTest, ValuesAreRead) {
  const ParsedOptions parsed = parse(
      {"--technology", "Quendra_LTE", "--seed=99", "-r", "250.5", "--packets", "10", "--clock-start", "1800000000"});
  EXPECT_FALSE(parsed.exit) << parsed.error;
  EXPECT_EQ(parsed.options.technology, "Quendra_LTE");
  EXPECT_EQ(parsed.options.seed, 99u);
  EXPECT_EQ(parsed.options.rate, 250.5);
  EXPECT_EQ(parsed.options.packetLimit, 10u);
  EXPECT_EQ(parsed.options.clockStart, 1'800'000'000u);
}

TEST(ServiceOptionsTest, MaxAndZeroRateMeanFullSpeed) {
  EXPECT_EQ(parse({"--rate", "max"}).options.rate, 0.0);
  EXPECT_EQ(parse({"--rate", "0"}).options.rate, 0.0);
}

TEST(ServiceOptionsTest, BadInputExitsWithStatus2AndOneLine) {
  const std::vector<std::vector<std::string>> bad = {
      {"--bogus"}, {"--seed", "x"}, {"--seed", "-3"}, {"--rate", "fast"}, {"--rate", "-1"},
      {"--rate"},  {"extra"},       {"--technology", "Nope"}, {"--clock-start", "soon"},
      {"--clock-start", "100000000001"}};
  for (const auto& arguments : bad) {
    const ParsedOptions parsed = parse(arguments);
    EXPECT_TRUE(parsed.exit) << arguments[0];
    EXPECT_EQ(parsed.exitCode, 2) << arguments[0];
    EXPECT_FALSE(parsed.error.empty());
    EXPECT_EQ(parsed.error.find('\n'), std::string::npos);
  }
  EXPECT_EQ(parse({"--bogus"}).error, "unknown option '--bogus' (see --help)");
  EXPECT_EQ(parse({"--rate"}).error, "option '--rate' needs a value (see --help)");
  EXPECT_EQ(parse({"extra"}).error, "unexpected argument 'extra' (see --help)");
  EXPECT_EQ(parse({"--clock-start", "-1"}).error,
            "invalid clock start '-1': give seconds since 1970-01-01 UTC (see --help)");
  EXPECT_EQ(parse({"--technology", "Nope"}).error,
            "unknown technology 'Nope' (known: IFX, Quendra_GSM, Quendra_CDMA, Quendra_LTE, Quendra_UTRAN2) "
            "(see --help)");
}

TEST(ServiceOptionsTest, ReplayOptionsAreRead) {
  const ParsedOptions plain = parse({"--replay", "capture.dlf"});
  EXPECT_FALSE(plain.exit) << plain.error;
  EXPECT_EQ(plain.options.replay, "capture.dlf");
  EXPECT_FALSE(plain.options.technologyGiven);
  EXPECT_EQ(plain.options.speed, 1.0);
  EXPECT_FALSE(plain.options.asFastAsPossible);
  EXPECT_FALSE(plain.options.loop);

  const ParsedOptions all = parse({"--replay=c.hex", "-t", "Quendra_GSM", "--speed", "2.5", "--loop"});
  EXPECT_FALSE(all.exit) << all.error;
  EXPECT_EQ(all.options.replay, "c.hex");
  EXPECT_TRUE(all.options.technologyGiven);
  EXPECT_EQ(all.options.technology, "Quendra_GSM");
  EXPECT_EQ(all.options.speed, 2.5);
  EXPECT_TRUE(all.options.loop);
  EXPECT_TRUE(parse({"--replay", "c", "--as-fast-as-possible"}).options.asFastAsPossible);
}

TEST(ServiceOptionsTest, ReplayOptionsThatDoNotFitAreRefusedWithAReason) {
  EXPECT_EQ(parse({"--speed", "2"}).error, "--speed is for --replay (see --help)");
  EXPECT_EQ(parse({"--loop"}).error, "--loop is for --replay (see --help)");
  EXPECT_EQ(parse({"--as-fast-as-possible"}).error, "--as-fast-as-possible is for --replay (see --help)");
  EXPECT_EQ(parse({"--replay", "c", "--speed", "2", "--as-fast-as-possible"}).error,
            "give --speed or --as-fast-as-possible, not both (see --help)");
  EXPECT_EQ(parse({"--replay", "c", "--seed", "3"}).error,
            "--seed is for the simulator, not for --replay (see --help)");
  EXPECT_EQ(parse({"--replay", "c", "--clock-start", "1800000000"}).error,
            "--clock-start is for the simulator, not for --replay (see --help)");
  for (const char* speed : {"0", "-1", "fast", "max"}) {
    const ParsedOptions parsed = parse({"--replay", "c", "--speed", speed});
    EXPECT_EQ(parsed.exitCode, 2) << speed;
    EXPECT_EQ(parsed.error, "invalid speed '" + std::string(speed) +
                                "': give a factor above 0, such as 0.5 or 10 (see --help)");
  }
  EXPECT_EQ(parse({"--replay", ""}).error, "--replay needs a file (see --help)");
}

TEST(ServiceOptionsTest, ModemIsReadWithDiagAndRefusedWithoutIt) {
  const ParsedOptions parsed =
      parse({"--diag", "/dev/wwan0qcdm0", "--technology", "Quendra_LTE", "--modem", "356938035643809"});
  EXPECT_FALSE(parsed.exit) << parsed.error;
  EXPECT_EQ(parsed.options.modem, "356938035643809");
  EXPECT_EQ(parse({"--diag", "/dev/ttyUSB0", "--technology", "Quendra_LTE"}).options.modem, "");
  EXPECT_EQ(parse({"--modem", "0"}).error, "--modem is for --diag (see --help)");
  EXPECT_EQ(parse({"--diag", "/dev/ttyUSB0", "--technology", "Quendra_LTE", "--modem", ""}).error,
            "--modem needs an index, an object path or an IMEI (see --help)");
  EXPECT_NE(serviceUsage().find("--modem MODEM"), std::string::npos);
}

TEST(ServiceOptionsTest, HelpAndVersionPrintAndExitWithStatus0) {
  const ParsedOptions help = parse({"--help"});
  EXPECT_TRUE(help.exit);
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_EQ(help.output.rfind("Usage: corvane-telephonyd", 0), 0u);
  EXPECT_NE(help.output.find("--technology"), std::string::npos);
  EXPECT_NE(help.output.find("--clock-start"), std::string::npos);
  EXPECT_NE(help.output.find("--replay FILE"), std::string::npos);
  EXPECT_NE(help.output.find("--as-fast-as-possible"), std::string::npos);
  EXPECT_EQ(help.output, serviceUsage());
  const ParsedOptions version = parse({"--version"});
  EXPECT_TRUE(version.exit);
  EXPECT_EQ(version.exitCode, 0);
  EXPECT_EQ(version.output, std::string("corvane-telephonyd ") + kVersion + "\n");
  EXPECT_EQ(parse({"-V"}).output, version.output);
  EXPECT_EQ(parse({"-h"}).output, help.output);
}

}  // namespace
}  // namespace corvane::telephonyd
