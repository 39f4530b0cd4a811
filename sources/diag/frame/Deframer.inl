// Deframer::feed (included by Hdlc.h): the flags and escapes are found with memchr, and a frame
// that lies whole inside one piece without escapes is checked where it lies, without a copy.
#pragma once

#include <cstring>

namespace pyx::diag {

template <typename OnPacket>
void Deframer::feed(std::span<const std::uint8_t> bytes, OnPacket&& onPacket) {
    counts_.bytes += bytes.size();
    const std::uint8_t* at = bytes.data();
    const std::uint8_t* const end = at + bytes.size();
    while (at != end) {
        const auto* flag = static_cast<const std::uint8_t*>(
            std::memchr(at, kFlag, static_cast<std::size_t>(end - at)));
        const std::uint8_t* const stop = flag != nullptr ? flag : end;
        const std::span<const std::uint8_t> segment(at, stop);
        if (flag != nullptr && pending_.empty() && !escaped_ && !overlong_ &&
            std::memchr(segment.data(), kEscape, segment.size()) == nullptr) {
            // A whole frame without escapes: checked in place.
            if (const auto packet = checkFrame(segment)) onPacket(*packet);
        } else {
            append(segment);
            if (flag != nullptr) {
                const bool good = endFrame();
                if (good) onPacket(std::span<const std::uint8_t>(pending_));
                pending_.clear();
            }
        }
        at = flag != nullptr ? flag + 1 : end;
    }
}

}  // namespace pyx::diag
