// The modem's EMM, GMM and MM states and substates mapped onto our registration enumerations.
// A state our enumerations have no name for maps to nothing: the field is then left absent.
#pragma once

#include <cstdint>
#include <optional>

namespace pyx::diag {

// EMM state (0 NULL ... 6 DEREGISTERED_INITIATED) and substate of 0xB0EE version 2.
[[nodiscard]] std::optional<std::int32_t> emmRegStatus(std::uint8_t state, std::uint16_t substate);
[[nodiscard]] std::optional<std::int32_t> emmRegProc(std::uint8_t state);

// GMM state (0 NULL ... 6 SERVICE_REQUEST_INITIATED), substate and update status of 0x7130.
[[nodiscard]] std::optional<std::int32_t> gmmRegStatus(std::uint8_t state, std::uint8_t substate);
[[nodiscard]] std::optional<std::int32_t> gmmRegProc(std::uint8_t state);
[[nodiscard]] std::optional<std::int32_t> gmmUpdateStatus(std::uint8_t status);

// MM state (0 NULL, 3 LOCATION_UPDATE_INITIATED, ... 19 IDLE ...), substate and update status
// of 0x7131.
[[nodiscard]] std::optional<std::int32_t> mmRegStatus(std::uint8_t state, std::uint8_t substate);
[[nodiscard]] std::optional<std::int32_t> mmUpdateStatus(std::uint8_t status);

}  // namespace pyx::diag
