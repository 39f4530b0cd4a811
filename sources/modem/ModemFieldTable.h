// The one table that says which ModemManager value fills which of our message fields, and the
// function that applies it to a dictionary. A value of the wrong D-Bus type, text that is not
// what the row expects and a number outside the row's range are left out, each with one line
// in the issues.
#pragma once

#include <span>
#include <string>
#include <vector>

#include "core/Value.h"
#include "sources/modem/FieldValues.h"
#include "sources/modem/ModemField.h"

namespace pyx::modem {

// Every row of the mapping, in the order of ModemField.h's sources.
[[nodiscard]] std::span<const ModemFieldRow> modemFieldTable();

// What was left out, one line each ("ModemManager Signal.Lte rsrp: -500.0 is out of range
// -156..-31; left out"); rows that read the same key give the same line.
using FieldIssues = std::vector<std::string>;

// Applies the rows of source to dict.
[[nodiscard]] FieldValues mapFields(MmSource source, const Dict& dict, FieldIssues& issues);

// Applies one row: the converted value, or an empty Value when there is none (with a line in
// issues when the key was there but unusable).
[[nodiscard]] Value mapRow(const ModemFieldRow& row, const Dict& dict, FieldIssues& issues);

// The name of a source as log lines give it ("Signal.Lte", "GetCellInfo LTE cell").
[[nodiscard]] std::string_view sourceName(MmSource source);

}  // namespace pyx::modem
