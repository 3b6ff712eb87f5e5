// corvane-monitor, run as a user runs it, against the real service.

#include <gtest/gtest.h>

#include <signal.h>

#include <chrono>
#include <filesystem>
#include <sstream>
#include <thread>

#include <nlohmann/json.hpp>

#include "platform/Version.h"
#include "support/Process.h"

namespace corvane {
namespace {

const std::string kService = CORVANE_TELEPHONYD_BINARY;
const std::string kMonitor = CORVANE_MONITOR_BINARY;

std::string valueAt(const nlohmann::json& node, const std::vector<std::string>& path) {
  const nlohmann::json* at = &node;
  for (const auto& name : path) {
    const nlohmann::json* next = nullptr;
    if (at->contains("children")) {
      for (const auto& child : (*at)["children"]) {
        if (child["name"] == name) next = &child;
      }
    }
    if (!next) return "";
    at = next;
  }
  return at->contains("value") ? (*at)["value"].get<std::string>() : "";
}

TEST(MonitorTool, PrintsOneJsonTreePerUpdateAndStopsAfterN) {
  test::TemporaryDirectory dir;
  const std::string env = "CORVANE_RUNTIME_DIR=" + dir.path();
  const int service = test::startProcess({kService, "--rate", "20"}, {env});
  for (int i = 0; i < 500 && !std::filesystem::exists(dir.path() + "/corvane-telephonyd.sock"); ++i) {
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  const auto r = test::runProcess({kMonitor, "--format", "json", "--updates", "2"}, "", {env});
  EXPECT_EQ(test::stopProcess(service, SIGTERM), 0);
  ASSERT_EQ(r.exitCode, 0) << r.err;
  std::istringstream lines(r.out);
  std::string line;
  int documents = 0;
  while (std::getline(lines, line)) {
    const auto tree = nlohmann::json::parse(line);
    EXPECT_EQ(tree["name"], "Corvane");
    EXPECT_EQ(valueAt(tree, {"Network", "MCC"}), "001");
    EXPECT_NE(valueAt(tree, {"Serving Cell", "ARFCN"}), "");
    ++documents;
  }
  EXPECT_EQ(documents, 2);
}

TEST(MonitorTool, BadUsageExitsWithTwo) {
  for (const auto& args : std::vector<std::vector<std::string>>{
           {kMonitor, "--updates", "0"}, {kMonitor, "--format", "xml"}, {kMonitor, "--bogus"}, {kMonitor, "extra"}}) {
    const auto r = test::runProcess(args);
    EXPECT_EQ(r.exitCode, 2) << args.back();
    EXPECT_NE(r.err.find("Usage: corvane-monitor"), std::string::npos) << r.err;
  }
  const auto unknown = test::runProcess({kMonitor, "--bogus"});
  EXPECT_EQ(unknown.err.rfind("corvane-monitor: unknown option '--bogus'\n", 0), 0u) << unknown.err;
  EXPECT_EQ(unknown.out, "");
}

TEST(MonitorTool, HelpAndVersionNameTheProgramAndExitWithZero) {
  const auto help = test::runProcess({kMonitor, "--help"});
  EXPECT_EQ(help.exitCode, 0);
  EXPECT_EQ(help.out.rfind("Usage: corvane-monitor", 0), 0u);
  EXPECT_NE(help.out.find("--updates N"), std::string::npos);
  const auto version = test::runProcess({kMonitor, "--version"});
  EXPECT_EQ(version.exitCode, 0);
  EXPECT_EQ(version.out, std::string("corvane-monitor ") + kVersion + "\n");
}

TEST(MonitorTool, AnUnusableRuntimeDirectoryIsAOneLineError) {
  test::TemporaryDirectory dir;
  const std::string file = dir.write("not-a-directory", "");
  const auto r = test::runProcess({kMonitor}, "", {"CORVANE_RUNTIME_DIR=" + file});
  EXPECT_EQ(r.exitCode, 1);
  EXPECT_EQ(r.err.rfind("corvane-monitor: ", 0), 0u) << r.err;
  EXPECT_EQ(std::count(r.err.begin(), r.err.end(), '\n'), 1) << r.err;
}

}  // namespace
}  // namespace corvane
