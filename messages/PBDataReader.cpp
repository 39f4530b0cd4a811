#include "messages/PBDataReader.h"

#include <vector>

namespace pyx {

struct PBDataReaderAccess {
    static std::size_t& length(PBDataReader& r) { return r.length_; }
    static std::size_t& pos(PBDataReader& r) { return r.pos_; }
};

std::uint64_t decodeVarintSlow(const std::uint8_t* bytes, std::size_t& pos, std::size_t limit,
                               bool& error) {
    std::uint64_t value = 0;
    for (unsigned i = 0; i < 10; ++i) {
        if (pos >= limit) {
            error = true;
            return 0;
        }
        const std::uint8_t byte = bytes[pos++];
        value |= static_cast<std::uint64_t>(byte & 0x7F) << (7 * i);
        if ((byte & 0x80) == 0) return value;
    }
    return 0;
}

bool PBDataReader::skip(std::size_t n) {
    if (n > remaining()) {
        error_ = true;
        return false;
    }
    pos_ += n;
    return true;
}

bool PBReaderPlaceMark(PBDataReader& reader, PBDataReaderMark& mark) {
    const std::uint64_t size = reader.readVarint();
    if (reader.hasError() || size > reader.remaining()) return false;
    mark.length = reader.length();
    PBDataReaderAccess::length(reader) = reader.position() + static_cast<std::size_t>(size);
    return true;
}

void PBReaderRecallMark(PBDataReader& reader, const PBDataReaderMark& mark) {
    PBDataReaderAccess::length(reader) = mark.length;
}

namespace {

// The bytes of a length-delimited value, or nullptr (error flag set) when it does not fit.
const std::uint8_t* takeDelimited(PBDataReader& reader, std::size_t& size) {
    const std::uint64_t n = reader.readVarint();
    if (reader.hasError()) return nullptr;
    if (n > reader.remaining()) {
        reader.setError();
        return nullptr;
    }
    size = static_cast<std::size_t>(n);
    const std::uint8_t* start = reader.bytes() + reader.position();
    PBDataReaderAccess::pos(reader) += size;
    return start;
}

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
    std::size_t size = 0;
    const std::uint8_t* start = takeDelimited(reader, size);
    if (start == nullptr) return std::nullopt;
    return Bytes(start, start + size);
}

std::optional<std::string> PBReaderReadString(PBDataReader& reader) {
    std::size_t size = 0;
    const std::uint8_t* start = takeDelimited(reader, size);
    if (start == nullptr || !validUtf8(start, size)) return std::nullopt;
    return std::string(reinterpret_cast<const char*>(start), size);
}

namespace {

// Skips a value that is not a group; false for wire types 3, 4, 6 and 7.
bool skipPlain(PBDataReader& reader, std::uint8_t wireType) {
    switch (wireType) {
        case 0:
            reader.readVarint();
            return !reader.hasError();
        case 1:
            return reader.skip(8);
        case 2: {
            const std::uint64_t n = reader.readVarint();
            if (reader.hasError()) return false;
            if (n > reader.remaining()) {
                reader.setError();
                return false;
            }
            return reader.skip(static_cast<std::size_t>(n));
        }
        case 5:
            return reader.skip(4);
        default:
            return false;
    }
}

}  // namespace

bool PBReaderSkipValueWithTag(PBDataReader& reader, std::uint32_t tag, std::uint8_t wireType) {
    if (wireType != 3) return skipPlain(reader, wireType);
    // A group: skip its fields up to the end-of-group key with the same tag. Groups nest; the
    // open tags are kept on a heap stack so that deep nesting cannot exhaust the call stack.
    std::vector<std::uint32_t> open{tag};
    while (!open.empty()) {
        if (!reader.hasMoreData()) {
            reader.setError();
            return false;
        }
        const std::uint64_t key = reader.readVarint();
        if (reader.hasError()) return false;
        const auto innerWire = static_cast<std::uint8_t>(key & 7);
        const auto innerTag = static_cast<std::uint32_t>((key >> 3) & 0xFFFF);
        if (innerWire == 4) {
            if (innerTag != open.back()) return false;
            open.pop_back();
        } else if (innerWire == 3) {
            open.push_back(innerTag);
        } else if (!skipPlain(reader, innerWire)) {
            return false;
        }
    }
    return true;
}

}  // namespace pyx
