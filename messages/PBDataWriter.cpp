#include "messages/PBDataWriter.h"

namespace pyx {

void PBDataWriter::insertVarintAt(std::size_t offset, std::uint64_t value) {
    std::uint8_t encoded[10];
    std::size_t n = 0;
    while (value >= 0x80) {
        encoded[n++] = static_cast<std::uint8_t>(value | 0x80);
        value >>= 7;
    }
    encoded[n++] = static_cast<std::uint8_t>(value);
    buffer_.insert(buffer_.begin() + static_cast<std::ptrdiff_t>(offset), encoded, encoded + n);
}

}  // namespace pyx
