#include "telephonyd/DiagPortSource.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/file.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

#include "platform/Log.h"
#include "telephonyd/LogRecord.h"

namespace corvane::telephonyd {

namespace {

constexpr std::size_t kReadChunk = 64 * 1024;
// How long a write may wait for room in the port.
constexpr int kWriteWaitMilliseconds = 200;

std::string codeText(std::uint32_t code) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%04X", static_cast<unsigned>(code));
  return text;
}

}  // namespace

std::unique_ptr<DiagPortSource> DiagPortSource::open(RunLoop& loop, std::string device, std::string technology,
                                                     std::string& error) {
  std::unique_ptr<DiagPortSource> source(new DiagPortSource(loop, std::move(device), std::move(technology)));
  if (!source->openDevice(error)) return nullptr;
  std::weak_ptr<bool> alive = source->alive_;
  DiagPortSource* self = source.get();
  source->reportTimer_ = loop.scheduleRepeatingTimer(kReportEvery, [self, alive] {
    if (!alive.expired()) self->report();
  });
  return source;
}

DiagPortSource::DiagPortSource(RunLoop& loop, std::string device, std::string technology)
    : loop_(loop), device_(std::move(device)), technology_(std::move(technology)), readBuffer_(kReadChunk) {}

DiagPortSource::~DiagPortSource() {
  // Leave the modem as it was found: its logging off.
  if (fd_ >= 0 && loggingOn_) writeFrame(diag::disableLoggingRequest(), false);
  closeDevice();
  for (RunLoop::Handle handle : {reopenTimer_, reportTimer_}) {
    if (handle) loop_.cancel(handle);
  }
  *alive_ = false;
}

bool DiagPortSource::openDevice(std::string& error) {
  const int fd = ::open(device_.c_str(), O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC);
  if (fd < 0) {
    error = device_ + ": cannot open: " + std::strerror(errno);
    return false;
  }
  if (::flock(fd, LOCK_EX | LOCK_NB) != 0) {
    const int why = errno;
    ::close(fd);
    error = why == EWOULDBLOCK ? device_ + ": in use: another program holds its lock (is another corvane-telephonyd "
                                           "bridging it?)"
                               : device_ + ": cannot lock: " + std::strerror(why);
    return false;
  }
  if (::isatty(fd)) {
    termios settings{};
    if (::tcgetattr(fd, &settings) == 0) {
      ::cfmakeraw(&settings);
      settings.c_cflag |= CLOCAL | CREAD;
      ::cfsetspeed(&settings, B115200);
      if (::tcsetattr(fd, TCSANOW, &settings) != 0) {
        const int why = errno;
        ::close(fd);
        error = device_ + ": cannot put the terminal in raw mode: " + std::strerror(why);
        return false;
      }
    }
  }
  fd_ = fd;
  // A fresh deframer: nothing of a frame cut off by the last closing is kept.
  const diag::FrameCounts& counts = deframer_.counts();
  deframed_.badCrc += counts.badCrc;
  deframed_.leadingBytes += counts.leadingBytes + counts.trailingBytes + counts.tooShort + counts.badEscape;
  deframed_.oversized += counts.oversized;
  deframer_ = diag::Deframer();
  std::weak_ptr<bool> alive = alive_;
  watch_ = loop_.watchReadable(fd_, [this, alive] {
    if (!alive.expired()) onReadable();
  });
  // The id ranges first: no mask bit may go beyond them.
  ranges_.reset();
  queueRequest(diag::retrieveIdRangesRequest());
  return true;
}

void DiagPortSource::closeDevice() {
  if (watch_) loop_.cancel(watch_);
  watch_ = 0;
  if (replyDeadline_) loop_.cancel(replyDeadline_);
  replyDeadline_ = 0;
  if (fd_ >= 0) ::close(fd_);
  fd_ = -1;
  requests_.clear();
  awaiting_.reset();
  ranges_.reset();
  sentMasks_.clear();
  loggingOn_ = false;
}

void DiagPortSource::deviceGone(const std::string& reason) {
  ++counts_.vanished;
  log::printf(log::kWarning, "Diagnostic port %s has gone (%s); its channels stay open, and it is tried again every "
              "second", device_.c_str(), reason.c_str());
  closeDevice();
  std::weak_ptr<bool> alive = alive_;
  reopenTimer_ = loop_.scheduleRepeatingTimer(kReopenEvery, [this, alive] {
    if (!alive.expired()) tryReopen();
  });
}

