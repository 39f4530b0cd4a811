// Why the start-up commands could not be run on an open port, as one line: the modem answers
// nothing (likely no Qualcomm DIAG port at all), or refuses what logging needs.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <utility>

namespace pyx::diag {

class SessionError : public std::runtime_error {
  public:
    enum class Kind : std::uint8_t {
        NoAnswer,  // no reply within the command timeout
        Refused,   // an error reply, or a status other than 0
    };

    SessionError(Kind kind, const std::string& line) : std::runtime_error(line), kind_(kind) {}

    [[nodiscard]] Kind kind() const { return kind_; }

  private:
    Kind kind_;
};

}  // namespace pyx::diag
