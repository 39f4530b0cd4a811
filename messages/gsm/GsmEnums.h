// Enumerations of the GSM messages: named constants and name tables.
#pragma once

#include <cstdint>

#include "messages/EnumTable.h"

// The system band, shared by gsm_band and wcdma_band (78 names).
// clang-format off
#define PYX_ENUM_SysBand(E)            \
    E(0, SYS_BAND_BC0)                 \
    E(1, SYS_BAND_BC1)                 \
    E(3, SYS_BAND_BC3)                 \
    E(4, SYS_BAND_BC4)                 \
    E(5, SYS_BAND_BC5)                 \
    E(6, SYS_BAND_BC6)                 \
    E(7, SYS_BAND_BC7)                 \
    E(8, SYS_BAND_BC8)                 \
    E(9, SYS_BAND_BC9)                 \
    E(10, SYS_BAND_BC10)               \
    E(11, SYS_BAND_BC11)               \
    E(12, SYS_BAND_BC12)               \
    E(13, SYS_BAND_BC13)               \
    E(14, SYS_BAND_BC14)               \
    E(15, SYS_BAND_BC15)               \
    E(16, SYS_BAND_BC16)               \
    E(17, SYS_BAND_BC17)               \
    E(18, SYS_BAND_BC18)               \
    E(19, SYS_BAND_BC19)               \
    E(40, SYS_BAND_GSM_450)            \
    E(41, SYS_BAND_GSM_480)            \
    E(42, SYS_BAND_GSM_750)            \
    E(43, SYS_BAND_GSM_850)            \
    E(44, SYS_BAND_GSM_EGSM_900)       \
    E(45, SYS_BAND_GSM_PGSM_900)       \
    E(46, SYS_BAND_GSM_RGSM_900)       \
    E(47, SYS_BAND_GSM_DCS_1800)       \
    E(48, SYS_BAND_GSM_PCS_1900)       \
    E(80, SYS_BAND_WCDMA_I_IMT_2000)   \
    E(81, SYS_BAND_WCDMA_II_PCS_1900)  \
    E(82, SYS_BAND_WCDMA_III_1700)     \
    E(83, SYS_BAND_WCDMA_IV_1700)      \
    E(84, SYS_BAND_WCDMA_V_850)        \
    E(85, SYS_BAND_WCDMA_VI_800)       \
    E(86, SYS_BAND_WCDMA_VII_2600)     \
    E(87, SYS_BAND_WCDMA_VIII_900)     \
    E(88, SYS_BAND_WCDMA_IX_1700)      \
    E(90, SYS_BAND_WCDMA_XI_1500)      \
    E(91, SYS_BAND_WCDMA_XIX_850)      \
    E(120, SYS_BAND_LTE_EUTRAN_BAND1)  \
    E(121, SYS_BAND_LTE_EUTRAN_BAND2)  \
    E(122, SYS_BAND_LTE_EUTRAN_BAND3)  \
    E(123, SYS_BAND_LTE_EUTRAN_BAND4)  \
    E(124, SYS_BAND_LTE_EUTRAN_BAND5)  \
    E(125, SYS_BAND_LTE_EUTRAN_BAND6)  \
    E(126, SYS_BAND_LTE_EUTRAN_BAND7)  \
    E(127, SYS_BAND_LTE_EUTRAN_BAND8)  \
    E(128, SYS_BAND_LTE_EUTRAN_BAND9)  \
    E(129, SYS_BAND_LTE_EUTRAN_BAND10) \
    E(130, SYS_BAND_LTE_EUTRAN_BAND11) \
    E(131, SYS_BAND_LTE_EUTRAN_BAND12) \
    E(132, SYS_BAND_LTE_EUTRAN_BAND13) \
    E(133, SYS_BAND_LTE_EUTRAN_BAND14) \
    E(136, SYS_BAND_LTE_EUTRAN_BAND17) \
    E(137, SYS_BAND_LTE_EUTRAN_BAND18) \
    E(138, SYS_BAND_LTE_EUTRAN_BAND19) \
    E(139, SYS_BAND_LTE_EUTRAN_BAND20) \
    E(140, SYS_BAND_LTE_EUTRAN_BAND21) \
    E(143, SYS_BAND_LTE_EUTRAN_BAND24) \
    E(144, SYS_BAND_LTE_EUTRAN_BAND25) \
    E(145, SYS_BAND_LTE_EUTRAN_BAND26) \
    E(152, SYS_BAND_LTE_EUTRAN_BAND33) \
    E(153, SYS_BAND_LTE_EUTRAN_BAND34) \
    E(154, SYS_BAND_LTE_EUTRAN_BAND35) \
    E(155, SYS_BAND_LTE_EUTRAN_BAND36) \
    E(156, SYS_BAND_LTE_EUTRAN_BAND37) \
    E(157, SYS_BAND_LTE_EUTRAN_BAND38) \
    E(158, SYS_BAND_LTE_EUTRAN_BAND39) \
    E(159, SYS_BAND_LTE_EUTRAN_BAND40) \
    E(160, SYS_BAND_LTE_EUTRAN_BAND41) \
    E(161, SYS_BAND_LTE_EUTRAN_BAND42) \
    E(162, SYS_BAND_LTE_EUTRAN_BAND43) \
    E(163, SYS_BAND_UMTS_BAND1)        \
    E(164, SYS_BAND_UMTS_BAND2)        \
    E(165, SYS_BAND_UMTS_BAND3)        \
    E(166, SYS_BAND_UMTS_BAND4)        \
    E(167, SYS_BAND_UMTS_BAND5)        \
    E(168, SYS_BAND_UMTS_BAND6)
// clang-format on

// The GSM serving cell state (0 has no name).
// clang-format off
#define PYX_ENUM_GsmScellState(E) \
    E(1, DEDICATED_STATE)         \
    E(2, NON_DEDICATED_STATE)
// clang-format on

namespace pyx {

PYX_DECLARE_ENUM(SysBand)
PYX_DECLARE_ENUM(GsmScellState)

}  // namespace pyx