void DiagPortSource::tryReopen() {
  std::string error;
  if (!openDevice(error)) return;  // still away (or held by another program)
  loop_.cancel(reopenTimer_);
  reopenTimer_ = 0;
  log::printf(log::kNotice, "Diagnostic port %s is back", device_.c_str());
}

PacketSource::Availability DiagPortSource::availability() {
  return packets_.empty() ? Availability::Later : Availability::Ready;
}

SourcePacket DiagPortSource::nextPacket() {
  SourcePacket packet = std::move(packets_.front());
  packets_.pop_front();
  return packet;
}

void DiagPortSource::setWantedCodes(const std::set<std::uint32_t>& logCodes) {
  if (logCodes == wanted_) return;
  wanted_ = logCodes;
  applyMask();
}

void DiagPortSource::applyMask() {
  if (fd_ < 0 || !ranges_) return;  // set when the port is open and its ranges are known
  if (wanted_.empty()) {
    if (loggingOn_) queueRequest(diag::disableLoggingRequest());
    loggingOn_ = false;
    sentMasks_.clear();
    return;
  }
  std::set<std::uint32_t> outOfRange;
  const auto masks = diag::logMasks(wanted_, *ranges_, outOfRange);
  for (std::uint32_t code : outOfRange) {
    if (reportedOutOfRange_.insert(code).second) {
      log::printf(log::kWarning, "Diagnostic port %s: log code %s is beyond what the baseband logs; not asked for",
                  device_.c_str(), codeText(code).c_str());
    }
  }
  for (const auto& [id, mask] : masks) {
    auto sent = sentMasks_.find(id);
    // An id with nothing wanted needs no mask unless one was set before.
    const bool empty = std::all_of(mask.begin(), mask.end(), [](std::uint8_t b) { return b == 0; });
    if (sent == sentMasks_.end() ? empty : sent->second == mask) continue;
    queueRequest(diag::setMaskRequest(id, (*ranges_)[id] > 0x1000 ? 0x1000 : (*ranges_)[id], mask));
    sentMasks_[id] = mask;
  }
  loggingOn_ = true;
}

void DiagPortSource::queueRequest(std::vector<std::uint8_t> request) {
  requests_.push_back(std::move(request));
  if (!awaiting_) sendNextRequest();
}

void DiagPortSource::sendNextRequest() {
  while (!awaiting_ && !requests_.empty() && fd_ >= 0) {
    std::vector<std::uint8_t> request = std::move(requests_.front());
    requests_.pop_front();
    if (!writeFrame(request)) return;  // the port has gone
    awaiting_ = static_cast<diag::LogConfigOperation>(request[4]);
    std::weak_ptr<bool> alive = alive_;
    replyDeadline_ = loop_.dispatchAfter(kReplyTimeout, [this, alive, request = std::move(request)]() mutable {
      if (alive.expired()) return;
      replyDeadline_ = 0;
      ++counts_.unansweredRequests;
      const bool ranges = awaiting_ == diag::LogConfigOperation::RetrieveIdRanges;
      awaiting_.reset();
      // Without the ranges no mask can be set: ask again; other requests are not repeated.
      if (ranges) requests_.push_front(std::move(request));
      sendNextRequest();
    });
  }
}

bool DiagPortSource::writeFrame(std::span<const std::uint8_t> payload, bool noticeGone) {
  writeBuffer_.clear();
  diag::appendFrame(writeBuffer_, payload);
  std::size_t written = 0;
  while (written < writeBuffer_.size()) {
    const ssize_t n = ::write(fd_, writeBuffer_.data() + written, writeBuffer_.size() - written);
    if (n > 0) {
      written += static_cast<std::size_t>(n);
      continue;
    }
    if (n < 0 && errno == EINTR) continue;
    if (n < 0 && (errno == EAGAIN || errno == EWOULDBLOCK)) {
      pollfd ready{fd_, POLLOUT, 0};
      if (::poll(&ready, 1, kWriteWaitMilliseconds) > 0) continue;
      return true;  // the port takes nothing now: the request goes unanswered
    }
    if (noticeGone) deviceGone(std::string("cannot write: ") + std::strerror(errno));
    return false;
  }
  return true;
}

