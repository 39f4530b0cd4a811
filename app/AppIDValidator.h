// An inert holder of an application identity: nothing in the program creates or reads it yet.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace pyx {

class AppIDValidator {
  public:
    AppIDValidator(std::int64_t myAppID, std::string appIDKey)
        : myAppID(myAppID), appIDKey(std::move(appIDKey)) {}

    const std::int64_t myAppID;
    const std::string appIDKey;
    std::optional<std::int64_t> appID;
};

}  // namespace pyx
