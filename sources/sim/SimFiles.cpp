#include "sources/sim/SimFiles.h"

#include <utility>

#include "messages/Messages.h"

namespace pyx::sim {

std::shared_ptr<ElementaryFile> elementaryFile(std::uint32_t id, Bytes content) {
    auto ef = std::make_shared<ElementaryFile>();
    ef->setEfId(id);
    ef->setContent(std::move(content));
    return ef;
}

Bytes adContent(std::uint32_t mncDigits) {
    return Bytes{0x00, 0x00, 0x00, static_cast<std::uint8_t>(mncDigits)};
}

}  // namespace pyx::sim
