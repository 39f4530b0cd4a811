#include "fuzz/MessageTable.h"

#include <array>
#include <cstdio>
#include <cstdlib>

#include "messages/Messages.h"

namespace pyx::fuzz {

namespace {

[[noreturn]] void broken(std::string_view className, const char* promise) {
    std::fprintf(stderr, "%.*s: %s\n", static_cast<int>(className.size()), className.data(),
                 promise);
    std::abort();
}

// Whatever reads successfully writes back, and the written bytes read again to an equal
// message (same hash, same dictionary, same bytes once more). A read that fails must still
// leave a message that can be shown, compared and copied.
template <class M>
void check(std::span<const std::uint8_t> payload) {
    const std::string_view name = M::descriptor().name;
    PBDataReader reader(payload);
    M first;
    const bool read = first.readFrom(reader);
    if (read == reader.hasError()) broken(name, "a refusal does not say why, or a read does");
    if (!read && reader.error()->offset() > payload.size()) {
        broken(name, "a refusal points past the payload");
    }
    const Dict shown = first.dictionaryRepresentation();
    const M copy = first.copy();
    if (!copy.isEqual(first)) broken(name, "a copy differs from its original");
    if (copy.hash() != first.hash()) broken(name, "a copy hashes differently");
    static_cast<void>(first.description());
    if (!read) return;

    const Bytes written = first.data();
    auto second = M::initWithData(written);
    if (!second) broken(name, "the written bytes do not read back");
    if (!second->isEqual(first)) broken(name, "the written bytes read back to another message");
    if (second->hash() != first.hash()) broken(name, "the message read back hashes differently");
    if (second->dictionaryRepresentation() != shown) {
        broken(name, "the message read back shows another dictionary");
    }
    if (second->data() != written) broken(name, "writing again gives other bytes");

    M merged;
    merged.mergeFrom(first);
    if (!merged.isEqual(first)) broken(name, "merging into an empty message changes it");
}

#define PYX_FUZZ_CLASS(Class)          \
    FuzzClass {                        \
#Class, &check < ::pyx::Class> \
    }

const std::array<FuzzClass, 56> kClasses = {
    // The metric kinds first, then the nested records.
    PYX_FUZZ_CLASS(KCellularLteCdrxConfig),
    PYX_FUZZ_CLASS(KCellularLteRrcState),
    PYX_FUZZ_CLASS(KCellularLteScellInfo),
    PYX_FUZZ_CLASS(KCellularLteSelReselCellInfo),
    PYX_FUZZ_CLASS(KCellularLteServingCellMeasurement),
    PYX_FUZZ_CLASS(KCellularLteTxPower),
    PYX_FUZZ_CLASS(KCellularLteRsrpRsrqSinr),
    PYX_FUZZ_CLASS(KCellularLteComponentCarrierInfo),
    PYX_FUZZ_CLASS(KCellularLteCarrierAggregationStatus),
    PYX_FUZZ_CLASS(KCellularLteNbrInterRatCellMeas),
    PYX_FUZZ_CLASS(KCellularLteNbrEutraCellMeas),
    PYX_FUZZ_CLASS(KCellularLteSecondaryCellMeasurements),
    PYX_FUZZ_CLASS(KCellularMmCommonInfo),
    PYX_FUZZ_CLASS(KCellularActivatedBearerContexts),
    PYX_FUZZ_CLASS(KCellularEmmContext),
    PYX_FUZZ_CLASS(KCellularMmContext),
    PYX_FUZZ_CLASS(KCellularGmmContext),
    PYX_FUZZ_CLASS(KCellularWcdmaRrcConnectionState),
    PYX_FUZZ_CLASS(KCellularWcdmaRrcConfiguration),
    PYX_FUZZ_CLASS(KCellularWcdmaCellInfo),
    PYX_FUZZ_CLASS(KCellularWcdmaScellMeasurement),
    PYX_FUZZ_CLASS(KCellularWcdmaTxPower),
    PYX_FUZZ_CLASS(KCellularWcdmaSelReselCellInfo),
    PYX_FUZZ_CLASS(KCellularWcdmaNbrCellMeas),
    PYX_FUZZ_CLASS(KCellularGsmScellInfo),
    PYX_FUZZ_CLASS(KCellularGsmIdleConfig),
    PYX_FUZZ_CLASS(KCellularGsmIdleScellMeasurement),
    PYX_FUZZ_CLASS(KCellularGsmCsRfMeasurement),
    PYX_FUZZ_CLASS(KCellularGsmGrrEventMeasCr),
    PYX_FUZZ_CLASS(KCellularGsmGprsConfig),
    PYX_FUZZ_CLASS(KCellularSimCardFiles),
    PYX_FUZZ_CLASS(RxInfo),
    PYX_FUZZ_CLASS(EgwErrcNbrEutraMeas),
    PYX_FUZZ_CLASS(EgwErrcNbrUtraMeas),
    PYX_FUZZ_CLASS(EgwErrcNbrGeranMeas),
    PYX_FUZZ_CLASS(NbrEutra),
    PYX_FUZZ_CLASS(SecondaryComponentCarrier),
    PYX_FUZZ_CLASS(SccRxMeasurement),
    PYX_FUZZ_CLASS(TxPowerInfo),
    PYX_FUZZ_CLASS(RsrpRsrqSinr),
    PYX_FUZZ_CLASS(UtraCellMeasResult),
    PYX_FUZZ_CLASS(GsmCellMeasResult),
    PYX_FUZZ_CLASS(LteCellMeasResult),
    PYX_FUZZ_CLASS(EutraFreqInfo),
    PYX_FUZZ_CLASS(UtraFreqInfo),
    PYX_FUZZ_CLASS(GsmFreqInfo),
    PYX_FUZZ_CLASS(GsmNcellMeas),
    PYX_FUZZ_CLASS(UmtsNcellMeas),
    PYX_FUZZ_CLASS(LteNcellMeas),
    PYX_FUZZ_CLASS(Plmn),
    PYX_FUZZ_CLASS(KCellularLocationAreaId),
    PYX_FUZZ_CLASS(RoutingAreaId),
    PYX_FUZZ_CLASS(KCellularTrackingAreaId),
    PYX_FUZZ_CLASS(Guti),
    PYX_FUZZ_CLASS(BearerContext),
    PYX_FUZZ_CLASS(ElementaryFile),
};

#undef PYX_FUZZ_CLASS

}  // namespace

std::span<const FuzzClass> fuzzClasses() {
    return kClasses;
}

int fuzzClassIndex(std::string_view name) {
    for (std::size_t i = 0; i < kClasses.size(); ++i) {
        if (kClasses[i].name == name) return static_cast<int>(i);
    }
    return -1;
}

}  // namespace pyx::fuzz
