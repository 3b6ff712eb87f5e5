#pragma once

// The programs' command lines, read with getopt_long. Every program knows
// --help (-h) and --version (-V), names itself in what it prints, and answers
// a command line it cannot use with a one-line reason and exit status 2.

#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace corvane {

inline constexpr int kExitUsage = 2;

// One option of a program; --help and --version need no entry.
struct CommandLineOption {
  const char* name;        // the long form, without "--"
  char letter = 0;         // the short form; 0 for none
  bool takesValue = false;
  // With takesValue: the value may be left out ("--log" or "--log=stderr";
  // a value left out is passed as nullptr). It is then given only with "=",
  // or right behind the letter.
  bool valueOptional = false;
};

// How a program presents itself on the command line.
struct ProgramUsage {
  const char* name;         // "corvane-decode"
  const char* usage;        // the usage line(s), each ending in "\n"
  const char* details = ""; // what --help prints below the usage: a blank line, what it does, its options
};

struct ParsedCommandLine {
  enum class Request { Run, Help, Version, UsageError };
  Request request = Request::Run;
  std::string error;                  // for UsageError: one line, without the program name
  std::vector<std::string> operands;  // the arguments that are no options, in order
};

// Called with each option given, in order: its long name and its value
// (nullptr for an option without one). Returns "" to go on, or the one-line
// error that ends the parse.
using CommandLineOptionHandler = std::function<std::string(std::string_view name, const char* value)>;

// Reads argv[1..argc). --help and --version end the parse at once; so does the
// first unknown option, missing value or error of `onOption`. Operands may
// stand anywhere; they are refused ("unexpected argument 'x'") unless
// `operandsAllowed`.
ParsedCommandLine parseCommandLine(int argc, char** argv, std::span<const CommandLineOption> options,
                                   const CommandLineOptionHandler& onOption, bool operandsAllowed = false);

// "<program> <project version>\n".
std::string versionText(std::string_view program);
// The usage, then the details.
std::string helpText(const ProgramUsage& program);

// Prints what a parse that asks for no run asks for and returns the exit
// status: the help or the version on standard output (0), or the error and
// the usage on standard error (kExitUsage). Nothing for a parse that asks to run.
std::optional<int> answerCommandLine(const ParsedCommandLine& parsed, const ProgramUsage& program);

// Prints "<program>: <message>" and the usage on standard error; returns kExitUsage.
int usageError(const ProgramUsage& program, const std::string& message);

}  // namespace corvane
