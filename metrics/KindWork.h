// The work that some metric kinds do on their decoded dictionary after the timestamp has
// been rewritten: list entries converted to display units (written back into the dictionary),
// bandwidth codes looked up, and the kind's lists staged for its list holder.
#pragma once

#include "core/Value.h"
#include "metrics/StoreUpdate.h"

namespace pyx {

// Works on the dictionary that is about to be stored. Throws ConversionOverflow.
using KindWork = void (*)(Dict& stored, StoreUpdate& update);

namespace kindwork {
void lteTxPower(Dict& stored, StoreUpdate& update);
void lteCarrierAggregationStatus(Dict& stored, StoreUpdate& update);
void lteSecondaryCellMeasurements(Dict& stored, StoreUpdate& update);
void lteNbrInterRatCellMeas(Dict& stored, StoreUpdate& update);
void lteNbrEutraCellMeas(Dict& stored, StoreUpdate& update);
void lteSelReselCellInfo(Dict& stored, StoreUpdate& update);
void lteRsrpRsrqSinr(Dict& stored, StoreUpdate& update);
void lteScellInfo(Dict& stored, StoreUpdate& update);
void wcdmaScellMeasurement(Dict& stored, StoreUpdate& update);
void wcdmaSelReselCellInfo(Dict& stored, StoreUpdate& update);
void wcdmaNbrCellMeas(Dict& stored, StoreUpdate& update);
void wcdmaTxPower(Dict& stored, StoreUpdate& update);
void gsmGrrEventMeasCr(Dict& stored, StoreUpdate& update);
void activatedBearerContexts(Dict& stored, StoreUpdate& update);
void simCardFiles(Dict& stored, StoreUpdate& update);
}  // namespace kindwork

// The dictionary entries of stored[list] (an absent list gives an empty one).
[[nodiscard]] EntryList entriesOf(const Dict& stored, std::string_view list);

}  // namespace pyx
