#include "sources/modem/ModemFieldTable.h"

#include <arpa/inet.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <limits>

#include "core/Format.h"
#include "sources/modem/Bands.h"
#include "sources/sim/Identities.h"

namespace pyx::modem {

namespace {

constexpr double kAny = std::numeric_limits<double>::infinity();

using S = MmSource;
using T = DbusType;
using F = Field;
using C = Conversion;

// clang-format off
constexpr std::array kRows = {
    // source, key, D-Bus type, field, conversion, valid range (ModemManager's unit), our field.
    // Every converted value of a range fits each field the row feeds: a power or quality index
    // that some message holds unsigned starts where index 0 does, a weaker value being absurd
    // for that field.
    ModemFieldRow{S::Modem, "AccessTechnologies", T::UInt32, F::ServingAccessTech, C::Same, 0, 4294967295.0, "serving technology (which serving-cell kinds)"},
    ModemFieldRow{S::SignalLte, "rsrp", T::Double, F::LteRsrp, C::Rounded, -156, -31, "LTE RsrpRsrqSinr.rsrp0 (dBm)"},
    ModemFieldRow{S::SignalLte, "rsrq", T::Double, F::LteRsrq, C::Rounded, -43, 20, "LTE RsrpRsrqSinr.rsrq0 (dB)"},
    ModemFieldRow{S::SignalLte, "snr", T::Double, F::LteSinr, C::HalfSteps, -23, 40, "LTE RsrpRsrqSinr.sinr0 (half dB)"},
    ModemFieldRow{S::SignalUmts, "rssi", T::Double, F::UmtsRssi, C::Rounded, -120, -25, "WCDMA RxInfo.rssi (dBm)"},
    ModemFieldRow{S::SignalUmts, "rscp", T::Double, F::UmtsRscpIndex, C::UtraPowerIndex, -116, -25, "WCDMA RxInfo.rsrp_range (RSCP + 116)"},
    ModemFieldRow{S::SignalUmts, "ecio", T::Double, F::UmtsEcioIndex, C::UtraQualityIndex, -24, 0, "WCDMA RxInfo.rsrq_range ((Ec/Io + 24) x 2)"},
    ModemFieldRow{S::SignalGsm, "rssi", T::Double, F::GsmRxlevDbm, C::Rounded, -110, -20, "GSM idle_rxlev_dBm (dBm)"},
    ModemFieldRow{S::LteCell, "physical-ci", T::HexString, F::LtePci, C::Hex, 0, 503, "LTE phy_cell_id / nbr_phys_cell_id"},
    ModemFieldRow{S::LteCell, "earfcn", T::UInt32, F::LteEarfcn, C::Same, 0, 262143, "LTE dl_freq / nbr_earfcn"},
    ModemFieldRow{S::LteCell, "earfcn", T::UInt32, F::LteBand, C::LteBandOfEarfcn, 0, 262143, "LTE freq_band_ind"},
    ModemFieldRow{S::LteCell, "tac", T::HexString, F::LteTac, C::Hex, 0, 65535, "LTE tracking_area_code"},
    ModemFieldRow{S::LteCell, "ci", T::HexString, F::LteCellId, C::Hex, 0, 268435455, "LTE cell_id"},
    ModemFieldRow{S::LteCell, "rsrp", T::Double, F::LteNbrRsrp, C::LtePowerIndex, -140, -31, "LTE nbr_rsrp (RSRP + 140)"},
    ModemFieldRow{S::LteCell, "rsrq", T::Double, F::LteNbrRsrq, C::LteQualityHalfSteps, -19.5, 2.5, "LTE nbr_rsrq ((RSRQ + 19.5) x 2)"},
    ModemFieldRow{S::UmtsCell, "lac", T::HexString, F::UmtsLac, C::Hex, 0, 65535, "WCDMA lac"},
    ModemFieldRow{S::UmtsCell, "ci", T::HexString, F::UmtsCellId, C::Hex, 0, 268435455, "WCDMA cell_id"},
    ModemFieldRow{S::UmtsCell, "uarfcn", T::UInt32, F::UmtsUarfcn, C::Same, 0, 16383, "WCDMA dl_uarfcn / uarfcn"},
    ModemFieldRow{S::UmtsCell, "uarfcn", T::UInt32, F::UmtsBand, C::UmtsBandOfUarfcn, 0, 16383, "WCDMA wcdma_band"},
    ModemFieldRow{S::UmtsCell, "psc", T::UInt32, F::UmtsPsc, C::Same, 0, 511, "WCDMA psc"},
    ModemFieldRow{S::UmtsCell, "rscp", T::Double, F::UmtsRscp, C::UtraPowerIndex, -116, -25, "UTRA neighbour rscp (RSCP + 116)"},
    ModemFieldRow{S::UmtsCell, "ecio", T::Double, F::UmtsEcno, C::UtraQualityHalfSteps, -24.5, 0, "UTRA neighbour ecno ((Ec/No + 24.5) x 2)"},
    ModemFieldRow{S::GsmCell, "lac", T::HexString, F::GsmLac, C::Hex, 0, 65535, "GSM lac"},
    ModemFieldRow{S::GsmCell, "ci", T::HexString, F::GsmCellId, C::Hex, 0, 65535, "GSM cell_id"},
    ModemFieldRow{S::GsmCell, "arfcn", T::UInt32, F::GsmArfcn, C::Same, 0, 1023, "GSM arfcn"},
    ModemFieldRow{S::GsmCell, "base-station-id", T::HexString, F::GsmBsic, C::Hex, 0, 63, "GSM bsic"},
    ModemFieldRow{S::GsmCell, "rx-level", T::UInt32, F::GsmRxlev, C::Same, 0, 63, "GERAN neighbour rxlev (dBm + 110)"},
    ModemFieldRow{S::Modem3gpp, "OperatorCode", T::String, F::Mcc, C::MccOfOperator, 5, 6, "mcc / sel_plmn_mcc"},
    ModemFieldRow{S::Modem3gpp, "OperatorCode", T::String, F::Mnc, C::MncOfOperator, 5, 6, "mnc / sel_plmn_mnc"},
    ModemFieldRow{S::Modem3gpp, "OperatorCode", T::String, F::MncDigits, C::MncDigitsOfOperator, 5, 6, "num_mnc_digits"},
    ModemFieldRow{S::Modem3gpp, "RegistrationState", T::UInt32, F::RegStatus, C::RegistrationStatus, 0, 11, "EMM reg_status"},
    ModemFieldRow{S::Location, "3gpp", T::String, F::LocationLac, C::LocationLac, 0, 65535, "lac (no cell info)"},
    ModemFieldRow{S::Location, "3gpp", T::String, F::LocationCi, C::LocationCi, 0, 268435455, "cell_id (no cell info)"},
    ModemFieldRow{S::Location, "3gpp", T::String, F::LocationTac, C::LocationTac, 0, 16777215, "tracking_area_code (no cell info)"},
    ModemFieldRow{S::Sim, "SimIdentifier", T::String, F::SimIccid, C::IccidDigits, 18, 22, "EF ICCID 0x2FE2 content"},
    ModemFieldRow{S::Sim, "Imsi", T::String, F::SimImsi, C::ImsiDigits, 6, 15, "EF IMSI 0x6F07 content"},
    ModemFieldRow{S::Sim, "OperatorIdentifier", T::String, F::SimMncDigits, C::MncDigitsOfOperator, 5, 6, "EF AD 0x6FAD MNC length"},
    ModemFieldRow{S::Bearer, "Connected", T::Boolean, F::BearerConnected, C::Same, 0, 1, "bearer listed when connected"},
    ModemFieldRow{S::BearerProperties, "apn", T::String, F::BearerApn, C::Same, 0, 100, "BearerContext.apn"},
    ModemFieldRow{S::BearerProperties, "ip-type", T::UInt32, F::BearerPdpType, C::IpFamily, 1, 4, "BearerContext.pdp_type"},
    ModemFieldRow{S::BearerIp4, "address", T::String, F::BearerIpv4, C::Ipv4Address, -kAny, kAny, "BearerContext.pdp_addr (IPv4)"},
    ModemFieldRow{S::BearerIp4, "dns1", T::String, F::BearerIpv4Dns1, C::Ipv4Address, -kAny, kAny, "BearerContext.primary_dns_addr"},
    ModemFieldRow{S::BearerIp4, "dns2", T::String, F::BearerIpv4Dns2, C::Ipv4Address, -kAny, kAny, "BearerContext.secondary_dns_addr"},
    ModemFieldRow{S::BearerIp6, "address", T::String, F::BearerIpv6, C::Ipv6Address, -kAny, kAny, "BearerContext.pdp_addr (IPv6)"},
    ModemFieldRow{S::BearerIp6, "dns1", T::String, F::BearerIpv6Dns1, C::Ipv6Address, -kAny, kAny, "BearerContext.primary_dns_addr (IPv6 only)"},
};
// clang-format on

std::string_view typeName(DbusType type) {
    switch (type) {
        case T::Double:
            return "a double (d)";
        case T::UInt32:
            return "an unsigned 32-bit integer (u)";
        case T::Boolean:
            return "a boolean (b)";
        case T::String:
            return "a string (s)";
        case T::HexString:
            return "a hexadecimal string (s)";
    }
    return "?";
}

bool hasType(const Value& value, DbusType type) {
    switch (type) {
        case T::Double:
            return value.isFloat();
        case T::UInt32:
            return value.isUInt() && value.asUInt() <= 0xFFFFFFFFULL;
        case T::Boolean:
            return value.isBool();
        case T::String:
        case T::HexString:
            return value.isString();
    }
    return false;
}

std::optional<std::uint64_t> parseHex(std::string_view text) {
    if (text.empty() || text.size() > 8) return std::nullopt;
    std::uint64_t v = 0;
    for (const char c : text) {
        int d = 0;
        if (c >= '0' && c <= '9')
            d = c - '0';
        else if (c >= 'a' && c <= 'f')
            d = c - 'a' + 10;
        else if (c >= 'A' && c <= 'F')
            d = c - 'A' + 10;
        else
            return std::nullopt;
        v = v * 16 + static_cast<std::uint64_t>(d);
    }
    return v;
}

bool allDigits(std::string_view text) {
    if (text.empty()) return false;
    for (const char c : text)
        if (c < '0' || c > '9') return false;
    return true;
}

// Field index (0 = MCC) of "MCC,MNC,LAC,CI,TAC".
std::optional<std::string_view> locationPart(std::string_view text, std::size_t index) {
    for (std::size_t i = 0; i < index; ++i) {
        const auto comma = text.find(',');
        if (comma == std::string_view::npos) return std::nullopt;
        text.remove_prefix(comma + 1);
    }
    return text.substr(0, text.find(','));
}

// MMModem3gppRegistrationState to our registration status; nothing for "unknown".
std::optional<std::int64_t> registrationStatus(std::uint64_t state) {
    constexpr std::int64_t kNormal = 0, kFailure = 1, kLimited = 2, kNoService = 3, kEmergency = 8,
                           kSmsOnly = 10, kInProgress = 11;
    switch (state) {
        case 0:
            return kNoService;  // idle: not registered, not searching
        case 1:                 // home
        case 5:                 // roaming
        case 9:                 // home, CSFB not preferred
        case 10:                // roaming, CSFB not preferred
            return kNormal;
        case 2:
            return kInProgress;  // searching
        case 3:
            return kFailure;  // denied
        case 4:
            return std::nullopt;  // unknown
        case 6:                   // home, SMS only
        case 7:                   // roaming, SMS only
            return kSmsOnly;
        case 8:
            return kEmergency;  // emergency services only
        case 11:
            return kLimited;  // attached for RLOS
        default:
            return std::nullopt;
    }
}

// MMBearerIpFamily (1 IPv4, 2 IPv6, 4 IPv4v6) to our PDP type.
std::optional<std::int64_t> pdpType(std::uint64_t family) {
    switch (family) {
        case 1:
            return 0;
        case 2:
            return 1;
        case 4:
            return 2;
        default:
            return std::nullopt;
    }
}

std::optional<Bytes> ipAddress(const std::string& text, int family) {
    std::array<std::uint8_t, 16> buffer{};
    if (inet_pton(family, text.c_str(), buffer.data()) != 1) return std::nullopt;
    return Bytes(buffer.begin(), buffer.begin() + (family == AF_INET ? 4 : 16));
}

std::string shown(const Value& value) {
    std::string text = value.description();
    if (value.isString()) text = "'" + text + "'";
    return text;
}

std::string rangeText(const ModemFieldRow& row) {
    return format("%g..%g", row.min, row.max);
}

class RowReader {
  public:
    RowReader(const ModemFieldRow& row, const Value& value, FieldIssues& issues)
        : row_(row), value_(value), issues_(issues) {}

