// GSM GPRS configuration.
#pragma once

#include "messages/Message.h"

// clang-format off
#define PYX_FIELDS_KCellularGsmGprsConfig(F)                                     \
    F##_U64(1, "timestamp", timestamp, Timestamp)                                \
    F##_BOOL(2, "gprs_sup", gprsSup, GprsSup)                                    \
    F##_U32(3, "rac", rac, Rac)                                                  \
    F##_BOOL(4, "sp_pg_cy", spPgCy, SpPgCy)                                      \
    F##_U32(5, "nco", nco, Nco)                                                  \
    F##_U32(6, "nom", nom, Nom)                                                  \
    F##_U32(7, "cr_hyst", crHyst, CrHyst)                                        \
    F##_U32(8, "acc_thr", accThr, AccThr)                                        \
    F##_BOOL(9, "ext_upl_tbf_supported", extUplTbfSupported, ExtUplTbfSupported) \
    F##_U32(10, "priority_class", priorityClass, PriorityClass)                  \
    F##_U32(11, "cell_bar_access_2", cellBarAccess2, CellBarAccess2)
// clang-format on

namespace pyx {

class KCellularGsmGprsConfig {
    PYX_MESSAGE_BODY(KCellularGsmGprsConfig)
};

}  // namespace pyx
