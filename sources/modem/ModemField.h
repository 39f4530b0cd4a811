// The vocabulary of the mapping from ModemManager's values to our message fields: where a
// value comes from, the D-Bus type it must have, the field it fills and how it is converted.
#pragma once

#include <cstddef>
#include <string_view>

namespace pyx::modem {

// The dictionary or property set a value is read from.
enum class MmSource {
    Modem,             // Modem properties
    Modem3gpp,         // Modem.Modem3gpp properties
    SignalLte,         // Modem.Signal "Lte"
    SignalUmts,        // Modem.Signal "Umts"
    SignalGsm,         // Modem.Signal "Gsm"
    LteCell,           // a GetCellInfo dictionary with cell-type 5
    UmtsCell,          // ... cell-type 3
    GsmCell,           // ... cell-type 2
    Location,          // Modem.Location.GetLocation
    Sim,               // SIM properties
    Bearer,            // Bearer properties
    BearerProperties,  // Bearer "Properties"
    BearerIp4,         // Bearer "Ip4Config"
    BearerIp6,         // Bearer "Ip6Config"
};

// The D-Bus type a value must have; a value of another type is left out.
enum class DbusType {
    Double,     // d
    UInt32,     // u
    Boolean,    // b
    String,     // s
    HexString,  // s holding a hexadecimal number
};

// How a ModemManager value becomes the raw value our message holds. The store's conversions
// then turn that raw value back into the unit the screen shows.
enum class Conversion {
    Same,                  // integer as it is
    Rounded,               // double to the nearest integer (dBm, dB)
    HalfSteps,             // double dB to integer half-dB steps (x2)
    LtePowerIndex,         // dBm + 140 (the store shows raw - 140)
    LteQualityHalfSteps,   // (dB + 19.5) x 2 (the store shows raw x 0.5 - 19.5)
    UtraPowerIndex,        // dBm + 116 (the store shows raw - 116)
    UtraQualityHalfSteps,  // (dB + 24.5) x 2 (the store shows raw x 0.5 - 24.5)
    UtraQualityIndex,      // (dB + 24) x 2, the serving cell's Ec/Io index
    Hex,                   // hexadecimal text to integer
    LteBandOfEarfcn,       // the E-UTRA band of a downlink EARFCN (TS 36.101)
    UmtsBandOfUarfcn,      // the UTRA band of a downlink UARFCN (TS 25.101), as a band code
    MccOfOperator,         // "MCCMNC": the first three digits
    MncOfOperator,         // "MCCMNC": the two or three digits after them
    MncDigitsOfOperator,   // "MCCMNC": how many digits the MNC has
    RegistrationStatus,    // MMModem3gppRegistrationState to our registration status
    IpFamily,              // MMBearerIpFamily to our PDP type
    Ipv4Address,           // dotted text to four bytes
    Ipv6Address,           // RFC 4291 text to sixteen bytes
    IccidDigits,           // digits to the EF ICCID content (swapped BCD)
    ImsiDigits,            // digits to the EF IMSI content (length, parity nibble, BCD)
    LocationLac,           // "MCC,MNC,LAC,CI,TAC": LAC (hex)
    LocationCi,            // ... CI (hex)
    LocationTac,           // ... TAC (hex)
};

// Our message fields that ModemManager's values fill.
enum class Field : std::size_t {
    ServingAccessTech,  // which technology serves: picks the serving-cell kinds
    LteRsrp,            // RsrpRsrqSinr.rsrp0, dBm
    LteRsrq,            // RsrpRsrqSinr.rsrq0, dB
    LteSinr,            // RsrpRsrqSinr.sinr0, half dB
    UmtsRssi,           // WCDMA RxInfo.rssi, dBm
    UmtsRscpIndex,      // WCDMA RxInfo.rsrp_range, RSCP + 116
    UmtsEcioIndex,      // WCDMA RxInfo.rsrq_range, (Ec/Io + 24) x 2
    GsmRxlevDbm,        // GsmIdleScellMeasurement.idle_rxlev_dBm
    LtePci,             // phy_cell_id / nbr_phys_cell_id
    LteEarfcn,          // dl_freq / nbr_earfcn
    LteBand,            // freq_band_ind
    LteTac,             // tracking_area_code
    LteCellId,          // cell_id
    LteNbrRsrp,         // nbr_rsrp index
    LteNbrRsrq,         // nbr_rsrq index
    UmtsLac,            // WcdmaCellInfo.lac
    UmtsCellId,         // WcdmaCellInfo.cell_id
    UmtsUarfcn,         // dl_uarfcn / uarfcn
    UmtsBand,           // wcdma_band
    UmtsPsc,            // psc
    UmtsRscp,           // neighbour rscp index
    UmtsEcno,           // neighbour ecno index
    GsmLac,             // GsmScellInfo.lac
    GsmCellId,          // GsmScellInfo.cell_id
    GsmArfcn,           // arfcn
    GsmBsic,            // bsic
    GsmRxlev,           // neighbour rxlev index
    Mcc,                // mcc / sel_plmn_mcc
    Mnc,                // mnc / sel_plmn_mnc
    MncDigits,          // num_mnc_digits
    RegStatus,          // EmmContext.reg_status
    LocationLac,        // LAC from the location (no cell info)
    LocationCi,         // CI from the location
    LocationTac,        // TAC from the location
    SimIccid,           // EF ICCID content
    SimImsi,            // EF IMSI content
    SimMncDigits,       // EF AD: MNC length
    BearerConnected,    // only connected bearers are listed
    BearerApn,          // BearerContext.apn
    BearerPdpType,      // BearerContext.pdp_type
    BearerIpv4,         // BearerContext.pdp_addr, IPv4 part
    BearerIpv4Dns1,     // primary_dns_addr
    BearerIpv4Dns2,     // secondary_dns_addr
    BearerIpv6,         // BearerContext.pdp_addr, IPv6 part
    BearerIpv6Dns1,     // primary_dns_addr when there is no IPv4 one
    Count
};

inline constexpr std::size_t kFieldCount = static_cast<std::size_t>(Field::Count);

// One row of the mapping: ModemManager's dictionary and key, the D-Bus type, our field, the
// conversion, and the valid range of the value in ModemManager's unit (before conversion;
// for text, of the number it holds; for digit strings, of its length).
struct ModemFieldRow {
    MmSource source;
    std::string_view key;
    DbusType type;
    Field field;
    Conversion conversion;
    double min;
    double max;
    std::string_view target;  // our message field, for log lines and documentation
};

}  // namespace pyx::modem
