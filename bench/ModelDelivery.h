#pragma once

// What the service-to-model benches share: corvane-telephonyd started with
// the arguments given, and the monitor model (what the application and
// corvane-monitor run) fed over the real sockets until a number of packets
// has reached its generator, timed from the first packet to the last.

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <QCoreApplication>
#include <QTimer>

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "model/CorvaneModel.h"
#include "platform/QtRunLoop.h"
#include "platform/SocketMessagePort.h"
#include "platform/SocketTelephonyClient.h"
#include "platform/Uuid.h"

namespace corvane::bench {

using DeliveryClock = std::chrono::steady_clock;

// Counts packets and the time from the first to the last; decodes with
// `inner` when given; asks for the codes of `startCommand`.
class TimingGenerator final : public LogGenerator {
 public:
  TimingGenerator(std::unique_ptr<LogGenerator> inner, Dictionary startCommand)
      : inner_(std::move(inner)), startCommand_(std::move(startCommand)) {}
  void updateState(const Dictionary& state, std::span<const std::uint8_t> data) override {
    if (packets_ == 0) first_ = DeliveryClock::now();
    ++packets_;
    bytes_ += data.size();
    last_ = DeliveryClock::now();
    if (inner_) inner_->updateState(state, data);
    if (packets_ == target_) QCoreApplication::quit();
  }
  Value generateLogUsingState(const Dictionary& state) override {
    return inner_ ? inner_->generateLogUsingState(state) : Value();
  }
  Dictionary getStartCommand() override { return startCommand_; }
  Value getSaveContentsFromState(const Dictionary&) override { return Value(); }

  static inline unsigned long long target_ = 0;
  static inline unsigned long long packets_ = 0;
  static inline unsigned long long bytes_ = 0;
  static inline DeliveryClock::time_point first_, last_;

 private:
  std::unique_ptr<LogGenerator> inner_;
  Dictionary startCommand_;
};

struct NoScreens final : CorvaneModelDelegate {
  void updateViewControllerFromModel() override {}
};

// Starts the service with `arguments`, runs the model until `packets` have
// arrived (or two minutes have passed), prints one line and returns 0 when
// none was lost.
inline int runDelivery(const std::string& daemon, const std::vector<std::string>& arguments,
                       const std::filesystem::path& runtime, unsigned long long packets, const std::string& label,
                       const std::function<std::unique_ptr<LogGenerator>()>& makeGenerator) {
  TimingGenerator::target_ = packets;
  TimingGenerator::packets_ = TimingGenerator::bytes_ = 0;

  const pid_t pid = fork();
  if (pid == 0) {
    std::vector<char*> argv{const_cast<char*>(daemon.c_str())};
    for (const std::string& argument : arguments) argv.push_back(const_cast<char*>(argument.c_str()));
    argv.push_back(nullptr);
    execv(daemon.c_str(), argv.data());
    _exit(127);
  }
  const auto socket = runtime / "corvane-telephonyd.sock";
  for (int i = 0; i < 500 && !std::filesystem::exists(socket); ++i) usleep(10000);

  QtRunLoop loop;
  SocketPortSystem ports(runtime);
  SocketTelephonyClient telephony(ports);
  NoScreens screens;
  {
    CorvaneModel model(
        CorvaneModelEnvironment{loop, ports, telephony, &makeUUIDText,
                                [&makeGenerator](std::string_view) { return makeGenerator(); }},
        &screens);
    loop.dispatchAsync([&model] { model.startMonitor(); });
    QTimer::singleShot(120000, [] { QCoreApplication::quit(); });
    QCoreApplication::exec();
  }
  kill(pid, SIGTERM);
  waitpid(pid, nullptr, 0);

  const double seconds =
      std::chrono::duration<double>(TimingGenerator::last_ - TimingGenerator::first_).count();
  std::printf("%-22s %10llu of %llu packets, %6.1f MB, %7.3f s: %12.0f packets/s%s\n", label.c_str(),
              TimingGenerator::packets_, packets, static_cast<double>(TimingGenerator::bytes_) / 1e6, seconds,
              seconds > 0 ? static_cast<double>(TimingGenerator::packets_ - 1) / seconds : 0.0,
              TimingGenerator::packets_ == packets ? "" : "  (PACKETS LOST)");
  std::fflush(stdout);
  return TimingGenerator::packets_ == packets ? 0 : 1;
}

}  // namespace corvane::bench
