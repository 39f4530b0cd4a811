// The one list of metric kinds. Every part that names metric kinds expands this list and reads
// only the columns it needs; nothing else lists them. The header has no dependencies: the
// names in its columns are resolved where the list is expanded.
//
// KIND(constant, id, decoding, store, logPrefix, work, tagText, simWriter), in the order of the
// K_* constants of MetricValidator:
//   constant   the K_* constant's name.
//   id         the metric ID, 0x3C0000 plus the 16-bit metric tag.
//   decoding   DECODED(Class): the payload is decoded with message class Class;
//              IGNORED(Class): catalogued but deliberately not cared for, though Class exists;
//              IGNORED_UNCLASSED: catalogued, not cared for, and no message class at all.
//   store      STORED(property, setter, slot): the store keeps the kind's latest dictionary
//              in property (set with setter), the slot-th (from 0) of its dictionary properties;
//              UNSTORED: the store has no property for it.
//   logPrefix  the start of the line printed when the kind arrives ("" when not cared for).
//   work       the kind's work on its stored dictionary (kindwork::*), or nullptr.
//   tagText    the class-name text the metric-tag table gives the kind's tag, or "" when the
//              tag is deliberately not in that table.
//   simWriter  the simulated baseband's payload writer (payloads::*), or nullptr when the
//              simulation does not report the kind.
#pragma once

