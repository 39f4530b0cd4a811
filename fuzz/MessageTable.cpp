#include "fuzz/MessageTable.h"

#include <cstdio>
#include <cstdlib>
#include <iterator>

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

// Every class of the list of message classes, in its order.
#define PYX_FUZZ_CLASS(group, Class) FuzzClass{#Class, &check<::pyx::Class>},
const FuzzClass kClasses[] = {PYX_MESSAGE_CLASSES(PYX_FUZZ_CLASS)};
#undef PYX_FUZZ_CLASS

}  // namespace

std::span<const FuzzClass> fuzzClasses() {
    return kClasses;
}

int fuzzClassIndex(std::string_view name) {
    for (std::size_t i = 0; i < std::size(kClasses); ++i) {
        if (kClasses[i].name == name) return static_cast<int>(i);
    }
    return -1;
}

}  // namespace pyx::fuzz
