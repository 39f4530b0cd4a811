// The repeated scalar lists of a message: plain vectors, with the list operations the codec
// and the message runtime use.
#pragma once

#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

#include "core/Value.h"

namespace pyx {

using PBRepeatedUInt32 = std::vector<std::uint32_t>;
using PBRepeatedInt32 = std::vector<std::int32_t>;

inline void PBRepeatedUInt32Add(PBRepeatedUInt32& list, std::uint32_t value) {
    list.push_back(value);
}
inline void PBRepeatedInt32Add(PBRepeatedInt32& list, std::int32_t value) {
    list.push_back(value);
}
inline bool PBRepeatedUInt32IsEqual(const PBRepeatedUInt32& a, const PBRepeatedUInt32& b) {
    return a == b;
}
inline bool PBRepeatedInt32IsEqual(const PBRepeatedInt32& a, const PBRepeatedInt32& b) {
    return a == b;
}
// 0 for an empty list (so a message with nothing set hashes to 0), otherwise FNV-1a over the
// values' 32-bit patterns.
std::uint64_t PBRepeatedUInt32Hash(const PBRepeatedUInt32& list);
std::uint64_t PBRepeatedInt32Hash(const PBRepeatedInt32& list);
// The values as an array of numbers (unsigned or signed), in list order.
Array PBRepeatedUInt32NSArray(const PBRepeatedUInt32& list);
Array PBRepeatedInt32NSArray(const PBRepeatedInt32& list);

// An index at or past the end of a message's list. what() is
// "idx (<index>) is out of range (<count>)".
class IndexOutOfRange : public std::out_of_range {
  public:
    IndexOutOfRange(std::size_t index, std::size_t count);
    [[nodiscard]] std::size_t index() const { return index_; }
    [[nodiscard]] std::size_t count() const { return count_; }

  private:
    std::size_t index_;
    std::size_t count_;
};

namespace detail {
template <class List>
const typename List::value_type& checkedAt(const List& list, std::size_t index) {
    if (index >= list.size()) throw IndexOutOfRange(index, list.size());
    return list[index];
}
}  // namespace detail

}  // namespace pyx