    Value read() {
        if (!hasType(value_, row_.type))
            return leftOut(format("is %s, not %s", kindName().c_str(),
                                  std::string(typeName(row_.type)).c_str()));
        switch (row_.type) {
            case T::Double:
                return fromNumber(value_.asFloat());
            case T::UInt32:
                return fromNumber(static_cast<double>(value_.asUInt()));
            case T::Boolean:
                return Value(static_cast<std::int64_t>(value_.asBool() ? 1 : 0));
            case T::HexString: {
                const auto v = parseHex(value_.asString());
                if (!v) return leftOut("is not a hexadecimal number");
                return fromNumber(static_cast<double>(*v));
            }
            case T::String:
                return fromText(value_.asString());
        }
        return Value();
    }

  private:
    std::string kindName() const {
        switch (value_.kind()) {
            case Value::Kind::Float:
                return "a double (d)";
            case Value::Kind::UInt:
                return "an unsigned integer";
            case Value::Kind::Int:
                return "a signed integer";
            case Value::Kind::Bool:
                return "a boolean (b)";
            case Value::Kind::String:
                return "a string (s)";
            case Value::Kind::Data:
                return "bytes";
            case Value::Kind::List:
                return "an array";
            case Value::Kind::Map:
                return "a dictionary";
            case Value::Kind::Null:
                return "empty";
        }
        return "?";
    }

