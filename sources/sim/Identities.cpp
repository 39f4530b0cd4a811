#include "sources/sim/Identities.h"

namespace pyx::sim {

namespace {
std::uint8_t digitAt(std::string_view digits, std::size_t i) {
    return i < digits.size() ? static_cast<std::uint8_t>(digits[i] - '0') : std::uint8_t{0xF};
}
}  // namespace

Bytes encodePlmn(std::uint32_t mcc, std::uint32_t mnc, std::uint32_t mncDigits) {
    const auto d = [](std::uint32_t n, std::uint32_t place) {
        return static_cast<std::uint8_t>((n / place) % 10);
    };
    const std::uint8_t mcc1 = d(mcc, 100), mcc2 = d(mcc, 10), mcc3 = d(mcc, 1);
    std::uint8_t mnc1 = 0, mnc2 = 0, mnc3 = 0xF;
    if (mncDigits == 3) {
        mnc1 = d(mnc, 100);
        mnc2 = d(mnc, 10);
        mnc3 = d(mnc, 1);
    } else {
        mnc1 = d(mnc, 10);
        mnc2 = d(mnc, 1);
    }
    return Bytes{static_cast<std::uint8_t>((mcc2 << 4) | mcc1),
                 static_cast<std::uint8_t>((mnc3 << 4) | mcc3),
                 static_cast<std::uint8_t>((mnc2 << 4) | mnc1)};
}

Bytes encodeImsi(std::string_view digits, bool withLength) {
    Bytes out;
    const bool odd = digits.size() % 2 == 1;
    const std::uint8_t typeNibble = odd ? 0x9 : 0x1;  // identity type 1 (IMSI), odd/even flag
    out.push_back(static_cast<std::uint8_t>((digitAt(digits, 0) << 4) | typeNibble));
    for (std::size_t i = 1; i < digits.size(); i += 2)
        out.push_back(
            static_cast<std::uint8_t>((digitAt(digits, i + 1) << 4) | digitAt(digits, i)));
    if (withLength) out.insert(out.begin(), static_cast<std::uint8_t>(out.size()));
    return out;
}

Bytes encodeIccid(std::string_view digits) {
    Bytes out;
    for (std::size_t i = 0; i < digits.size(); i += 2)
        out.push_back(
            static_cast<std::uint8_t>((digitAt(digits, i + 1) << 4) | digitAt(digits, i)));
    return out;
}

char luhnCheckDigit(std::string_view digits) {
    int sum = 0;
    bool doubleIt = true;  // the rightmost digit of the payload is doubled
    for (std::size_t i = digits.size(); i-- > 0;) {
        int d = digits[i] - '0';
        if (doubleIt) {
            d *= 2;
            if (d > 9) d -= 9;
        }
        sum += d;
        doubleIt = !doubleIt;
    }
    return static_cast<char>('0' + (10 - sum % 10) % 10);
}

}  // namespace pyx::sim
