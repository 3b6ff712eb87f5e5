#pragma once

// The telephony service's technology values, shared by the application and the
// service. Each value is the text of its name.

#include <array>
#include <string_view>

namespace corvane {

inline constexpr std::string_view kLogChannelTechnologyQuendraCDMA = "Quendra_CDMA";
inline constexpr std::string_view kLogChannelTechnologyQuendraGSM = "Quendra_GSM";
inline constexpr std::string_view kLogChannelTechnologyQuendraLTE = "Quendra_LTE";
inline constexpr std::string_view kLogChannelTechnologyQuendraUTRAN2 = "Quendra_UTRAN2";
inline constexpr std::string_view kLogChannelTechnologyIFX = "IFX";

inline constexpr std::array<std::string_view, 5> kAllLogChannelTechnologies = {
    kLogChannelTechnologyIFX, kLogChannelTechnologyQuendraGSM, kLogChannelTechnologyQuendraCDMA,
    kLogChannelTechnologyQuendraLTE, kLogChannelTechnologyQuendraUTRAN2};

}  // namespace corvane