    Value leftOut(const std::string& why) {
        // Worded without our field, so that the rows that read one key give one line.
        issues_.push_back(format(
            "ModemManager %s %s: %s %s; left out", std::string(sourceName(row_.source)).c_str(),
            std::string(row_.key).c_str(), shown(value_).c_str(), why.c_str()));
        return Value();
    }

    bool inRange(double v) const { return v >= row_.min && v <= row_.max; }

    Value fromNumber(double v) {
        if (!std::isfinite(v) || !inRange(v)) return leftOut("is out of range " + rangeText(row_));
        const auto whole = [](double x) {
            return Value(static_cast<std::int64_t>(std::lround(x)));
        };
        switch (row_.conversion) {
            case C::Same:
            case C::Rounded:
            case C::Hex:
                return whole(v);
            case C::HalfSteps:
                return whole(v * 2);
            case C::LtePowerIndex:
                return whole(v + 140);
            case C::LteQualityHalfSteps:
                return whole((v + 19.5) * 2);
            case C::UtraPowerIndex:
                return whole(v + 116);
            case C::UtraQualityHalfSteps:
                return whole((v + 24.5) * 2);
            case C::UtraQualityIndex:
                return whole((v + 24) * 2);
            case C::LteBandOfEarfcn: {
                const auto band = lteBandOfEarfcn(static_cast<std::uint32_t>(v));
                if (!band) return leftOut("is in no E-UTRA band");
                return Value(static_cast<std::int64_t>(*band));
            }
            case C::UmtsBandOfUarfcn: {
                const auto band = umtsBandOfUarfcn(static_cast<std::uint32_t>(v));
                const auto code = band ? wcdmaBandCode(*band) : std::nullopt;
                if (!code) return leftOut("names no single UTRA band our messages know");
                return Value(static_cast<std::int64_t>(*code));
            }
            case C::RegistrationStatus: {
                const auto status = registrationStatus(static_cast<std::uint64_t>(v));
                if (!status) return Value();  // unknown: nothing to show, nothing wrong
                return Value(*status);
            }
            case C::IpFamily: {
                const auto type = pdpType(static_cast<std::uint64_t>(v));
                if (!type) return leftOut("is not IPv4 (1), IPv6 (2) or IPv4v6 (4)");
                return Value(*type);
            }
            default:
                return leftOut("has a conversion that takes text");
        }
    }

