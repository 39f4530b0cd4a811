#include "messages/DecodeError.h"

namespace pyx {

std::string_view DecodeError::describe(Reason reason) {
    switch (reason) {
        case Reason::TruncatedVarint:
            return "truncated varint";
        case Reason::LengthPastEnd:
            return "length past the end";
        case Reason::TruncatedFixed:
            return "truncated fixed-width value";
        case Reason::UnknownWireType:
            return "unknown wire type";
        case Reason::UnmatchedEndGroup:
            return "end of group does not match its start";
        case Reason::UnterminatedGroup:
            return "group without its end";
    }
    return "undecodable bytes";
}

std::string DecodeError::text() const {
    std::string out(describe(reason_));
    out += " at byte ";
    out += std::to_string(offset_);
    return out;
}

}  // namespace pyx
