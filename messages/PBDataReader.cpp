#include "messages/PBDataReader.h"

#include <vector>

namespace pyx {

using Reason = DecodeError::Reason;

VarintTail decodeVarintTail(const std::uint8_t* p, std::size_t available) {
    std::uint64_t value = 0;
    for (std::size_t i = 0; i < 10; ++i) {
        if (i >= available) return {0, 0};
        const std::uint8_t byte = p[i];
        value |= static_cast<std::uint64_t>(byte & 0x7F) << (7 * i);
        if ((byte & 0x80) == 0) return {value, i + 1};
    }
    return {0, 10};
}

namespace {

bool validUtf8(const std::uint8_t* p, std::size_t n) {
    std::size_t i = 0;
    while (i < n) {
        const std::uint8_t c = p[i];
        if (c < 0x80) {
            ++i;
            continue;
        }
        std::size_t extra = 0;
        std::uint32_t cp = 0;
        if ((c & 0xE0) == 0xC0) {
            extra = 1;
            cp = c & 0x1F;
        } else if ((c & 0xF0) == 0xE0) {
            extra = 2;
            cp = c & 0x0F;
        } else if ((c & 0xF8) == 0xF0) {
            extra = 3;
            cp = c & 0x07;
        } else {
            return false;
        }
        if (n - i <= extra) return false;
        for (std::size_t k = 1; k <= extra; ++k) {
            if ((p[i + k] & 0xC0) != 0x80) return false;
            cp = (cp << 6) | (p[i + k] & 0x3F);
        }
        static constexpr std::uint32_t kMinimum[] = {0, 0x80, 0x800, 0x10000};
        if (cp < kMinimum[extra] || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) {
            return false;
        }
        i += extra + 1;
    }
    return true;
}

}  // namespace

std::optional<Bytes> PBReaderReadData(PBDataReader& reader) {
    const auto value = reader.readDelimited();
    if (!value) return std::nullopt;
    return Bytes(value->begin(), value->end());
}

std::optional<std::string> PBReaderReadString(PBDataReader& reader) {
    const auto value = reader.readDelimited();
    if (!value || !validUtf8(value->data(), value->size())) return std::nullopt;
    return std::string(reinterpret_cast<const char*>(value->data()), value->size());
}

namespace {

// Skips a fixed-width value of n bytes.
bool skipFixed(PBDataReader& reader, std::size_t n) {
    if (n > reader.remaining()) {
        reader.fail(Reason::TruncatedFixed, reader.position());
        return false;
    }
    reader.setPosition(reader.position() + n);
    return true;
}

// Skips a value that is not a group; false for wire types 3, 4, 6 and 7 (only 6 and 7 are
// recorded here: the caller knows what a group key means where it stands).
bool skipPlain(PBDataReader& reader, std::uint8_t wireType, std::size_t keyPosition) {
    switch (wireType) {
        case kWireVarint:
            reader.readVarint();
            return !reader.hasError();
        case kWireFixed64:
            return skipFixed(reader, 8);
        case kWireLengthDelimited:
            return reader.readDelimited().has_value();
        case kWireFixed32:
            return skipFixed(reader, 4);
        default:
            reader.fail(Reason::UnknownWireType, keyPosition);
            return false;
    }
}

}  // namespace

bool PBReaderSkipValueWithTag(PBDataReader& reader, std::uint32_t tag, std::uint8_t wireType,
                              std::size_t keyPosition) {
    if (wireType != kWireStartGroup) return skipPlain(reader, wireType, keyPosition);
    // A group: skip its fields up to the end-of-group key with the same tag. Groups nest; the
    // open groups are kept on a heap stack so that deep nesting cannot exhaust the call stack.
    struct OpenGroup {
        std::uint32_t tag;
        std::size_t keyPosition;
    };
    std::vector<OpenGroup> open{{tag, keyPosition}};
    while (!open.empty()) {
        if (!reader.hasMoreData()) {
            reader.fail(Reason::UnterminatedGroup, open.back().keyPosition);
            return false;
        }
        const std::size_t innerKeyPosition = reader.position();
        const std::uint64_t key = reader.readVarint();
        if (reader.hasError()) return false;
        const auto innerWire = static_cast<std::uint8_t>(key & 7);
        const auto innerTag = static_cast<std::uint32_t>((key >> 3) & 0xFFFF);
        if (innerWire == kWireEndGroup) {
            if (innerTag != open.back().tag) {
                reader.fail(Reason::UnmatchedEndGroup, innerKeyPosition);
                return false;
            }
            open.pop_back();
        } else if (innerWire == kWireStartGroup) {
            open.push_back({innerTag, innerKeyPosition});
        } else if (!skipPlain(reader, innerWire, innerKeyPosition)) {
            return false;
        }
    }
    return true;
}

}  // namespace pyx