    Value fromText(const std::string& text) {
        switch (row_.conversion) {
            case C::Same:
                if (static_cast<double>(text.size()) > row_.max)
                    return leftOut("is longer than " + rangeText(row_));
                return Value(text);
            case C::MccOfOperator:
            case C::MncOfOperator:
            case C::MncDigitsOfOperator: {
                if (!allDigits(text) || !inRange(static_cast<double>(text.size())))
                    return leftOut("is not an operator code of 5 or 6 digits");
                if (row_.conversion == C::MccOfOperator)
                    return Value(static_cast<std::int64_t>(std::stol(text.substr(0, 3))));
                if (row_.conversion == C::MncOfOperator)
                    return Value(static_cast<std::int64_t>(std::stol(text.substr(3))));
                return Value(static_cast<std::int64_t>(text.size() - 3));
            }
            case C::IccidDigits:
            case C::ImsiDigits:
                if (!allDigits(text) || !inRange(static_cast<double>(text.size())))
                    return leftOut("is not " + rangeText(row_) + " digits");
                return Value(row_.conversion == C::IccidDigits ? sim::encodeIccid(text)
                                                               : sim::encodeImsi(text, true));
            case C::Ipv4Address:
            case C::Ipv6Address: {
                if (text.empty()) return Value();  // no address yet
                auto bytes =
                    ipAddress(text, row_.conversion == C::Ipv4Address ? AF_INET : AF_INET6);
                if (!bytes) return leftOut("is not an address");
                return Value(std::move(*bytes));
            }
            case C::LocationLac:
            case C::LocationCi:
            case C::LocationTac: {
                const std::size_t index = row_.conversion == C::LocationLac  ? 2
                                          : row_.conversion == C::LocationCi ? 3
                                                                             : 4;
                const auto part = locationPart(text, index);
                if (!part || part->empty()) return Value();  // this part not known
                const auto v = parseHex(*part);
                if (!v) return leftOut("does not hold a hexadecimal number there");
                if (!inRange(static_cast<double>(*v)))
                    return leftOut("holds a number out of range " + rangeText(row_));
                return Value(static_cast<std::int64_t>(*v));
            }
            default:
                return leftOut("has a conversion that takes a number");
        }
    }

