// What ModemManager's values become on the screens: facts written by the modem source's
// payload writers, fed through the store, read through the screen controller.
#include <gtest/gtest.h>

#include <cstdio>

#include "ScreenText.h"
#include "metrics/MetricCatalogue.h"
#include "sources/modem/ModemPayloads.h"

namespace pyx::modem {
namespace {

constexpr std::uint64_t kTimestamp = 1500000000123ULL;

Value u(std::uint32_t v) {
    return Value(v);
}
Value d(double v) {
    return Value(static_cast<float>(v));
}

Dict cell(std::uint32_t type, bool serving, std::initializer_list<DictEntry> entries) {
    Dict out{{"cell-type", u(type)}, {"serving", Value(serving)}};
    for (const auto& e : entries) out.append(e.key, e.value);
    return out;
}

class ModemScreens : public ::testing::Test {
  protected:
    std::shared_ptr<MetricValidator> store = MetricValidator::create(nullptr);

    // Writes every kind from facts and feeds those that have something to the store.
    void feed(const ModemFacts& facts) {
        FieldIssues issues;
        const ModemReading reading = readModem(facts, issues);
        EXPECT_TRUE(issues.empty()) << issues.front();
        for (const ModemKind& kind : modemKinds()) {
            const auto payload = kind.write(reading, kTimestamp, issues);
            if (!payload) continue;
            Dict record;
            record.append("kKeyMetricID", Value(kind.metricID));
            record.append("kKeyPayload", Value(*payload));
            EXPECT_TRUE(store->isMetricIDValidWithMetricdict(record))
                << findMetricKind(kind.metricID)->messageClass;
        }
        EXPECT_TRUE(issues.empty()) << issues.front();
    }
    std::optional<std::string> shown(const std::string& group, const std::string& category,
                                     const std::string& key, int section = 0) {
        return test::shownOn(store, group, category, key, section);
    }
};

TEST(ModemKinds, EveryKindIsACataloguedKindWithAMessageClass) {
    for (const ModemKind& kind : modemKinds()) {
        const MetricKind* catalogued = findMetricKind(kind.metricID);
        ASSERT_NE(catalogued, nullptr) << kind.metricID;
        EXPECT_TRUE(catalogued->decodable()) << kind.metricID;
        EXPECT_FALSE(catalogued->messageClass.empty()) << kind.metricID;
    }
}

// A reading in which field has value wherever a writer may look for it: in every dictionary,
// every bearer and a serving and a neighbour cell of each technology, with rat serving.
ModemReading everywhere(Field field, const Value& value, Rat rat) {
    ModemReading r;
    for (FieldValues* v :
         {&r.modem, &r.modem3gpp, &r.signalLte, &r.signalUmts, &r.signalGsm, &r.location, &r.sim})
        v->set(field, value);
    r.hasCellInfo = true;
    for (const Rat cellRat : {Rat::Lte, Rat::Umts, Rat::Gsm})
        for (const bool serving : {true, false}) {
            CellValues cell{cellRat, serving, {}};
            cell.values.set(field, value);
            r.cells.push_back(cell);
        }
    r.bearers.emplace_back().set(field, value);
    r.servingRat = rat;
    return r;
}

// The value a row is given at one end of its range, as the D-Bus edge hands it over.
std::optional<Value> given(const ModemFieldRow& row, double end) {
    switch (row.type) {
        case DbusType::Double:
            return d(end);
        case DbusType::UInt32:
            return u(static_cast<std::uint32_t>(end));
        case DbusType::HexString: {
            char hex[16];
            std::snprintf(hex, sizeof hex, "%X", static_cast<unsigned>(end));
            return Value(std::string(hex));
        }
        default:
            return std::nullopt;  // text and booleans: their range is not of the value
    }
}

TEST(ModemKinds, EveryRowsRangeConvertedFitsEveryFieldTheRowFeeds) {
    for (const ModemFieldRow& row : modemFieldTable()) {
        for (const double end : {row.min, row.max}) {
            const auto value = given(row, end);
            if (!value) continue;
            Dict dict;
            dict.append(std::string(row.key), *value);
            FieldIssues issues;
            const Value converted = mapRow(row, dict, issues);
            if (converted.isNull()) continue;  // no band, an unknown state: nothing to write
            for (const Rat rat : {Rat::Lte, Rat::Umts, Rat::Gsm}) {
                const ModemReading reading = everywhere(row.field, converted, rat);
                for (const ModemKind& kind : modemKinds())
                    static_cast<void>(kind.write(reading, kTimestamp, issues));
            }
            EXPECT_TRUE(issues.empty()) << row.target << " at " << end << ": " << issues.front();
        }
    }
}

TEST(ModemKinds, AValueItsMessageFieldCannotHoldIsLeftOutWithOneLine) {
    ModemReading reading;
    reading.hasCellInfo = true;
    reading.servingRat = Rat::Gsm;
    CellValues umts{Rat::Umts, false, {}};
    umts.values.set(Field::UmtsPsc, Value(std::int64_t{12}));
    umts.values.set(Field::UmtsRscp, Value(std::int64_t{-4}));
    reading.cells.push_back(umts);
    FieldIssues issues;
    const auto* kind = findModemKind(0x3CD009);  // the GSM neighbour report
    ASSERT_NE(kind, nullptr);
    const auto payload = kind->write(reading, kTimestamp, issues);
    ASSERT_TRUE(payload);
    ASSERT_EQ(issues.size(), 1U);
    EXPECT_EQ(issues[0],
              "ModemManager GetCellInfo UMTS cell rscp: becomes -4 for UTRA neighbour rscp (RSCP "
              "+ 116), which an unsigned 32-bit field cannot hold; left out");
    std::shared_ptr<MetricValidator> store = MetricValidator::create(nullptr);
    Dict record;
    record.append("kKeyMetricID", Value(kind->metricID));
    record.append("kKeyPayload", Value(*payload));
    ASSERT_TRUE(store->isMetricIDValidWithMetricdict(record));
    EXPECT_EQ(test::shownOn(store, "GSM", "UMTS Neighbor Cell Meas", "cpich_sc"), "12");
    EXPECT_EQ(test::shownOn(store, "GSM", "UMTS Neighbor Cell Meas", "cpich_rscp"), std::nullopt);
}

TEST_F(ModemScreens, LteValuesShowAsTheModemSaidThem) {
    ModemFacts facts;
    facts.modem3gpp = Dict{{"OperatorCode", Value("310410")}, {"RegistrationState", u(1)}};
    facts.signalLte = Dict{{"rsrp", d(-97.0)}, {"rsrq", d(-10.0)}, {"snr", d(13.5)}};
    facts.cells = std::vector<Dict>{
        cell(5, true,
             {{"physical-ci", Value("1F7")}, {"earfcn", u(66486)}, {"tac", Value("FFFE")}}),
        cell(5, false,
             {{"physical-ci", Value("0")},
              {"earfcn", u(5110)},
              {"rsrp", d(-140.0)},
              {"rsrq", d(-19.5)}}),
        cell(3, false,
             {{"uarfcn", u(10700)}, {"psc", u(12)}, {"rscp", d(-101.0)}, {"ecio", d(-9.5)}}),
        cell(2, false, {{"arfcn", u(60)}, {"base-station-id", Value("2D")}, {"rx-level", u(21)}}),
    };
    feed(facts);
    EXPECT_EQ(shown("LTE", "Serving Cell Meas", "phy_cell_id"), "503");
    EXPECT_EQ(shown("LTE", "Serving Cell Meas", "rsrp0"), "-97");
    EXPECT_EQ(shown("LTE", "Serving Cell Meas", "rsrq0"), "-10");
    EXPECT_EQ(shown("LTE", "Serving Cell Meas", "sinr0"), "13.5");
    EXPECT_EQ(shown("LTE", "Serving Cell Info", "freq_band_ind"), "66");
    EXPECT_EQ(shown("LTE", "Serving Cell Info", "tracking_area_code"), "65534");
    EXPECT_EQ(shown("LTE", "Serving Cell Info", "sel_plmn_mnc"), "410");
    EXPECT_EQ(shown("LTE", "Serving Cell Info", "num_mnc_digits"), "3");
    EXPECT_EQ(shown("LTE", "LTE Neighbor Cell Meas", "freq_band_ind"), "12");
    EXPECT_EQ(shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrp"), "-140");
    EXPECT_EQ(shown("LTE", "LTE Neighbor Cell Meas", "nbr_rsrq"), "-19.5");
    EXPECT_EQ(shown("LTE", "UMTS Neighbor Cell Meas", "psc"), "12");
    EXPECT_EQ(shown("LTE", "UMTS Neighbor Cell Meas", "rscp"), "-101");
    EXPECT_EQ(shown("LTE", "UMTS Neighbor Cell Meas", "ecno"), "-9.5");
    EXPECT_EQ(shown("LTE", "GSM Neighbor Cell Meas", "bsic"), "45");
    EXPECT_EQ(shown("LTE", "GSM Neighbor Cell Meas", "rxlev"), "-89");
    EXPECT_EQ(shown("LTE", "NAS", "reg_status"), "KREG_STATUS_NORMAL_SERVICE");
    // What ModemManager cannot say stays absent.
    EXPECT_FALSE(store->myLTERRCStateDict());
    EXPECT_FALSE(store->myUMTSCellInfoDict());
}

TEST_F(ModemScreens, UmtsValuesShowAsTheModemSaidThem) {
    ModemFacts facts;
    facts.modem3gpp = Dict{{"OperatorCode", Value("26201")}};
    facts.signalUmts = Dict{{"rssi", d(-70.0)}, {"rscp", d(-90.0)}, {"ecio", d(-6.0)}};
    facts.cells = std::vector<Dict>{
        cell(3, true,
             {{"lac", Value("2C")}, {"ci", Value("4D2")}, {"uarfcn", u(3011)}, {"psc", u(137)}}),
        cell(3, false,
             {{"uarfcn", u(3011)}, {"psc", u(12)}, {"rscp", d(-99.0)}, {"ecio", d(-12.0)}}),
        cell(5, false,
             {{"physical-ci", Value("12F")},
              {"earfcn", u(1300)},
              {"rsrp", d(-104.0)},
              {"rsrq", d(-11.5)}}),
    };
    feed(facts);
    EXPECT_EQ(shown("UMTS", "Serving Cell Info", "lac"), "44");
    EXPECT_EQ(shown("UMTS", "Serving Cell Info", "cell_id"), "1234");
    EXPECT_EQ(shown("UMTS", "Serving Cell Info", "wcdma_band"), "SYS_BAND_WCDMA_VIII_900");
    EXPECT_EQ(shown("UMTS", "Serving Cell Info", "dl_uarfcn"), "3011");
    EXPECT_EQ(shown("UMTS", "Serving Cell Info", "psc"), "137");
    EXPECT_EQ(shown("UMTS", "Serving Cell Info", "mcc"), "262");
    EXPECT_EQ(shown("UMTS", "Serving Cell Measurement", "rssi"), "-70");
    EXPECT_EQ(shown("UMTS", "UMTS Neighbor Cell Meas", "rscp"), "-99");
    EXPECT_EQ(shown("UMTS", "UMTS Neighbor Cell Meas", "ecno"), "-12.0");
    EXPECT_EQ(shown("UMTS", "LTE Neighbor Cell Meas", "rsrp"), "-104");
    EXPECT_EQ(shown("UMTS", "LTE Neighbor Cell Meas", "rsrq"), "-11.5");
    EXPECT_EQ(shown("UMTS", "LTE Neighbor Cell Meas", "eutra_band"), "3");
    EXPECT_FALSE(store->myLTESCellInfoDict());
}

TEST_F(ModemScreens, GsmValuesShowAsTheModemSaidThem) {
    ModemFacts facts;
    facts.modem3gpp = Dict{{"OperatorCode", Value("26201")}};
    facts.signalGsm = Dict{{"rssi", d(-75.0)}};
    facts.cells = std::vector<Dict>{
        cell(2, true,
             {{"lac", Value("2C")},
              {"ci", Value("4D2")},
              {"arfcn", u(60)},
              {"base-station-id", Value("2D")}}),
        cell(2, false,
             {{"lac", Value("2C")}, {"ci", Value("4D3")}, {"arfcn", u(62)}, {"rx-level", u(30)}}),
    };
    feed(facts);
    ASSERT_TRUE(store->myGSMScellInfoDict());
    const Dict& info = *store->myGSMScellInfoDict();
    EXPECT_EQ(info.find("arfcn")->description(), "60");
    EXPECT_EQ(info.find("bsic")->description(), "45");
    EXPECT_EQ(info.find("cell_id")->description(), "1234");
    ASSERT_TRUE(store->myGSMIdleScellMeasDict());
    EXPECT_EQ(store->myGSMIdleScellMeasDict()->find("idle_rxlev_dBm")->description(), "-75");
    EXPECT_EQ(shown("GSM", "GSM Neighbor Cell Meas", "ci"), "1235");
    EXPECT_EQ(shown("GSM", "GSM Neighbor Cell Meas", "rxlev"), "-80");
}

TEST_F(ModemScreens, SimFilesAndBearersShowInTheirCardAndNetworkForms) {
    ModemFacts facts;
    facts.sim = Dict{{"SimIdentifier", Value("8944110063202514567")},
                     {"Imsi", Value("23415123456789")},
                     {"OperatorIdentifier", Value("23415")}};
    facts.bearers = {
        Dict{{"Connected", Value(true)},
             {"Properties", Value(Dict{{"apn", Value("ims")}, {"ip-type", u(2)}})},
             {"Ip6Config",
              Value(Dict{{"address", Value("2001:db8::1")}, {"dns1", Value("2001:db8::53")}})}},
        Dict{{"Connected", Value(false)}, {"Properties", Value(Dict{{"apn", Value("internet")}})}},
    };
    feed(facts);
    EXPECT_EQ(shown("Device Info", "SIM Files", "content", 0), "<98441100 36025241 65f7>");
    EXPECT_EQ(shown("Device Info", "SIM Files", "content", 1), "<08214351 21436587 f9>");
    EXPECT_EQ(shown("Device Info", "SIM Files", "content", 2), "<00000002>");
    ASSERT_EQ(test::sectionsOn(store, "LTE", "Active Bearers"), 1);
    EXPECT_EQ(shown("LTE", "Active Bearers", "apn"), "ims");
    EXPECT_EQ(shown("LTE", "Active Bearers", "pdp_type"), "PDP_TYPE_IPv6");
    EXPECT_EQ(shown("LTE", "Active Bearers", "primary_dns_type"), "PDP_TYPE_IPv6");
}

}  // namespace
}  // namespace pyx::modem
