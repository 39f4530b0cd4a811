// The mapping from ModemManager's values to our fields: every row of the table with a value
// it takes, a value of the wrong D-Bus type and a value out of its range; and the bands that
// are derived from channel numbers.
#include <gtest/gtest.h>

#include <cmath>

#include "sources/modem/Bands.h"
#include "sources/modem/ModemFieldTable.h"

namespace pyx::modem {
namespace {

struct RowCase {
    std::string_view key;
    Field field;
    Value given;     // as the D-Bus edge hands it over
    Value expected;  // the raw value our message gets
};

Value u(std::uint32_t v) {
    return Value(v);
}
Value d(double v) {
    return Value(static_cast<float>(v));
}
Value i(std::int64_t v) {
    return Value(v);
}
Value b(std::initializer_list<std::uint8_t> bytes) {
    return Value(Bytes(bytes));
}

// One case per row of the table, in its order.
const std::vector<RowCase>& rowCases() {
    static const std::vector<RowCase> cases = {
        {"AccessTechnologies", Field::ServingAccessTech, u(0x4000), i(0x4000)},
        {"rsrp", Field::LteRsrp, d(-97.0), i(-97)},
        {"rsrq", Field::LteRsrq, d(-10.4), i(-10)},
        {"snr", Field::LteSinr, d(13.5), i(27)},
        {"rssi", Field::UmtsRssi, d(-80.0), i(-80)},
        {"rscp", Field::UmtsRscpIndex, d(-95.0), i(21)},
        {"ecio", Field::UmtsEcioIndex, d(-6.5), i(35)},
        {"rssi", Field::GsmRxlevDbm, d(-75.0), i(-75)},
        {"physical-ci", Field::LtePci, Value("12F"), i(303)},
        {"earfcn", Field::LteEarfcn, u(1300), i(1300)},
        {"earfcn", Field::LteBand, u(1300), i(3)},
        {"tac", Field::LteTac, Value("1A2B"), i(6699)},
        {"ci", Field::LteCellId, Value("1A2B3C4"), i(27440068)},
        {"rsrp", Field::LteNbrRsrp, d(-103.0), i(37)},
        {"rsrq", Field::LteNbrRsrq, d(-12.5), i(14)},
        {"lac", Field::UmtsLac, Value("2C"), i(44)},
        {"ci", Field::UmtsCellId, Value("4d2"), i(1234)},
        {"uarfcn", Field::UmtsUarfcn, u(10700), i(10700)},
        {"uarfcn", Field::UmtsBand, u(10700), i(80)},
        {"psc", Field::UmtsPsc, u(137), i(137)},
        {"rscp", Field::UmtsRscp, d(-90.0), i(26)},
        {"ecio", Field::UmtsEcno, d(-7.5), i(34)},
        {"lac", Field::GsmLac, Value("2C"), i(44)},
        {"ci", Field::GsmCellId, Value("4D2"), i(1234)},
        {"arfcn", Field::GsmArfcn, u(60), i(60)},
        {"base-station-id", Field::GsmBsic, Value("2D"), i(45)},
        {"rx-level", Field::GsmRxlev, u(28), i(28)},
        {"OperatorCode", Field::Mcc, Value("26201"), i(262)},
        {"OperatorCode", Field::Mnc, Value("310410"), i(410)},
        {"OperatorCode", Field::MncDigits, Value("310410"), i(3)},
        {"RegistrationState", Field::RegStatus, u(5), i(0)},
        {"3gpp", Field::LocationLac, Value("262,01,2C,4D2,1A2B"), i(44)},
        {"3gpp", Field::LocationCi, Value("262,01,2C,4D2,1A2B"), i(1234)},
        {"3gpp", Field::LocationTac, Value("262,01,2C,4D2,1A2B"), i(6699)},
        {"SimIdentifier", Field::SimIccid, Value("89490200001234567890"),
         b({0x98, 0x94, 0x20, 0x00, 0x00, 0x21, 0x43, 0x65, 0x87, 0x09})},
        {"Imsi", Field::SimImsi, Value("262011234567890"),
         b({0x08, 0x29, 0x26, 0x10, 0x21, 0x43, 0x65, 0x87, 0x09})},
        {"OperatorIdentifier", Field::SimMncDigits, Value("26201"), i(2)},
        {"Connected", Field::BearerConnected, Value(true), i(1)},
        {"apn", Field::BearerApn, Value("internet"), Value("internet")},
        {"ip-type", Field::BearerPdpType, u(4), i(2)},
        {"address", Field::BearerIpv4, Value("10.64.1.2"), b({10, 64, 1, 2})},
        {"dns1", Field::BearerIpv4Dns1, Value("10.64.0.1"), b({10, 64, 0, 1})},
        {"dns2", Field::BearerIpv4Dns2, Value("10.64.0.2"), b({10, 64, 0, 2})},
        {"address", Field::BearerIpv6, Value("2001:db8::2"),
         b({0x20, 0x01, 0x0d, 0xb8, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 2})},
        {"dns1", Field::BearerIpv6Dns1, Value("2001:db8::53"),
         b({0x20, 0x01, 0x0d, 0xb8, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0x53})},
    };
    return cases;
}

Dict one(std::string_view key, Value value) {
    Dict dict;
    dict.append(std::string(key), std::move(value));
    return dict;
}

std::string rowName(const ModemFieldRow& row) {
    return std::string(sourceName(row.source)) + " " + std::string(row.key) + " -> " +
           std::string(row.target);
}

TEST(ModemFieldTable, EveryRowHasItsCase) {
    ASSERT_EQ(modemFieldTable().size(), rowCases().size());
    for (std::size_t n = 0; n < rowCases().size(); ++n) {
        EXPECT_EQ(modemFieldTable()[n].key, rowCases()[n].key) << "row " << n;
        EXPECT_EQ(modemFieldTable()[n].field, rowCases()[n].field) << "row " << n;
    }
}

TEST(ModemFieldTable, EveryRowConvertsAValueItTakes) {
    for (std::size_t n = 0; n < rowCases().size(); ++n) {
        const ModemFieldRow& row = modemFieldTable()[n];
        const RowCase& c = rowCases()[n];
        FieldIssues issues;
        EXPECT_EQ(mapRow(row, one(c.key, c.given), issues), c.expected) << rowName(row);
        EXPECT_TRUE(issues.empty()) << rowName(row) << ": " << issues.front();
    }
}

TEST(ModemFieldTable, EveryRowLeavesOutAValueOfTheWrongTypeWithOneLine) {
    for (const ModemFieldRow& row : modemFieldTable()) {
        const bool text = row.type == DbusType::String || row.type == DbusType::HexString;
        FieldIssues issues;
        EXPECT_TRUE(mapRow(row, one(row.key, text ? u(1) : Value("1")), issues).isNull())
            << rowName(row);
        ASSERT_EQ(issues.size(), 1U) << rowName(row);
        EXPECT_NE(issues[0].find(std::string(row.key)), std::string::npos) << issues[0];
        EXPECT_NE(issues[0].find("left out"), std::string::npos) << issues[0];
    }
}

TEST(ModemFieldTable, EveryNumericRowLeavesOutAValueOutOfItsRange) {
    for (const ModemFieldRow& row : modemFieldTable()) {
        if (row.type == DbusType::String || row.type == DbusType::Boolean) continue;
        if (row.max >= 4294967295.0) continue;  // the whole unsigned range is valid
        const double beyond = row.max + 1;
        const Value given =
            row.type == DbusType::Double ? d(beyond)
            : row.type == DbusType::UInt32
                ? u(static_cast<std::uint32_t>(beyond))
                : Value([&] {
                      char hex[16];
                      std::snprintf(hex, sizeof hex, "%X", static_cast<unsigned>(beyond));
                      return std::string(hex);
                  }());
        FieldIssues issues;
        EXPECT_TRUE(mapRow(row, one(row.key, given), issues).isNull()) << rowName(row);
        ASSERT_EQ(issues.size(), 1U) << rowName(row);
        EXPECT_NE(issues[0].find("out of range"), std::string::npos) << issues[0];
    }
}

TEST(ModemFieldTable, AMissingKeyIsUnknownAndNoFault) {
    FieldIssues issues;
    const FieldValues values = mapFields(MmSource::SignalLte, Dict{}, issues);
    EXPECT_FALSE(values.has(Field::LteRsrp));
    EXPECT_TRUE(issues.empty());
}

TEST(ModemFieldTable, MalformedTextIsLeftOutWithALineThatNamesIt) {
    FieldIssues issues;
    Dict cell = one("physical-ci", Value("XYZ"));
    cell.append("tac", Value("1A2B"));
    const FieldValues values = mapFields(MmSource::LteCell, cell, issues);
    EXPECT_FALSE(values.has(Field::LtePci));
    EXPECT_EQ(values.number(Field::LteTac), 6699);
    ASSERT_EQ(issues.size(), 1U);
    EXPECT_EQ(issues[0],
              "ModemManager GetCellInfo LTE cell physical-ci: 'XYZ' is not a hexadecimal number; "
              "left out");
}

TEST(ModemFieldTable, NotANumberIsOutOfRange) {
    FieldIssues issues;
    const auto row = modemFieldTable()[1];  // Signal.Lte rsrp
    EXPECT_TRUE(mapRow(row, one("rsrp", d(std::nan(""))), issues).isNull());
    EXPECT_EQ(issues.size(), 1U);
}

TEST(Bands, LteBandComesFromTheDownlinkEarfcn) {
    EXPECT_EQ(lteBandOfEarfcn(0), 1U);
    EXPECT_EQ(lteBandOfEarfcn(100), 1U);
    EXPECT_EQ(lteBandOfEarfcn(1300), 3U);
    EXPECT_EQ(lteBandOfEarfcn(1949), 3U);
    EXPECT_EQ(lteBandOfEarfcn(3350), 7U);
    EXPECT_EQ(lteBandOfEarfcn(6300), 20U);
    EXPECT_EQ(lteBandOfEarfcn(9410), 28U);
    EXPECT_EQ(lteBandOfEarfcn(38000), 38U);
    EXPECT_EQ(lteBandOfEarfcn(66486), 66U);
    EXPECT_EQ(lteBandOfEarfcn(68700), 71U);
    EXPECT_EQ(lteBandOfEarfcn(5000), std::nullopt);  // between bands 11 and 12
    EXPECT_EQ(lteBandOfEarfcn(262143), std::nullopt);
}

TEST(Bands, UmtsBandComesFromTheDownlinkUarfcnWhenItNamesOneBand) {
    EXPECT_EQ(umtsBandOfUarfcn(10700), 1U);
    EXPECT_EQ(umtsBandOfUarfcn(9800), 2U);
    EXPECT_EQ(umtsBandOfUarfcn(437), 2U);  // an additional channel
    EXPECT_EQ(umtsBandOfUarfcn(1300), 3U);
    EXPECT_EQ(umtsBandOfUarfcn(3011), 8U);
    EXPECT_EQ(umtsBandOfUarfcn(4436), 5U);
    EXPECT_EQ(umtsBandOfUarfcn(4400), std::nullopt);  // bands V and VI overlap
    EXPECT_EQ(umtsBandOfUarfcn(1037), std::nullopt);  // an additional channel of V and of VI
    EXPECT_EQ(umtsBandOfUarfcn(438), std::nullopt);   // off the additional raster
    EXPECT_EQ(umtsBandOfUarfcn(20000), std::nullopt);
    EXPECT_EQ(wcdmaBandCode(1), 80U);
    EXPECT_EQ(wcdmaBandCode(8), 87U);
    EXPECT_EQ(wcdmaBandCode(19), 91U);
    EXPECT_EQ(wcdmaBandCode(10), std::nullopt);
}

}  // namespace
}  // namespace pyx::modem
