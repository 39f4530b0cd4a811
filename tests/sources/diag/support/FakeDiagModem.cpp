#include "tests/sources/diag/support/FakeDiagModem.h"

#include <fcntl.h>
#include <poll.h>
#include <pty.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <stdexcept>
#include <string_view>

#include "sources/diag/frame/Hdlc.h"

namespace pyx::diag::test {

namespace {

void putU32(Bytes& out, std::uint32_t value) {
    for (int shift = 0; shift < 32; shift += 8)
        out.push_back(static_cast<std::uint8_t>(value >> shift));
}

std::uint32_t u32At(const Bytes& bytes, std::size_t offset) {
    if (bytes.size() < offset + 4) return 0;
    std::uint32_t value = 0;
    for (std::size_t i = 0; i < 4; ++i)
        value |= static_cast<std::uint32_t>(bytes[offset + i]) << (8 * i);
    return value;
}

void putText(Bytes& out, std::string_view text, std::size_t size) {
    for (std::size_t i = 0; i < size; ++i)
        out.push_back(i < text.size() ? static_cast<std::uint8_t>(text[i]) : 0);
}

}  // namespace

FakeDiagModem::FakeDiagModem(Options options) : options_(std::move(options)) {
    termios raw{};
    ::cfmakeraw(&raw);
    char name[128] = {};
    if (::openpty(&master_, &slave_, name, &raw, nullptr) != 0)
        throw std::runtime_error("openpty failed");
    path_ = name;
    ::fcntl(master_, F_SETFD, FD_CLOEXEC);
    ::fcntl(slave_, F_SETFD, FD_CLOEXEC);
    int wake[2];
    if (::pipe2(wake, O_CLOEXEC) != 0) throw std::runtime_error("pipe failed");
    wakeRead_ = wake[0];
    wakeWrite_ = wake[1];
    thread_ = std::thread([this] { serve(); });
}

FakeDiagModem::~FakeDiagModem() {
    hangUp();
    ::close(wakeRead_);
    ::close(wakeWrite_);
}

void FakeDiagModem::hangUp() {
    if (thread_.joinable()) {
        const char byte = 1;
        [[maybe_unused]] const auto n = ::write(wakeWrite_, &byte, 1);
        thread_.join();
    }
    const std::lock_guard lock(mutex_);
    if (hungUp_) return;
    hungUp_ = true;
    ::close(master_);
    ::close(slave_);
    changed_.notify_all();
}

void FakeDiagModem::serve() {
    Deframer deframer;
    std::vector<std::uint8_t> buffer(4096);
    for (;;) {
        pollfd fds[2] = {{master_, POLLIN, 0}, {wakeRead_, POLLIN, 0}};
        if (::poll(fds, 2, -1) < 0) {
            if (errno == EINTR) continue;
            return;
        }
        if (fds[1].revents != 0) return;
        const ssize_t n = ::read(master_, buffer.data(), buffer.size());
        if (n <= 0) {
            if (n < 0 && (errno == EINTR || errno == EAGAIN)) continue;
            return;
        }
        std::vector<Bytes> packets;
        deframer.feed(std::span<const std::uint8_t>(buffer.data(), static_cast<std::size_t>(n)),
                      [&](std::span<const std::uint8_t> packet) {
                          packets.emplace_back(packet.begin(), packet.end());
                      });
        for (const Bytes& request : packets) {
            {
                const std::lock_guard lock(mutex_);
                requests_.push_back(request);
                changed_.notify_all();
            }
            if (options_.answers) answer(request);
        }
    }
}

void FakeDiagModem::answer(const Bytes& request) {
    if (request.empty() || options_.unanswered.contains(request[0])) return;
    Bytes reply;
    switch (request[0]) {
        case 0x00:
            reply.push_back(0x00);
            putText(reply, "Nov  2 2021", 11);
            putText(reply, "22:13:12", 8);
            putText(reply, "Oct 12 2021", 11);
            putText(reply, "02:00:00", 8);
            putText(reply, options_.chipset, 8);
            reply.insert(reply.end(), {0x2a, 0x09, 0xff, 0x64, 0x00, 0x30, 0x00, 0xcf});
            break;
        case 0x7C:
            reply = {0x7C, 0x01, 0x00, 0x00};
            putU32(reply, 0x0CF2);
            putU32(reply, 0x014E);
            putText(reply, options_.buildId, options_.buildId.size() + 1);
            reply.push_back(0);
            break;
        case 0x60:  // event report control: an empty report
            reply = {0x60, 0x00, 0x00};
            break;
        case 0x73: {
            const std::uint32_t operation = u32At(request, 4);
            if (operation == 3) {
                const std::uint32_t equipment = u32At(request, 8);
                const std::uint32_t items = u32At(request, 12);
                if (options_.badParameterMasks.contains(equipment)) {
                    reply = {0x14};
                    reply.insert(reply.end(), request.begin(), request.end());
                    break;
                }
                const bool refused = options_.refuseMasks.contains(equipment);
                putU32(reply, 0x73);
                putU32(reply, operation);
                putU32(reply, refused ? 1 : 0);
                reply.insert(reply.end(), request.begin() + 8, request.end());
                if (!refused && request.size() >= 16) {
                    const std::lock_guard lock(mutex_);
                    masks_[equipment] = {items, Bytes(request.begin() + 16, request.end())};
                }
                break;
            }
            putU32(reply, 0x73);
            putU32(reply, operation);
            putU32(reply, 0);
            if (operation == 1)
                for (const std::uint32_t items : options_.ranges) putU32(reply, items);
            break;
        }
        default:  // a command this modem does not know
            reply = {0x13};
            reply.insert(reply.end(), request.begin(), request.end());
            break;
    }
    const std::lock_guard lock(mutex_);
    writeLocked(options_.beforeEachReply);
    writeLocked(frame(reply));
}

void FakeDiagModem::write(std::span<const std::uint8_t> bytes) {
    const std::lock_guard lock(mutex_);
    writeLocked(bytes);
}

void FakeDiagModem::writePacket(std::span<const std::uint8_t> packet) {
    write(frame(packet));
}

void FakeDiagModem::writeBadCrc(std::span<const std::uint8_t> packet) {
    Bytes framed = frame(packet);
    // The CRC's first byte (just before the flag); 0x7D and 0x7E are never written as is.
    std::uint8_t& crc = framed[framed.size() - 2];
    crc = crc == 0x01 ? 0x02 : 0x01;
    write(framed);
}

void FakeDiagModem::writeLocked(std::span<const std::uint8_t> bytes) {
    if (hungUp_) return;
    while (!bytes.empty()) {
        const ssize_t n = ::write(master_, bytes.data(), bytes.size());
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) return;
        written_.insert(written_.end(), bytes.begin(), bytes.begin() + n);
        bytes = bytes.subspan(static_cast<std::size_t>(n));
    }
}

