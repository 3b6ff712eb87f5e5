// The diagnostic-port deframer over arbitrary streams, fed in pieces whose
// sizes the input picks. Besides the sanitizers' checks: every frame handed
// over fits the largest frame, a good frame's CRC holds, and framing the
// frames again and reading them back gives the same frames.

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <span>
#include <vector>

#include "platform/DiagFrames.h"

using namespace corvane;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 1) return 0;
  const std::size_t piece = 1 + data[0] % 64;
  const std::span<const std::uint8_t> stream(data + 1, size - 1);

  diag::Deframer deframer((data[0] & 0x80) != 0, 4096);
  std::vector<std::vector<std::uint8_t>> goodFrames;
  std::vector<std::uint8_t> reframed;
  auto onFrame = [&](const diag::Deframer::Frame& frame) {
    if (frame.bytes.size() + 2 > 4096 || frame.bytes.empty()) std::abort();
    if (frame.crcGood) {
      goodFrames.emplace_back(frame.bytes.begin(), frame.bytes.end());
      diag::appendFrame(reframed, frame.bytes);
    }
  };
  for (std::size_t at = 0; at < stream.size(); at += piece) {
    deframer.feed(stream.subspan(at, std::min(piece, stream.size() - at)), onFrame);
  }
  deframer.finish();

  diag::Deframer again;
  std::size_t next = 0;
  again.feed(reframed, [&](const diag::Deframer::Frame& frame) {
    if (!frame.crcGood || next == goodFrames.size() ||
        !std::equal(frame.bytes.begin(), frame.bytes.end(), goodFrames[next].begin(), goodFrames[next].end())) {
      std::abort();
    }
    ++next;
  });
  again.finish();
  if (next != goodFrames.size() || again.counts().skipped() != 0) std::abort();
  return 0;
}
