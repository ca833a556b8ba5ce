// SPDX-License-Identifier: Apache-2.0
#pragma once

// The 29 kinds of message that the viewer takes, for code that each peer needs once per class.
#define BENCH_CLASSES(CLASS)                  \
  CLASS(KCellularLteCdrxConfig)               \
  CLASS(KCellularLteRrcState)                 \
  CLASS(KCellularLteScellInfo)                \
  CLASS(KCellularLteSelReselCellInfo)         \
  CLASS(KCellularLteTxPower)                  \
  CLASS(KCellularLteRsrpRsrqSinr)             \
  CLASS(KCellularLteComponentCarrierInfo)     \
  CLASS(KCellularLteCarrierAggregationStatus) \
  CLASS(KCellularLteNbrInterRatCellMeas)      \
  CLASS(KCellularLteNbrEutraCellMeas)         \
  CLASS(KCellularMmCommonInfo)                \
  CLASS(KCellularActivatedBearerContexts)     \
  CLASS(KCellularEmmContext)                  \
  CLASS(KCellularMmContext)                   \
  CLASS(KCellularGmmContext)                  \
  CLASS(KCellularWcdmaRrcConnectionState)     \
  CLASS(KCellularWcdmaRrcConfiguration)       \
  CLASS(KCellularWcdmaCellInfo)               \
  CLASS(KCellularWcdmaScellMeasurement)       \
  CLASS(KCellularWcdmaTxPower)                \
  CLASS(KCellularWcdmaSelReselCellInfo)       \
  CLASS(KCellularWcdmaNbrCellMeas)            \
  CLASS(KCellularGsmScellInfo)                \
  CLASS(KCellularGsmIdleConfig)               \
  CLASS(KCellularGsmIdleScellMeasurement)     \
  CLASS(KCellularGsmCsRfMeasurement)          \
  CLASS(KCellularGsmGrrEventMeasCr)           \
  CLASS(KCellularGsmGprsConfig)               \
  CLASS(KCellularSimCardFiles)
