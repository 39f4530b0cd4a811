// The raw byte stream of a live port kept in a file (a .qmdl): every byte read, as it came, so
// that the file replays like the port. A file that cannot be written is said once and then
// left alone; the live source goes on.
#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>

#include "sources/diag/port/UniqueFd.h"

namespace pyx::diag {

class QmdlFile {
  public:
    // Creates (or empties) path; an empty path keeps nothing.
    QmdlFile(std::string path, std::function<void(std::string_view line)> onFault);

    void append(std::span<const std::uint8_t> bytes);
    [[nodiscard]] bool keeping() const { return fd_.valid(); }

  private:
    void fail(int error);

    std::string path_;
    std::function<void(std::string_view line)> onFault_;
    UniqueFd fd_;
};

}  // namespace pyx::diag
