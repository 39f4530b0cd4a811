#include "sources/diag/port/DiagPort.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>

namespace pyx::diag {

namespace {

using Clock = std::chrono::steady_clock;

int openPort(const std::string& path) {
    // Non-blocking: a tty without CLOCAL would otherwise wait in open() for a carrier.
    const int fd = ::open(path.c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC | O_NONBLOCK);
    if (fd < 0) throw PortError::fromErrno(path, errno, "open");
    return fd;
}

int millisecondsLeft(Clock::time_point deadline) {
    const auto left =
        std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
    return left.count() > 0 ? static_cast<int>(left.count()) : 0;
}

}  // namespace

DiagPort::DiagPort(std::string path) : path_(std::move(path)), fd_(openPort(path_)) {
    termios settings{};
    if (::tcgetattr(fd_.get(), &settings) != 0) return;  // a character device, not a tty
    tty_ = true;
    // The baud rate means nothing on a USB serial port; 115200 8N1 is what modems expect.
    ::cfmakeraw(&settings);
    settings.c_cflag |= CLOCAL | CREAD;
    settings.c_cflag &= ~static_cast<tcflag_t>(CRTSCTS);
    settings.c_cc[VMIN] = 0;
    settings.c_cc[VTIME] = 0;
    ::cfsetispeed(&settings, B115200);
    ::cfsetospeed(&settings, B115200);
    if (::tcsetattr(fd_.get(), TCSANOW, &settings) != 0)
        throw PortError::fromErrno(path_, errno, "set up");
    ::tcflush(fd_.get(), TCIOFLUSH);
    ::ioctl(fd_.get(), TIOCEXCL);
}

std::size_t DiagPort::read(std::span<std::uint8_t> into, std::chrono::milliseconds timeout,
                           int wakeFd) {
    const auto deadline = Clock::now() + timeout;
    for (;;) {
        pollfd fds[2] = {{fd_.get(), POLLIN, 0}, {wakeFd, POLLIN, 0}};
        const int ready = ::poll(fds, wakeFd >= 0 ? 2 : 1, millisecondsLeft(deadline));
        if (ready < 0) {
            if (errno == EINTR) continue;
            throw PortError::fromErrno(path_, errno, "wait on");
        }
        if (ready == 0) return 0;
        if (wakeFd >= 0 && (fds[1].revents & POLLIN) != 0 && (fds[0].revents & POLLIN) == 0)
            return 0;
        if ((fds[0].revents & (POLLIN | POLLHUP | POLLERR | POLLNVAL)) == 0) continue;
        const ssize_t n = ::read(fd_.get(), into.data(), into.size());
        if (n > 0) return static_cast<std::size_t>(n);
        if (n == 0) throw PortError::hungUp(path_);  // the end of a device: it went away
        if (errno == EAGAIN || errno == EINTR) {
            if ((fds[0].revents & (POLLHUP | POLLERR)) != 0) throw PortError::hungUp(path_);
            continue;
        }
        throw PortError::fromErrno(path_, errno, "read");
    }
}

void DiagPort::write(std::span<const std::uint8_t> bytes, std::chrono::milliseconds timeout) {
    const auto deadline = Clock::now() + timeout;
    while (!bytes.empty()) {
        const ssize_t n = ::write(fd_.get(), bytes.data(), bytes.size());
        if (n > 0) {
            bytes = bytes.subspan(static_cast<std::size_t>(n));
            continue;
        }
        if (n < 0 && errno == EINTR) continue;
        if (n < 0 && errno != EAGAIN) throw PortError::fromErrno(path_, errno, "write to");
        pollfd p{fd_.get(), POLLOUT, 0};
        const int ready = ::poll(&p, 1, millisecondsLeft(deadline));
        if (ready == 0)
            throw PortError(PortError::Kind::Other, path_,
                            "DIAG port " + path_ + " takes no more bytes (a write timed out)");
        if ((p.revents & (POLLHUP | POLLERR | POLLNVAL)) != 0) throw PortError::hungUp(path_);
    }
}

}  // namespace pyx::diag
