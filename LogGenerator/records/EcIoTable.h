#pragma once

// The baseband's table from a linear Ec/Io (units of 2^-19, so 524288 is
// 0 dB) to whole decibels, and its inverse for encoders. Base::lookUpECNO
// reads through it; the simulator writes the values that it maps back.
//
// Header-only, like Field.h.

#include <array>
#include <cstdint>
#include <stdexcept>
#include <string>

namespace corvane::records {

struct EcIoStep {
  std::uint32_t above;  // the row applies when the value is greater than this
  std::int16_t decibels;
};

// Read from the top; the first row whose bound the value exceeds gives the
// result. The table is kept as it stands: the last two steps both give -31,
// and both the saturated top and the bottom give 0.
inline constexpr std::array<EcIoStep, 32> kEcIoSteps = {{
    {417647, -1}, {331808, -2}, {263624, -3}, {209463, -4}, {166441, -5}, {132268, -6}, {105123, -7},
    {83562, -8},  {66435, -9},  {52830, -10}, {42023, -11}, {33440, -12}, {26621, -13}, {21205, -14},
    {16903, -15}, {13486, -16}, {10771, -17}, {8615, -18},  {6902, -19},  {5542, -20},  {4461, -21},
    {3603, -22},  {2921, -23},  {2240, -24},  {1949, -25},  {1607, -26},  {1336, -27},  {1120, -28},
    {949, -29},   {813, -30},   {756, -31},   {705, -31},
}};
inline constexpr std::uint32_t kEcIoUnity = 524288;

constexpr std::int16_t ecIoDecibels(std::uint32_t linear) {
  if (linear >= kEcIoUnity) return 0;
  for (const EcIoStep& step : kEcIoSteps) {
    if (linear > step.above) return step.decibels;
  }
  return 0;
}

// The smallest linear value that shows as `decibels` (0 to -31). Throws
// std::out_of_range for a value the table does not give.
constexpr std::uint32_t ecIoLinearFor(int decibels) {
  if (decibels == 0) return kEcIoUnity;
  for (const EcIoStep& step : kEcIoSteps) {
    if (step.decibels == decibels) return step.above + 1;
  }
  throw std::out_of_range("no linear Ec/Io shows as " + std::to_string(decibels) + " dB");
}

}  // namespace corvane::records