Bytes FakeDiagModem::written() const {
    const std::lock_guard lock(mutex_);
    return written_;
}

std::vector<Bytes> FakeDiagModem::requests() const {
    const std::lock_guard lock(mutex_);
    return requests_;
}

std::map<std::uint32_t, FakeDiagModem::Mask> FakeDiagModem::masks() const {
    const std::lock_guard lock(mutex_);
    return masks_;
}

bool FakeDiagModem::waitForRequests(const std::function<bool(const std::vector<Bytes>&)>& seen,
                                    std::chrono::milliseconds timeout) const {
    std::unique_lock lock(mutex_);
    return changed_.wait_for(lock, timeout, [&] { return seen(requests_); });
}

bool FakeDiagModem::waitForRequest(std::span<const std::uint8_t> prefix,
                                   std::chrono::milliseconds timeout) const {
    return waitForRequests(
        [prefix](const std::vector<Bytes>& requests) {
            return std::any_of(requests.begin(), requests.end(), [prefix](const Bytes& r) {
                return r.size() >= prefix.size() &&
                       std::equal(prefix.begin(), prefix.end(), r.begin());
            });
        },
        timeout);
}

Bytes wcdmaCellIdPayload(std::uint32_t cellId) {
    Bytes payload;
    putU32(payload, 9712);                        // UL UARFCN
    putU32(payload, 10662);                       // DL UARFCN (band I)
    putU32(payload, cellId);                      // RNC id and C-id
    payload.insert(payload.end(), {0x01, 0x00});  // URA id
    payload.insert(payload.end(), {0x00, 0x00});  // flags, allowed call access
    const std::uint16_t psc = 301 << 4;
    payload.push_back(static_cast<std::uint8_t>(psc));
    payload.push_back(static_cast<std::uint8_t>(psc >> 8));
    payload.insert(payload.end(), {2, 6, 2, 0, 1, 0x0F});  // MCC 262, MNC 01
    putU32(payload, 0x1234);                               // LAC
    putU32(payload, 7);                                    // RAC
    return payload;
}

}  // namespace pyx::diag::test
