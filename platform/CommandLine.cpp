#include "platform/CommandLine.h"

#include <getopt.h>

#include <cstdio>

#include "platform/Version.h"

namespace corvane {

namespace {

// Options without a letter are told apart by codes above every character.
constexpr int kFirstLongOnlyCode = 256;

// The option as the user wrote it, for a message: "--name" without its value,
// or "-x" (also from inside a group such as "-lx").
std::string offendingOption(int argc, char** argv, int code) {
  const std::string argument = optind - 1 < argc && optind >= 1 ? argv[optind - 1] : "";
  if (argument.rfind("--", 0) == 0) return argument.substr(0, argument.find('='));
  if (code > 0 && code < kFirstLongOnlyCode) return std::string("-") + static_cast<char>(code);
  return argument;
}

}  // namespace

ParsedCommandLine parseCommandLine(int argc, char** argv, std::span<const CommandLineOption> options,
                                   const CommandLineOptionHandler& onOption, bool operandsAllowed) {
  std::vector<option> table;
  std::vector<int> codes;
  // The leading ':' makes a missing value come back as ':' rather than '?'.
  std::string letters = ":hV";
  for (std::size_t i = 0; i < options.size(); ++i) {
    const CommandLineOption& o = options[i];
    const int code = o.letter ? o.letter : kFirstLongOnlyCode + static_cast<int>(i);
    table.push_back({o.name, o.takesValue ? (o.valueOptional ? optional_argument : required_argument) : no_argument,
                     nullptr, code});
    codes.push_back(code);
    if (o.letter) {
      letters += o.letter;
      if (o.takesValue) letters += o.valueOptional ? "::" : ":";
    }
  }
  table.push_back({"help", no_argument, nullptr, 'h'});
  table.push_back({"version", no_argument, nullptr, 'V'});
  table.push_back({nullptr, 0, nullptr, 0});

  ParsedCommandLine parsed;
  const auto fail = [&parsed](std::string error) {
    parsed.request = ParsedCommandLine::Request::UsageError;
    parsed.error = std::move(error);
    return parsed;
  };
  // getopt keeps its state in globals: start afresh, and report errors here.
  optind = 0;
  opterr = 0;
  for (;;) {
    const int code = getopt_long(argc, argv, letters.c_str(), table.data(), nullptr);
    if (code == -1) break;
    if (code == 'h') {
      parsed.request = ParsedCommandLine::Request::Help;
      return parsed;
    }
    if (code == 'V') {
      parsed.request = ParsedCommandLine::Request::Version;
      return parsed;
    }
    if (code == ':') return fail("option '" + offendingOption(argc, argv, optopt) + "' needs a value");
    if (code == '?') return fail("unknown option '" + offendingOption(argc, argv, optopt) + "'");
    for (std::size_t i = 0; i < codes.size(); ++i) {
      if (codes[i] != code) continue;
      std::string error = onOption(options[i].name, options[i].takesValue ? optarg : nullptr);
      if (!error.empty()) return fail(std::move(error));
      break;
    }
  }
  for (int i = optind; i < argc; ++i) parsed.operands.emplace_back(argv[i]);
  if (!operandsAllowed && !parsed.operands.empty()) {
    return fail("unexpected argument '" + parsed.operands.front() + "'");
  }
  return parsed;
}

std::string versionText(std::string_view program) { return std::string(program) + " " + kVersion + "\n"; }

std::string helpText(const ProgramUsage& program) { return std::string(program.usage) + program.details; }

std::optional<int> answerCommandLine(const ParsedCommandLine& parsed, const ProgramUsage& program) {
  switch (parsed.request) {
    case ParsedCommandLine::Request::Run:
      return std::nullopt;
    case ParsedCommandLine::Request::Help:
      std::fputs(helpText(program).c_str(), stdout);
      return 0;
    case ParsedCommandLine::Request::Version:
      std::fputs(versionText(program.name).c_str(), stdout);
      return 0;
    case ParsedCommandLine::Request::UsageError:
      break;
  }
  return usageError(program, parsed.error);
}

int usageError(const ProgramUsage& program, const std::string& message) {
  std::fprintf(stderr, "%s: %s\n%s", program.name, message.c_str(), program.usage);
  return kExitUsage;
}

}  // namespace corvane