void DiagPortSource::onReadable() {
  bool arrived = false;
  const std::size_t before = packets_.size();
  for (;;) {
    const ssize_t n = ::read(fd_, readBuffer_.data(), readBuffer_.size());
    if (n > 0) {
      deframer_.feed(std::span<const std::uint8_t>(readBuffer_.data(), static_cast<std::size_t>(n)),
                     [this](const diag::Deframer::Frame& frame) { onFrame(frame.bytes); });
      if (fd_ < 0) break;  // a frame's handling found the port gone
      continue;
    }
    if (n < 0 && errno == EINTR) continue;
    if (n < 0 && (errno == EAGAIN || errno == EWOULDBLOCK)) break;
    deviceGone(n == 0 ? std::string("end of file") : std::string("cannot read: ") + std::strerror(errno));
    break;
  }
  arrived = packets_.size() > before;
  if (arrived && arrived_) arrived_();
}

void DiagPortSource::onFrame(std::span<const std::uint8_t> frame) {
  if (frame.empty()) return;
  if (frame[0] == diag::kSubscriptionCommand) {
    const auto inner = diag::unwrapSubscription(frame);
    const auto record = inner ? diag::logRecordOfFrame(*inner) : std::nullopt;
    if (record) takeRecord(*record);
    else ++counts_.notUnderstood;
    return;
  }
  if (frame[0] == diag::kLogCommand) {
    if (const auto record = diag::logRecordOfFrame(frame)) takeRecord(*record);
    else ++counts_.notUnderstood;
    return;
  }
  if (frame[0] == diag::kLogConfigCommand) {
    if (const auto reply = diag::parseLogConfigReply(frame)) {
      onReply(*reply);
      return;
    }
  }
  ++counts_.notUnderstood;
}

void DiagPortSource::takeRecord(std::span<const std::uint8_t> record) {
  ++counts_.records;
  auto packet = std::make_shared<Bytes>(record.size() + 1);
  (*packet)[0] = kLogTypeOrdinary;
  std::copy(record.begin(), record.end(), packet->begin() + 1);
  const std::uint32_t code = record[2] | static_cast<std::uint32_t>(record[3]) << 8;
  packets_.push_back({std::move(packet), code, {}});
}

void DiagPortSource::onReply(const diag::LogConfigReply& reply) {
  if (!awaiting_ || *awaiting_ != reply.operation) {
    ++counts_.notUnderstood;  // a reply to nothing we asked (or asked long ago)
    return;
  }
  if (replyDeadline_) loop_.cancel(replyDeadline_);
  replyDeadline_ = 0;
  awaiting_.reset();
  if (reply.status != 0) {
    ++counts_.refusedRequests;
    log::printf(log::kWarning, "Diagnostic port %s refused a log-configuration request (operation %u, status %u)",
                device_.c_str(), static_cast<unsigned>(reply.operation), static_cast<unsigned>(reply.status));
  } else if (reply.operation == diag::LogConfigOperation::RetrieveIdRanges) {
    ranges_ = reply.ranges;
    applyMask();
  }
  sendNextRequest();
}

void DiagPortSource::report() {
  const diag::FrameCounts& now = deframer_.counts();
  Counts total = counts_;
  total.badCrc = deframed_.badCrc + now.badCrc;
  total.strayBytes = deframed_.leadingBytes + now.leadingBytes + now.trailingBytes + now.tooShort + now.badEscape;
  total.oversized = deframed_.oversized + now.oversized;
  auto since = [](std::uint64_t a, std::uint64_t b) { return static_cast<unsigned long long>(a - b); };
  if (total.badCrc != reported_.badCrc || total.strayBytes != reported_.strayBytes ||
      total.oversized != reported_.oversized || total.notUnderstood != reported_.notUnderstood ||
      total.unansweredRequests != reported_.unansweredRequests) {
    log::printf(log::kWarning,
                "Diagnostic port %s in the last minute: %llu frames with a bad CRC, %llu stray bytes or runts between "
                "frames, %llu oversize frames, %llu frames not understood, %llu requests unanswered",
                device_.c_str(), since(total.badCrc, reported_.badCrc), since(total.strayBytes, reported_.strayBytes),
                since(total.oversized, reported_.oversized), since(total.notUnderstood, reported_.notUnderstood),
                since(total.unansweredRequests, reported_.unansweredRequests));
  }
  reported_ = total;
}

}  // namespace corvane::telephonyd
