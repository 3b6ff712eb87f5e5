#pragma once

// One GSM/UMTS section made and registered as its class index makes it, with
// a container of its own; packets and cell lists laid out by hand.

#include <initializer_list>
#include <memory>
#include <string>
#include <utility>

#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"
#include "LogGenerator/logcode/Base.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"
#include "support/Packets.h"
#include "support/SectionFixture.h"
#include "support/Values.h"

namespace corvane::test {

template <class Section>
using GsmUmtsSectionTest = SectionTest<Section, &QND_GSMClassIndex::sections>;

template <class Section>
std::shared_ptr<Section> makeGsmUmtsSection(ClassDictionary& classDict, CodeDictionary& codeDict) {
  return makeSection<Section>(QND_GSMClassIndex::sections(), classDict, codeDict);
}

// A cell of the cell-monitor list: technology, type and numbers.
inline Value monitorCell(std::string_view technology, std::string_view type,
                         std::initializer_list<std::pair<std::string_view, Value>> numbers) {
  Dictionary cell;
  cell.set(CellMonitorCellRadioAccessTechnology, S(std::string(technology)));
  cell.set(CellMonitorCellType, S(std::string(type)));
  for (const auto& [k, v] : numbers) cell.set(k, v);
  return Value(cell);
}

// Extra code 0xFF0001: the cells as a binary property list behind the header.
inline Bytes cellListPacket(std::initializer_list<Value> cells) { return extraCodePacket(1, binaryBytes(A(cells))); }

// A cell list whose payload is no property list.
inline Bytes brokenCellListPacket() {
  const Bytes junk = {'n', 'o', 't', ' ', 'a', ' ', 'l', 'i', 's', 't'};
  return extraCodePacket(1, junk);
}

inline const std::string kGsm(CellMonitorRadioAccessTechnologyGSM);
inline const std::string kUmts(CellMonitorRadioAccessTechnologyUMTS);
inline const std::string kLte(CellMonitorRadioAccessTechnologyLTE);
inline const std::string kServing(CellMonitorCellTypeServing);
inline const std::string kNeighbor(CellMonitorCellTypeNeighbor);

inline std::vector<log::Line> errorsAfter(const char* trace, std::initializer_list<const char*> errors) {
  std::vector<log::Line> lines = {{log::kWarning, trace}};
  for (const char* e : errors) lines.push_back({log::kError, e});
  return lines;
}

}  // namespace corvane::test
