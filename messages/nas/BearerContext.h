// One activated bearer context.
#pragma once

#include "messages/Message.h"
#include "messages/nas/NasEnums.h"

// clang-format off
#define PYX_FIELDS_BearerContext(F)                                                \
    F##_U32(1, "cid", cid, Cid)                                                    \
    F##_U32(2, "nsapi", nsapi, Nsapi)                                              \
    F##_STRING(3, "apn", apn, Apn)                                                 \
    F##_ENUM(4, "pdp_type", pdpType, PdpType, PdpType)                             \
    F##_BYTES(5, "pdp_addr", pdpAddr, PdpAddr)                                     \
    F##_ENUM(6, "primary_dns_type", primaryDnsType, PrimaryDnsType, PdpType)       \
    F##_BYTES(7, "primary_dns_addr", primaryDnsAddr, PrimaryDnsAddr)               \
    F##_ENUM(8, "secondary_dns_type", secondaryDnsType, SecondaryDnsType, PdpType) \
    F##_BYTES(9, "secondary_dns_addr", secondaryDnsAddr, SecondaryDnsAddr)         \
    F##_BOOL(10, "is_addr_irat_mobile", isAddrIratMobile, IsAddrIratMobile)
// clang-format on

namespace pyx {

class BearerContext {
    PYX_MESSAGE_BODY(BearerContext)
};

}  // namespace pyx
