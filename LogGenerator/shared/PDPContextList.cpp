#include "LogGenerator/shared/PDPContextList.h"

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "platform/Log.h"

namespace corvane {

void PDPContextList::updateWithData(std::span<const std::uint8_t> data, std::uint32_t /*logCode*/) {
  log::printf(log::kWarning, "PDPContextList");
  // Only 0xFF0002 is ever delivered here, so the code is not tested.
  const LogCode_0xFF0002 contexts(data);
  const Array* received = contexts.array();
  if (!received) return;
  if (auto list = sectionArray()) replaceArray(*list, *received);
}

}  // namespace corvane
