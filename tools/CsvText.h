// Text for CSV files as RFC 4180 has it: a field with a comma, a double quote or a line break
// is put in double quotes, with its double quotes doubled; rows end with CRLF.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace pyx {

void appendCsvField(std::string& out, std::string_view field);
// The fields, separated by commas, and CRLF.
void appendCsvRow(std::string& out, const std::vector<std::string>& fields);

}  // namespace pyx
