// What one poll of ModemManager read about the modem in use, as plain values: each D-Bus
// dictionary or property set converted to a Dict at the D-Bus edge (doubles become floats,
// object paths strings), so that the mapping to our messages needs no D-Bus library.
#pragma once

#include <optional>
#include <vector>

#include "core/Value.h"

namespace pyx::modem {

struct ModemFacts {
    Dict modem;       // org.freedesktop.ModemManager1.Modem properties (AccessTechnologies...)
    Dict modem3gpp;   // .Modem.Modem3gpp properties (OperatorCode, RegistrationState...)
    Dict signalLte;   // .Modem.Signal "Lte": rssi, rsrp, rsrq, snr (a missing key is unknown)
    Dict signalUmts;  // .Modem.Signal "Umts": rssi, rscp, ecio
    Dict signalGsm;   // .Modem.Signal "Gsm": rssi
    // Modem.GetCellInfo(), one dictionary per cell; absent when the modem cannot say.
    std::optional<std::vector<Dict>> cells;
    // Modem.Location.GetLocation(): "3gpp" holds the "MCC,MNC,LAC,CI,TAC" text, if known.
    Dict location;
    Dict sim;  // the SIM object's properties (Imsi, SimIdentifier, OperatorIdentifier)
    // The bearers of Modem.Bearers: per bearer "Connected", "Properties", "Ip4Config" and
    // "Ip6Config" as ModemManager names them.
    std::vector<Dict> bearers;
};

}  // namespace pyx::modem