    const ModemFieldRow& row_;
    const Value& value_;
    FieldIssues& issues_;
};

}  // namespace

std::span<const ModemFieldRow> modemFieldTable() {
    return kRows;
}

std::string_view sourceName(MmSource source) {
    switch (source) {
        case S::Modem:
            return "Modem";
        case S::Modem3gpp:
            return "Modem3gpp";
        case S::SignalLte:
            return "Signal.Lte";
        case S::SignalUmts:
            return "Signal.Umts";
        case S::SignalGsm:
            return "Signal.Gsm";
        case S::LteCell:
            return "GetCellInfo LTE cell";
        case S::UmtsCell:
            return "GetCellInfo UMTS cell";
        case S::GsmCell:
            return "GetCellInfo GSM cell";
        case S::Location:
            return "Location";
        case S::Sim:
            return "Sim";
        case S::Bearer:
            return "Bearer";
        case S::BearerProperties:
            return "Bearer.Properties";
        case S::BearerIp4:
            return "Bearer.Ip4Config";
        case S::BearerIp6:
            return "Bearer.Ip6Config";
    }
    return "?";
}

Value mapRow(const ModemFieldRow& row, const Dict& dict, FieldIssues& issues) {
    const Value* value = dict.find(row.key);
    if (value == nullptr) return Value();  // a missing key means unknown
    return RowReader(row, *value, issues).read();
}

FieldValues mapFields(MmSource source, const Dict& dict, FieldIssues& issues) {
    FieldValues values;
    for (const ModemFieldRow& row : kRows) {
        if (row.source != source) continue;
        Value value = mapRow(row, dict, issues);
        if (!value.isNull()) values.set(row.field, std::move(value));
    }
    return values;
}

}  // namespace pyx::modem
