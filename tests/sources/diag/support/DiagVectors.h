// The peers' DIAG test vectors (../shared/diag/vectors.jsonl) and captures, read at test time.
// A test that needs them calls PYX_NEED_SHARED_DIAG() first: without the folder it is skipped
// with "skipped: ../shared/diag not present".
#pragma once

#include <gtest/gtest.h>

#include <filesystem>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <vector>

#include "core/Value.h"

namespace pyx::diag::test {

// ../shared/diag beside the checkout.
[[nodiscard]] std::filesystem::path sharedDiag();
[[nodiscard]] bool haveSharedDiag();

#define PYX_NEED_SHARED_DIAG()                                     \
    do {                                                           \
        if (!::pyx::diag::test::haveSharedDiag())                  \
            GTEST_SKIP() << "skipped: ../shared/diag not present"; \
    } while (false)

// One record of vectors.jsonl (see ../shared/diag/VECTORS.md).
struct Vector {
    std::string id;       // "v001"
    std::string kind;     // log, cmd_response, request, framing
    std::string logCode;  // "0xB17F" for kind log, else ""
    std::string scope;    // log_payload, log_packet, diag_packet_no_crc, raw_bytes
    Bytes bytes;          // hex as given (scope says what it holds)
    Bytes packet;         // the whole unframed packet: log_packet_hex_synth, or bytes
    Bytes frame;          // hdlc_frame_hex_synth (framed for the wire), or empty
    nlohmann::json expect;
    double tolerance = 0.0051;  // for floats
    nlohmann::json raw;         // the whole record
};

// Every record, in file order; empty when the folder is absent.
[[nodiscard]] const std::vector<Vector>& vectors();
[[nodiscard]] const Vector& vector(const std::string& id);

[[nodiscard]] Bytes fromHex(const std::string& hex);

}  // namespace pyx::diag::test
