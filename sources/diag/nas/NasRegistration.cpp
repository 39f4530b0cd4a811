// The modem's state numbers are those the MobileInsight decoder names for these packets; the
// mapping onto our registration status reads each state as 3GPP TS 24.301 (EMM) and
// TS 24.008 (GMM, MM) describe it.
#include "sources/diag/nas/NasRegistration.h"

#include <iterator>
#include <span>

#include "messages/nas/NasEnums.h"

namespace pyx::diag {

namespace {

constexpr std::int32_t kNone = -1;  // no enumerator says it

std::optional<std::int32_t> lookUp(std::span<const std::int32_t> table, std::size_t index) {
    if (index >= table.size() || table[index] == kNone) return std::nullopt;
    return table[index];
}

// EMM-DEREGISTERED substates: NO_IMSI, PLMN_SEARCH, ATTACH_NEEDED, NO_CELL_AVAILABLE,
// ATTEMPTING_TO_ATTACH, NORMAL_SERVICE, LIMITED_SERVICE.
constexpr std::int32_t kEmmDeregistered[] = {
    kNone,
    KREG_STATUS_REGISTRATION_IN_PROGRESS,
    KREG_STATUS_SERVICE_DETACHED,
    KREG_STATUS_NO_SERVICE,
    KREG_STATUS_REGISTRATION_FAILURE,
    KREG_STATUS_SERVICE_DETACHED,
    KREG_STATUS_LIMITED_SERVICE,
};
// EMM-REGISTERED substates (also during a tracking area update or a service request):
// NORMAL_SERVICE, UPDATE_NEEDED, ATTEMPTING_TO_UPDATE, NO_CELL_AVAILABLE, PLMN_SEARCH,
// LIMITED_SERVICE.
constexpr std::int32_t kEmmRegistered[] = {
    KREG_STATUS_NORMAL_SERVICE,           kNone,
    KREG_STATUS_REGISTRATION_FAILURE,     KREG_STATUS_NO_SERVICE,
    KREG_STATUS_REGISTRATION_IN_PROGRESS, KREG_STATUS_LIMITED_SERVICE,
};

// The GMM substates are numbered once for all states: NORMAL_SERVICE, LIMITED_SERVICE,
// ATTACH_NEEDED, ATTEMPTING_TO_ATTACH, NO_IMSI, NO_CELL_AVAILABLE, PLMN_SEARCH, SUSPENDED,
// UPDATE_NEEDED, ATTEMPTING_TO_UPDATE, ATTEMPTING_TO_UPDATE_MM, IMSI_DETACH_INITIATED.
// GMM-DEREGISTERED has the first eight.
constexpr std::int32_t kGmmDeregistered[] = {
    KREG_STATUS_SERVICE_DETACHED,
    KREG_STATUS_LIMITED_SERVICE,
    KREG_STATUS_SERVICE_DETACHED,
    KREG_STATUS_REGISTRATION_FAILURE,
    kNone,
    KREG_STATUS_NO_SERVICE,
    KREG_STATUS_REGISTRATION_IN_PROGRESS,
    kNone,
};
// GMM-REGISTERED (also during a routing area update or a service request) has all but
// ATTACH_NEEDED, ATTEMPTING_TO_ATTACH and NO_IMSI.
constexpr std::int32_t kGmmRegistered[] = {
    KREG_STATUS_NORMAL_SERVICE,
    KREG_STATUS_LIMITED_SERVICE,
    kNone,
    kNone,
    kNone,
    KREG_STATUS_NO_SERVICE,
    KREG_STATUS_REGISTRATION_IN_PROGRESS,
    kNone,
    kNone,
    KREG_STATUS_REGISTRATION_FAILURE,
    KREG_STATUS_REGISTRATION_FAILURE,
    kNone,
};

// MM IDLE substates: NULL, NO_IMSI, PLMN_SEARCH, LIMITED_SERVICE, ATTEMPTING_TO_UPDATE,
// LOCATION_UPDATE_NEEDED, NO_CELL_AVAILABLE, PLMN_SEARCH_NORMAL_SERVICE (searching while
// updated in the registered area), NORMAL_SERVICE. The substate stays while a connection is
// set up or used.
constexpr std::int32_t kMmSubstates[] = {
    kNone,
    kNone,
    KREG_STATUS_REGISTRATION_IN_PROGRESS,
    KREG_STATUS_LIMITED_SERVICE,
    KREG_STATUS_REGISTRATION_FAILURE,
    kNone,
    KREG_STATUS_NO_SERVICE,
    KREG_STATUS_NORMAL_SERVICE,
    KREG_STATUS_NORMAL_SERVICE,
};

constexpr std::uint8_t kEmmDeregisteredState = 1, kEmmRegisteredInitiated = 2,
                       kEmmRegisteredState = 3, kEmmTrackingAreaUpdating = 4,
                       kEmmServiceRequest = 5;
constexpr std::uint8_t kGmmDeregisteredState = 1, kGmmRegisteredInitiated = 2,
                       kGmmRegisteredState = 3, kGmmRoutingAreaUpdating = 5, kGmmServiceRequest = 6;
constexpr std::uint8_t kMmNull = 0, kMmLocationUpdateInitiated = 3;

}  // namespace

std::optional<std::int32_t> emmRegStatus(std::uint8_t state, std::uint16_t substate) {
    switch (state) {
        case kEmmDeregisteredState:
            return lookUp(kEmmDeregistered, substate);
        case kEmmRegisteredInitiated:
            return KREG_STATUS_REGISTRATION_IN_PROGRESS;
        case kEmmRegisteredState:
        case kEmmTrackingAreaUpdating:
        case kEmmServiceRequest:
            return lookUp(kEmmRegistered, substate);
        default:  // NULL, DEREGISTERED_INITIATED, unknown
            return std::nullopt;
    }
}

// Attach and tracking area update may each be combined or not, which the state does not say.
std::optional<std::int32_t> emmRegProc(std::uint8_t state) {
    switch (state) {
        case kEmmDeregisteredState:
        case kEmmRegisteredState:
            return EMM_PROC_NO_PROC;
        case kEmmServiceRequest:
            return EMM_PROC_SERV_REQ;
        default:
            return std::nullopt;
    }
}

std::optional<std::int32_t> gmmRegStatus(std::uint8_t state, std::uint8_t substate) {
    switch (state) {
        case kGmmDeregisteredState:
            return lookUp(kGmmDeregistered, substate);
        case kGmmRegisteredInitiated:
            return KREG_STATUS_REGISTRATION_IN_PROGRESS;
        case kGmmRegisteredState:
        case kGmmRoutingAreaUpdating:
        case kGmmServiceRequest:
            return lookUp(kGmmRegistered, substate);
        default:  // NULL, DEREGISTERED_INITIATED, unknown
            return std::nullopt;
    }
}

// Attach and routing area update may each be combined or not, which the state does not say.
std::optional<std::int32_t> gmmRegProc(std::uint8_t state) {
    switch (state) {
        case kGmmDeregisteredState:
        case kGmmRegisteredState:
            return KNAS_MM_REG_PROC_PROC_NONE;
        case kGmmServiceRequest:
            return KNAS_MM_REG_PROC_SERVICE_REQ;
        default:
            return std::nullopt;
    }
}

// GU1 UPDATED, GU2 NOT UPDATED, and GU3 ROAMING NOT ALLOWED, which the modem splits into
// PLMN (2) and routing area (3) not allowed.
std::optional<std::int32_t> gmmUpdateStatus(std::uint8_t status) {
    constexpr std::int32_t kStatuses[] = {GPRS_STATUS_UPDATED, GPRS_STATUS_NOT_UPDATED,
                                          GPRS_STATUS_ROAMING_NOT_ALLOWED,
                                          GPRS_STATUS_ROAMING_NOT_ALLOWED};
    return lookUp(kStatuses, status);
}

std::optional<std::int32_t> mmRegStatus(std::uint8_t state, std::uint8_t substate) {
    if (state == kMmNull) return std::nullopt;
    if (state == kMmLocationUpdateInitiated) return KREG_STATUS_REGISTRATION_IN_PROGRESS;
    return lookUp(kMmSubstates, substate);
}

// U1 UPDATED, U2 NOT UPDATED, U3 ROAMING NOT ALLOWED (our enumeration starts at 1).
std::optional<std::int32_t> mmUpdateStatus(std::uint8_t status) {
    constexpr std::int32_t kStatuses[] = {STATUS_UPDATED, STATUS_NOT_UPDATED,
                                          STATUS_ROAMING_NOT_ALLOWED};
    return lookUp(kStatuses, status);
}

}  // namespace pyx::diag
