#include "telephonyd/IFXSimulator.h"

#include <algorithm>
#include <cstdio>
#include <string>

#include "platform/LogChannelTechnology.h"
#include "platform/PropertyList.h"

namespace corvane::telephonyd {

namespace {

constexpr int kRxLevAccessMin = 8;  // cells below this level are not usable
constexpr int kHandoverMargin = 6;  // dB a neighbour must lead by ...
constexpr int kHandoverPeriods = 3;  // ... for this many periods in a row

std::string number(long long value) { return std::to_string(value); }

std::string levelText(int rxLev) { return number(rxLev - 110) + " dBm"; }

}  // namespace

IFXSimulator::IFXSimulator(std::uint64_t seed, std::chrono::nanoseconds packetInterval)
    : random_(seed), packetInterval_(packetInterval) {
  // Seven distinct channels of the GSM 900 band, a few apart as a planner would set them.
  std::vector<int> arfcns;
  int arfcn = uniform(1, 40);
  for (std::size_t i = 0; i <= kNeighbourCount; ++i) {
    arfcns.push_back(arfcn);
    arfcn += uniform(3, 11);
  }
  // Fisher-Yates on our own mapping: std::shuffle differs between libraries.
  for (std::size_t i = arfcns.size() - 1; i > 0; --i) {
    std::swap(arfcns[i], arfcns[static_cast<std::size_t>(uniform(0, static_cast<int>(i)))]);
  }

  const int lac = uniform(0x1000, 0x7FFF);
  auto makeCell = [&](int channel) {
    Cell cell;
    // Most neighbours share the serving location area; some lie across its border.
    cell.lac = uniform(0, 3) == 0 ? lac + uniform(1, 9) : lac;
    cell.cellId = uniform(1, 65535);
    cell.arfcn = channel;
    cell.ncc = uniform(0, 7);
    cell.bcc = uniform(0, 7);
    return cell;
  };
  serving_ = makeCell(arfcns[0]);
  serving_.rxLev = uniform(30, 45);
  for (std::size_t i = 1; i <= kNeighbourCount; ++i) {
    Cell cell = makeCell(arfcns[i]);
    cell.rxLev = std::max(kRxLevAccessMin, serving_.rxLev - uniform(3, 20));
    neighbours_.push_back(cell);
  }
  rxQual_ = 1;
  timingAdvance_ = uniform(0, 8);
}

std::string_view IFXSimulator::technology() const { return kLogChannelTechnologyIFX; }

void IFXSimulator::advance() {
  ++period_;
  serving_.rxLev = std::clamp(serving_.rxLev + uniform(-2, 2), 10, 55);
  for (Cell& cell : neighbours_) {
    cell.rxLev = std::clamp(cell.rxLev + uniform(-2, 2), 0, 55);
    cell.strongerPeriods = cell.rxLev >= serving_.rxLev + kHandoverMargin ? cell.strongerPeriods + 1 : 0;
  }
  // Quality degrades as the level falls, with some noise.
  rxQual_ = std::clamp((45 - serving_.rxLev) / 5 + uniform(-1, 1), 0, 7);
  if (uniform(0, 9) == 0) timingAdvance_ = std::clamp(timingAdvance_ + uniform(-1, 1), 0, 63);

  auto best = std::max_element(neighbours_.begin(), neighbours_.end(),
                               [](const Cell& a, const Cell& b) { return a.rxLev < b.rxLev; });
  if (best != neighbours_.end() && best->strongerPeriods >= kHandoverPeriods) {
    std::swap(serving_, *best);
    serving_.strongerPeriods = 0;
    best->strongerPeriods = 0;
    timingAdvance_ = uniform(0, 8);
    ++handovers_;
  }
}

Dictionary IFXSimulator::cellFields(const Cell& cell) const {
  Dictionary fields;
  fields.set("LAC", Value(number(cell.lac)));
  fields.set("Cell ID", Value(number(cell.cellId)));
  fields.set("ARFCN", Value(number(cell.arfcn)));
  fields.set("BSIC", Value(number(cell.ncc) + "-" + number(cell.bcc)));
  fields.set("RxLev", Value(levelText(cell.rxLev)));
  // Path-loss criteria of idle-mode reselection, without offsets.
  fields.set("C1", Value(number(cell.rxLev - kRxLevAccessMin)));
  fields.set("C2", Value(number(cell.rxLev - kRxLevAccessMin)));
  return fields;
}

Value IFXSimulator::report() const {
  Dictionary network;
  network.set("MCC", Value("001"));
  network.set("MNC", Value("01"));
  network.set("Operator", Value("Test Network"));
  network.set("Technology", Value("GSM"));

  Dictionary serving = cellFields(serving_);
  serving.set("Band", Value("GSM 900"));
  serving.set("RxQual", Value(number(rxQual_)));
  serving.set("Timing Advance", Value(number(timingAdvance_)));

  // Strongest first, as the baseband sorts its neighbour list.
  std::vector<const Cell*> order;
  for (const Cell& cell : neighbours_) order.push_back(&cell);
  std::stable_sort(order.begin(), order.end(), [](const Cell* a, const Cell* b) { return a->rxLev > b->rxLev; });
  Array neighbours;
  neighbours.append(Value("Neighbour Cells"));
  for (const Cell* cell : order) neighbours.append(Value(cellFields(*cell)));

  Dictionary status;
  status.set("Measurement Period", Value(number(static_cast<long long>(period_))));
  status.set("Handovers", Value(number(static_cast<long long>(handovers_))));

  Dictionary root;
  root.set("Network", Value(network));
  root.set("Serving Cell", Value(serving));
  root.set("Neighbour Cells", Value(neighbours));
  root.set("Status", Value(status));
  return Value(root);
}

SourcePacket IFXSimulator::nextPacket() {
  const auto at = packetInterval_ * static_cast<std::int64_t>(packetIndex_++);
  const auto period = static_cast<std::uint64_t>(at / kMeasurementPeriod);
  bool changed = !cached_;
  while (period_ < period) {
    advance();
    changed = true;
  }
  // Serialising is by far the most expensive part of a packet; the report only
  // changes once per measurement period, so the bytes are reused until then.
  if (changed) cached_ = std::make_shared<const Bytes>(plist::serializeOrThrow(report(), plist::Format::Binary));
  return {cached_, std::nullopt};
}

}  // namespace corvane::telephonyd