// clang-format off
#define PYX_METRIC_KINDS(KIND)                                                                     \
    KIND(K_LTE_CDRX_CONFIG, 0x3C4E18, DECODED(KCellularLteCdrxConfig),                             \
         STORED(myLTECDRXConfigDict, setMyLTECDRXConfigDict, 1),                                   \
         "Current CDRX Config is ", nullptr,                                                       \
         "KCellularLteCdrxConfig", payloads::lteCdrxConfig)                                        \
    KIND(K_LTE_RRC_STATE, 0x3C4E04, DECODED(KCellularLteRrcState),                                 \
         STORED(myLTERRCStateDict, setMyLTERRCStateDict, 0),                                       \
         "Current RRC state is ", nullptr,                                                         \
         "KCellularLteRrcState", payloads::lteRrcState)                                            \
    KIND(K_LTE_SCELL_INFO, 0x3C40C2, DECODED(KCellularLteScellInfo),                               \
         STORED(myLTESCellInfoDict, setMyLTESCellInfoDict, 2),                                     \
         "Current Serving Cell Info is ", kindwork::lteScellInfo,                                  \
         "KCellularLteScellInfo", payloads::lteScellInfo)                                          \
    KIND(K_LTE_RLF, 0x3C4E25, IGNORED_UNCLASSED,                                                   \
         UNSTORED,                                                                                 \
         "", nullptr,                                                                              \
         "KCellularLteRadioLinkFailure", payloads::lteRadioLinkFailure)                            \
    KIND(K_LTE_SEL_RESEL_INFO, 0x3CD30E, DECODED(KCellularLteSelReselCellInfo),                    \
         STORED(myLTESelReselDict, setMyLTESelReselDict, 4),                                       \
         "Received LTE Cell Resel Info is ", kindwork::lteSelReselCellInfo,                        \
         "KCellularLteSelReselCellInfo", payloads::lteSelReselInfo)                                \
    KIND(K_LTE_SCELL_MEAS, 0x3CD301, IGNORED(KCellularLteServingCellMeasurement),                  \
         STORED(myLTESCellMeasDict, setMyLTESCellMeasDict, 3),                                     \
         "", nullptr,                                                                              \
         "KCellularLteServingCellMeasurement", payloads::lteScellMeas)                             \
    KIND(K_LTE_TX_POWER, 0x3CD302, DECODED(KCellularLteTxPower),                                   \
         STORED(myLTETxPowerDict, setMyLTETxPowerDict, 7),                                         \
         "Received LTE Tx Power is ", kindwork::lteTxPower,                                        \
         "KCellularLteTxPower", payloads::lteTxPower)                                              \
    KIND(K_LTE_RSRP_RSRQ_SINR, 0x3C4F6A, DECODED(KCellularLteRsrpRsrqSinr),                        \
         STORED(myLTERsrpRsrqSinrDict, setMyLTERsrpRsrqSinrDict, 5),                               \
         "Received RSRP RSRQ SINR is : ", kindwork::lteRsrpRsrqSinr,                               \
         "KCellularRsrpRsrqSinr", payloads::lteRsrpRsrqSinr)                                       \
    KIND(K_LTE_COMPCARR_INFO, 0x3CD30B, DECODED(KCellularLteComponentCarrierInfo),                 \
         STORED(myLTECompCarrDict, setMyLTECompCarrDict, 6),                                       \
         "Received Component Carrier info is ", nullptr,                                           \
         "KCellularLteComponentCarrierInfo", payloads::lteComponentCarrierInfo)                    \
    KIND(K_LTE_CA_STATUS, 0x3CD313, DECODED(KCellularLteCarrierAggregationStatus),                 \
         STORED(myLTECAStatusDict, setMyLTECAStatusDict, 10),                                      \
         "Received CA Status Dict is ", kindwork::lteCarrierAggregationStatus,                     \
         "KCellularLteCarrierAggregationStatus", payloads::lteCaStatus)                            \
    KIND(K_LTE_INTERRAT_MEAS, 0x3CD310, DECODED(KCellularLteNbrInterRatCellMeas),                  \
         STORED(myLTEInterRatMeasDict, setMyLTEInterRatMeasDict, 8),                               \
         "Received LTE InterRat Meas Info is ", kindwork::lteNbrInterRatCellMeas,                  \
         "KCellularLteNbrInterRatCellMeas", payloads::lteInterRatMeas)                             \
    KIND(K_LTE_INTRARAT_MEAS, 0x3CD30F, DECODED(KCellularLteNbrEutraCellMeas),                     \
         STORED(myLTEIntraRatMeasDict, setMyLTEIntraRatMeasDict, 9),                               \
         "Received LTE IRAT Meas is ", kindwork::lteNbrEutraCellMeas,                              \
         "KCellularLteNbrEutraCellMeas", payloads::lteIntraRatMeas)                                \
    KIND(K_LTE_SECONDARYCELL_MEAS, 0x3CD317, DECODED(KCellularLteSecondaryCellMeasurements),       \
         STORED(myLTESecondaryCellMeasDict, setMyLTESecondaryCellMeasDict, 11),                    \
         "Received Secondary Cell Measurement Dict is ", kindwork::lteSecondaryCellMeasurements,   \
         "", payloads::lteSecondaryCellMeas)                                                       \
    KIND(K_CELLULAR_MM_INFO, 0x3CD509, DECODED(KCellularMmCommonInfo),                             \
         STORED(myCellularMMCommonInfoDict, setMyCellularMMCommonInfoDict, 13),                    \
         "Received MM Common Info Dict is : ", nullptr,                                            \
         "KCellularMmCommonInfo", payloads::mmCommonInfo)                                          \
    KIND(K_CELLULAR_ACTIVE_BEARER, 0x3CD50D, DECODED(KCellularActivatedBearerContexts),            \
         STORED(myCellularActiveBearerDict, setMyCellularActiveBearerDict, 14),                    \
         "Received Bearer Context Info is ", kindwork::activatedBearerContexts,                    \
         "KCellularActivatedBearerContexts", payloads::activeBearers)                              \
    KIND(K_LTE_EMM_CTXT, 0x3CD50C, DECODED(KCellularEmmContext),                                   \
         STORED(myLTEEMMContextDict, setMyLTEEMMContextDict, 12),                                  \
         "Received EMM Context is ", nullptr,                                                      \
         "KCellularEmmContext", payloads::emmContext)                                              \
    KIND(K_CELLULAR_MM_CTXT, 0x3CD50A, DECODED(KCellularMmContext),                                \
         STORED(myMMContextDict, setMyMMContextDict, 16),                                          \
         "Received MM Context Info is ", nullptr,                                                  \
         "KCellularMmContext", payloads::mmContext)                                                \
    KIND(K_CELLULAR_GMM_CTXT, 0x3CD50B, DECODED(KCellularGmmContext),                              \
         STORED(myGMMContextDict, setMyGMMContextDict, 15),                                        \
         "Received GMM Context Info is ", nullptr,                                                 \
         "KCellularGmmContext", payloads::gmmContext)                                              \
    KIND(K_UMTS_RRC_STATE, 0x3CD112, DECODED(KCellularWcdmaRrcConnectionState),                    \
         STORED(myUMTSRRCStateDict, setMyUMTSRRCStateDict, 17),                                    \
         "Received UMTS RRC Connection State is ", nullptr,                                        \
         "KCellularWcdmaRrcConnectionState", payloads::umtsRrcState)                               \
    KIND(K_UMTS_RRC_CONFIG, 0x3CD113, DECODED(KCellularWcdmaRrcConfiguration),                     \
         STORED(myUMTSRRCConfigDict, setMyUMTSRRCConfigDict, 18),                                  \
         "Received UMTS RRC Configuration is ", nullptr,                                           \
         "KCellularWcdmaRrcConfiguration", payloads::umtsRrcConfig)                                \
    KIND(K_UMTS_SCELL_INFO, 0x3C300C, DECODED(KCellularWcdmaCellInfo),                             \
         STORED(myUMTSCellInfoDict, setMyUMTSCellInfoDict, 19),                                    \
         "Received UMTS Serving Cell Info is ", nullptr,                                           \
         "KCellularWcdmaCellInfo", payloads::umtsScellInfo)                                        \
    KIND(K_UMTS_SCELL_MEAS, 0x3CD102, DECODED(KCellularWcdmaScellMeasurement),                     \
         STORED(myUMTSCellMeasDict, setMyUMTSCellMeasDict, 20),                                    \
         "Received UMTS Serving Cell Meas is ", kindwork::wcdmaScellMeasurement,                   \
         "KCellularWcdmaScellMeasurement", payloads::umtsScellMeas)                                \
    KIND(K_UMTS_TX_POWER, 0x3CD103, DECODED(KCellularWcdmaTxPower),                                \
         STORED(myUMTSTxPowerDict, setMyUMTSTxPowerDict, 21),                                      \
         "Received Tx Power is ", kindwork::wcdmaTxPower,                                          \
         "KCellularWcdmaTxPower", payloads::umtsTxPower)                                           \
    KIND(K_UMTS_SEL_RESEL_INFO, 0x3CD104, DECODED(KCellularWcdmaSelReselCellInfo),                 \
         STORED(myUMTSSelReselDict, setMyUMTSSelReselDict, 22),                                    \
         "Received UMTS Cell Resel Info is ", kindwork::wcdmaSelReselCellInfo,                     \
         "KCellularWcdmaSelReselCellInfo", payloads::umtsSelReselInfo)                             \
    KIND(K_UMTS_NCELL_MEAS, 0x3CD105, DECODED(KCellularWcdmaNbrCellMeas),                          \
         STORED(myUMTSNbrMeasDict, setMyUMTSNbrMeasDict, 23),                                      \
         "Received UMTS InterRat Meas Info is ", kindwork::wcdmaNbrCellMeas,                       \
         "KCellularWcdmaNbrCellMeas", payloads::umtsNcellMeas)                                     \
    KIND(K_GSM_SCELL_INFO, 0x3C2E0C, DECODED(KCellularGsmScellInfo),                               \
         STORED(myGSMScellInfoDict, setMyGSMScellInfoDict, 24),                                    \
         "Received GSM Serving Cell Info ", nullptr,                                               \
         "kCellularGsmScellInfo", payloads::gsmScellInfo)                                          \
    KIND(K_GSM_IDLE_CONFIG, 0x3CD001, DECODED(KCellularGsmIdleConfig),                             \
         STORED(myGSMIdleConfigInfoDict, setMyGSMIdleConfigInfoDict, 25),                          \
         "Received GSM Idle Config Info is ", nullptr,                                             \
         "kCellularGsmIdleConfig", payloads::gsmIdleConfig)                                        \
    KIND(K_GSM_IDLE_SCELL_MEAS, 0x3CD002, DECODED(KCellularGsmIdleScellMeasurement),               \
         STORED(myGSMIdleScellMeasDict, setMyGSMIdleScellMeasDict, 26),                            \
         "Received GSM Idle Serving Cell Meas Info is ", nullptr,                                  \
         "kCellularGsmIdleScellMeasurement", payloads::gsmIdleScellMeas)                           \
    KIND(K_GSM_CS_RF_MEAS, 0x3CD003, DECODED(KCellularGsmCsRfMeasurement),                         \
         STORED(myGSMConnRfMeasDict, setMyGSMConnRfMeasDict, 27),                                  \
         "Received GSM Connected Serving Cell Meas Info is ", nullptr,                             \
         "kCellularGsmCsRfMeasurement", payloads::gsmCsRfMeas)                                     \
    KIND(K_GSM_NCELL_MEAS, 0x3CD009, DECODED(KCellularGsmGrrEventMeasCr),                          \
         STORED(myGSMNbrMeasDict, setMyGSMNbrMeasDict, 28),                                        \
         "Received GSM Nbr Cell Meas Info is ", kindwork::gsmGrrEventMeasCr,                       \
         "kCellularGsmGrrEventMeasCr", payloads::gsmNcellMeas)                                     \
    KIND(K_GSM_GPRS_CONFIG, 0x3CD00C, DECODED(KCellularGsmGprsConfig),                             \
         STORED(myGSMGPRSConfigDict, setMyGSMGPRSConfigDict, 29),                                  \
         "Received GSM GPRS Config Info is ", nullptr,                                             \
         "kCellularGsmGprsConfig", payloads::gsmGprsConfig)                                        \
    KIND(K_SIM_FILE_INFO, 0x3C0013, DECODED(KCellularSimCardFiles),                                \
         STORED(mySIMFileInfoDict, setMySIMFileInfoDict, 30),                                      \
         "Received SIM Card File Info is ", kindwork::simCardFiles,                                \
         "kCellularSimCardFiles", payloads::simCardFiles)
// clang-format on
