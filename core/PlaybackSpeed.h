// The speed a recording or capture plays at: its own timing divided by it, 0 (or infinity) as
// fast as it is taken.
#pragma once

#include <cmath>
#include <stdexcept>
#include <string_view>

#include "core/Format.h"

namespace pyx {

// speed, or std::invalid_argument for a negative or NaN one; what: "the replay speed".
[[nodiscard]] inline double checkedPlaybackSpeed(double speed, std::string_view what) {
    if (std::isnan(speed) || speed < 0.0)
        throw std::invalid_argument(format("%.*s must be 0 (as fast as taken) or more, not %g",
                                           static_cast<int>(what.size()), what.data(), speed));
    return speed;
}

}  // namespace pyx
