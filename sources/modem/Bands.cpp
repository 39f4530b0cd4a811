#include "sources/modem/Bands.h"

#include <array>

namespace pyx::modem {

namespace {

struct ChannelRange {
    std::uint32_t band;
    std::uint32_t first;
    std::uint32_t last;
};

// Downlink EARFCN ranges, N_Offs-DL to the band's last channel.
constexpr std::array kLteBands = {
    ChannelRange{1, 0, 599},        ChannelRange{2, 600, 1199},     ChannelRange{3, 1200, 1949},
    ChannelRange{4, 1950, 2399},    ChannelRange{5, 2400, 2649},    ChannelRange{6, 2650, 2749},
    ChannelRange{7, 2750, 3449},    ChannelRange{8, 3450, 3799},    ChannelRange{9, 3800, 4149},
    ChannelRange{10, 4150, 4749},   ChannelRange{11, 4750, 4949},   ChannelRange{12, 5010, 5179},
    ChannelRange{13, 5180, 5279},   ChannelRange{14, 5280, 5379},   ChannelRange{17, 5730, 5849},
    ChannelRange{18, 5850, 5999},   ChannelRange{19, 6000, 6149},   ChannelRange{20, 6150, 6449},
    ChannelRange{21, 6450, 6599},   ChannelRange{22, 6600, 7399},   ChannelRange{23, 7500, 7699},
    ChannelRange{24, 7700, 8039},   ChannelRange{25, 8040, 8689},   ChannelRange{26, 8690, 9039},
    ChannelRange{27, 9040, 9209},   ChannelRange{28, 9210, 9659},   ChannelRange{29, 9660, 9769},
    ChannelRange{30, 9770, 9869},   ChannelRange{31, 9870, 9919},   ChannelRange{32, 9920, 10359},
    ChannelRange{33, 36000, 36199}, ChannelRange{34, 36200, 36349}, ChannelRange{35, 36350, 36949},
    ChannelRange{36, 36950, 37549}, ChannelRange{37, 37550, 37749}, ChannelRange{38, 37750, 38249},
    ChannelRange{39, 38250, 38649}, ChannelRange{40, 38650, 39649}, ChannelRange{41, 39650, 41589},
    ChannelRange{42, 41590, 43589}, ChannelRange{43, 43590, 45589}, ChannelRange{44, 45590, 46589},
    ChannelRange{45, 46590, 46789}, ChannelRange{46, 46790, 54539}, ChannelRange{47, 54540, 55239},
    ChannelRange{48, 55240, 56739}, ChannelRange{49, 56740, 58239}, ChannelRange{50, 58240, 59089},
    ChannelRange{51, 59090, 59139}, ChannelRange{52, 59140, 60139}, ChannelRange{53, 60140, 60254},
    ChannelRange{65, 65536, 66435}, ChannelRange{66, 66436, 67335}, ChannelRange{67, 67336, 67535},
    ChannelRange{68, 67536, 67835}, ChannelRange{69, 67836, 68335}, ChannelRange{70, 68336, 68585},
    ChannelRange{71, 68586, 68935}, ChannelRange{72, 68936, 68985}, ChannelRange{73, 68986, 69035},
    ChannelRange{74, 69036, 69465}, ChannelRange{75, 69466, 70315}, ChannelRange{76, 70316, 70365},
    ChannelRange{85, 70366, 70545}, ChannelRange{87, 70546, 70595}, ChannelRange{88, 70596, 70645},
};

// Downlink UARFCN ranges of the FDD bands: the general channels, then the additional ones
// (each additional channel of a band lies on a 25-channel raster from the range's first).
constexpr std::array kUmtsGeneral = {
    ChannelRange{1, 10562, 10838}, ChannelRange{2, 9662, 9938},  ChannelRange{3, 1162, 1513},
    ChannelRange{4, 1537, 1738},   ChannelRange{5, 4357, 4458},  ChannelRange{6, 4387, 4413},
    ChannelRange{7, 2237, 2563},   ChannelRange{8, 2937, 3088},  ChannelRange{9, 9237, 9387},
    ChannelRange{10, 3112, 3388},  ChannelRange{11, 3712, 3787}, ChannelRange{12, 3842, 3903},
    ChannelRange{13, 4017, 4043},  ChannelRange{14, 4117, 4143}, ChannelRange{19, 712, 763},
    ChannelRange{20, 4512, 4638},  ChannelRange{21, 862, 912},   ChannelRange{22, 4662, 5038},
    ChannelRange{25, 5112, 5413},  ChannelRange{26, 5762, 5913},
};
constexpr std::array kUmtsAdditional = {
    ChannelRange{2, 412, 687},    ChannelRange{4, 1887, 2087},  ChannelRange{6, 1037, 1062},
    ChannelRange{7, 2587, 2912},  ChannelRange{10, 3412, 3687}, ChannelRange{13, 4067, 4092},
    ChannelRange{14, 4167, 4192}, ChannelRange{19, 787, 837},   ChannelRange{25, 6292, 6592},
    ChannelRange{26, 5987, 6087},
};
// Additional channels off that raster.
struct Channel {
    std::uint32_t band;
    std::uint32_t uarfcn;
};
constexpr std::array kUmtsAdditionalSingles = {
    Channel{5, 1007},  Channel{5, 1012},  Channel{5, 1032},  Channel{5, 1037},
    Channel{5, 1062},  Channel{5, 1087},  Channel{12, 3932}, Channel{12, 3957},
    Channel{12, 3962}, Channel{12, 3987}, Channel{12, 3992},
};

}  // namespace

std::optional<std::uint32_t> lteBandOfEarfcn(std::uint32_t earfcn) {
    for (const auto& range : kLteBands)
        if (earfcn >= range.first && earfcn <= range.last) return range.band;
    return std::nullopt;
}

std::optional<std::uint32_t> umtsBandOfUarfcn(std::uint32_t uarfcn) {
    std::optional<std::uint32_t> found;
    const auto consider = [&](std::uint32_t band) {
        if (found && *found != band) return false;  // in two bands: not derivable
        found = band;
        return true;
    };
    for (const auto& range : kUmtsGeneral)
        if (uarfcn >= range.first && uarfcn <= range.last && !consider(range.band))
            return std::nullopt;
    for (const auto& range : kUmtsAdditional)
        if (uarfcn >= range.first && uarfcn <= range.last && (uarfcn - range.first) % 25 == 0 &&
            !consider(range.band))
            return std::nullopt;
    for (const auto& channel : kUmtsAdditionalSingles)
        if (uarfcn == channel.uarfcn && !consider(channel.band)) return std::nullopt;
    return found;
}

std::optional<std::uint32_t> wcdmaBandCode(std::uint32_t band) {
    if (band >= 1 && band <= 9) return 79 + band;  // SYS_BAND_WCDMA_I_IMT_2000 = 80 ...
    if (band == 11) return 90;
    if (band == 19) return 91;
    return std::nullopt;
}

}  // namespace pyx::modem
