#include "platform/CommandLine.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "platform/Version.h"

namespace corvane {
namespace {

using Request = ParsedCommandLine::Request;

constexpr CommandLineOption kOptions[] = {
    {"format", 'f', true},
    {"log", 'l', false},
    {"clock-start", 0, true},
};

struct Parse {
  ParsedCommandLine parsed;
  std::vector<std::string> seen;  // the options the handler saw, as "name=value" or "name"
};

// Parses `arguments` (after a program name); the handler refuses the option named `refuse`.
Parse parse(std::vector<std::string> arguments, bool operandsAllowed = false, const std::string& refuse = "") {
  arguments.insert(arguments.begin(), "program");
  std::vector<char*> argv;
  for (auto& a : arguments) argv.push_back(a.data());
  argv.push_back(nullptr);
  Parse result;
  result.parsed = parseCommandLine(
      static_cast<int>(arguments.size()), argv.data(), kOptions,
      [&](std::string_view name, const char* value) -> std::string {
        result.seen.push_back(std::string(name) + (value ? "=" + std::string(value) : ""));
        return name == refuse ? "no " + std::string(name) + " here" : "";
      },
      operandsAllowed);
  return result;
}

TEST(CommandLineTest, OptionsReachTheHandlerInOrderInEveryForm) {
  const Parse p = parse({"-f", "json", "--log", "--format=text", "--clock-start", "5", "-lfjson"});
  EXPECT_EQ(p.parsed.request, Request::Run);
  EXPECT_EQ(p.seen, (std::vector<std::string>{"format=json", "log", "format=text", "clock-start=5", "log",
                                               "format=json"}));
}

TEST(CommandLineTest, HelpAndVersionAreEveryProgramsAndEndTheParse) {
  EXPECT_EQ(parse({"--help"}).parsed.request, Request::Help);
  EXPECT_EQ(parse({"-h"}).parsed.request, Request::Help);
  EXPECT_EQ(parse({"--version"}).parsed.request, Request::Version);
  EXPECT_EQ(parse({"-V", "--bogus"}).parsed.request, Request::Version);
  EXPECT_EQ(versionText("corvane-x"), std::string("corvane-x ") + kVersion + "\n");
}

TEST(CommandLineTest, UsageErrorsNameTheOptionAsItWasWritten) {
  EXPECT_EQ(parse({"--bogus"}).parsed.error, "unknown option '--bogus'");
  EXPECT_EQ(parse({"--bogus=1"}).parsed.error, "unknown option '--bogus'");
  EXPECT_EQ(parse({"--log", "-lx"}).parsed.error, "unknown option '-x'");
  EXPECT_EQ(parse({"--format"}).parsed.error, "option '--format' needs a value");
  EXPECT_EQ(parse({"-f"}).parsed.error, "option '-f' needs a value");
  EXPECT_EQ(parse({"--clock-start"}).parsed.error, "option '--clock-start' needs a value");
  const Parse bad = parse({"--bogus"});
  EXPECT_EQ(bad.parsed.request, Request::UsageError);
  EXPECT_TRUE(bad.seen.empty());
}

TEST(CommandLineTest, TheHandlersErrorEndsTheParse) {
  const Parse p = parse({"--log", "--format", "x", "--log"}, false, "format");
  EXPECT_EQ(p.parsed.request, Request::UsageError);
  EXPECT_EQ(p.parsed.error, "no format here");
  EXPECT_EQ(p.seen, (std::vector<std::string>{"log", "format=x"}));
}

TEST(CommandLineTest, OperandsAreRefusedUnlessAllowedAndMayStandAnywhere) {
  EXPECT_EQ(parse({"extra"}).parsed.error, "unexpected argument 'extra'");
  const Parse p = parse({"a", "--log", "-", "b"}, true);
  EXPECT_EQ(p.parsed.request, Request::Run);
  EXPECT_EQ(p.parsed.operands, (std::vector<std::string>{"a", "-", "b"}));
  EXPECT_EQ(p.seen, std::vector<std::string>{"log"});
}

TEST(CommandLineTest, EachParseStartsAfresh) {
  EXPECT_EQ(parse({"--bogus"}).parsed.request, Request::UsageError);
  EXPECT_EQ(parse({"--log"}).parsed.request, Request::Run);
  EXPECT_EQ(parse({"--log"}).seen, std::vector<std::string>{"log"});
}

TEST(CommandLineTest, HelpIsTheUsageThenTheDetails) {
  const ProgramUsage program{"corvane-x", "Usage: corvane-x\n", "\nDoes x.\n"};
  EXPECT_EQ(helpText(program), "Usage: corvane-x\n\nDoes x.\n");
}

}  // namespace
}  // namespace corvane

namespace corvane {
namespace {

TEST(CommandLineTest, AnOptionalValueIsGivenWithAnEqualsSignOrLeftOut) {
  constexpr CommandLineOption kWithOptional[] = {{"log", 'l', true, true}};
  std::vector<std::string> arguments{"program", "--log", "--log=stderr", "-lsyslog", "file"};
  std::vector<char*> argv;
  for (auto& a : arguments) argv.push_back(a.data());
  argv.push_back(nullptr);
  std::vector<std::string> seen;
  const ParsedCommandLine parsed = parseCommandLine(
      static_cast<int>(arguments.size()), argv.data(), kWithOptional,
      [&](std::string_view name, const char* value) {
        seen.push_back(std::string(name) + (value ? "=" + std::string(value) : ""));
        return std::string();
      },
      true);
  EXPECT_EQ(parsed.request, ParsedCommandLine::Request::Run);
  EXPECT_EQ(seen, (std::vector<std::string>{"log", "log=stderr", "log=syslog"}));
  // A value that stands apart is an operand, not the option's value.
  EXPECT_EQ(parsed.operands, std::vector<std::string>{"file"});
}

}  // namespace
}  // namespace corvane
