#include "sources/diag/port/QmdlFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace pyx::diag {

QmdlFile::QmdlFile(std::string path, std::function<void(std::string_view line)> onFault)
    : path_(std::move(path)), onFault_(std::move(onFault)) {
    if (path_.empty()) return;
    fd_ = UniqueFd(::open(path_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644));
    if (!fd_.valid()) fail(errno);
}

void QmdlFile::append(std::span<const std::uint8_t> bytes) {
    while (fd_.valid() && !bytes.empty()) {
        const ssize_t n = ::write(fd_.get(), bytes.data(), bytes.size());
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) return fail(n < 0 ? errno : EIO);
        bytes = bytes.subspan(static_cast<std::size_t>(n));
    }
}

void QmdlFile::fail(int error) {
    fd_.reset();
    if (onFault_)
        onFault_("cannot write the DIAG stream to " + path_ + ": " + std::strerror(error) +
                 "; the live source goes on without keeping it");
}

}  // namespace pyx::diag
