// A modem's DIAG port for tests: the master side of a pseudo-terminal, whose slave
// (/dev/pts/N) the code under test opens like a /dev/ttyUSB0. A thread reads the requests,
// deframes them and answers the start-up commands as a Qualcomm modem does (version, build id,
// log ranges, SET_MASK echoes with a status, event report control, logging off), recording
// every request and the masks it was given. The test streams packets through it (written with
// the stream's own writers and framed) and can make it misbehave: answer nothing, push frames
// between a request and its reply, send frames with a bad CRC, refuse masks, hang up.
#pragma once

#include <array>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <map>
#include <mutex>
#include <set>
#include <span>
#include <string>
#include <thread>
#include <vector>

#include "core/Value.h"

namespace pyx::diag::test {

class FakeDiagModem {
  public:
    struct Options {
        // Item counts per equipment id (LOG_CONFIG op 1): an sdx55 firmware's.
        std::array<std::uint32_t, 16> ranges = {0, 4095, 0,   0,   4087, 4087, 28, 2910,
                                                0, 2070, 914, 521, 0,    519,  0,  0};
        bool answers = true;  // false: reads every request and answers none
        // Requests with these command bytes are read and not answered.
        std::set<std::uint8_t> unanswered;
        // SET_MASK for these equipment ids is answered with status 1.
        std::set<std::uint32_t> refuseMasks;
        // SET_MASK for these is answered with a bad-parameter error reply (0x14).
        std::set<std::uint32_t> badParameterMasks;
        // Written before each reply: frames the modem pushes unasked (log packets, stray
        // replies, frames with a bad CRC).
        Bytes beforeEachReply;
        std::string chipset = "sdx55.cp";
        std::string buildId = "RM500QGLABR11A06M4G";
    };

    explicit FakeDiagModem(Options options);
    FakeDiagModem() : FakeDiagModem(Options{}) {}
    ~FakeDiagModem();
    FakeDiagModem(const FakeDiagModem&) = delete;
    FakeDiagModem& operator=(const FakeDiagModem&) = delete;

    // The device the code under test opens.
    [[nodiscard]] const std::string& path() const { return path_; }

    // Writes bytes as they are (frames, or pieces of one).
    void write(std::span<const std::uint8_t> bytes);
    // Writes packet as one frame.
    void writePacket(std::span<const std::uint8_t> packet);
    // Writes packet as a frame whose CRC does not hold.
    void writeBadCrc(std::span<const std::uint8_t> packet);
    // Closes the master side: the slave hangs up, as a USB port that is unplugged.
    void hangUp();

    // Everything written to the port so far.
    [[nodiscard]] Bytes written() const;
    // The requests read so far (packets, unframed), in order.
    [[nodiscard]] std::vector<Bytes> requests() const;
    // The last SET_MASK per equipment id: its item count and mask.
    struct Mask {
        std::uint32_t items = 0;
        Bytes bits;
    };
    [[nodiscard]] std::map<std::uint32_t, Mask> masks() const;

    // Waits until seen(requests) holds or timeout passes; whether it held.
    bool waitForRequests(const std::function<bool(const std::vector<Bytes>&)>& seen,
                         std::chrono::milliseconds timeout = std::chrono::seconds(5)) const;
    // Waits for a request that starts with prefix.
    bool waitForRequest(std::span<const std::uint8_t> prefix,
                        std::chrono::milliseconds timeout = std::chrono::seconds(5)) const;

  private:
    void serve();
    void answer(const Bytes& request);
    void writeLocked(std::span<const std::uint8_t> bytes);

    const Options options_;
    int master_ = -1;
    int slave_ = -1;  // kept open so that the port exists before the code under test opens it
    int wakeRead_ = -1;
    int wakeWrite_ = -1;
    std::string path_;

    mutable std::mutex mutex_;
    mutable std::condition_variable changed_;
    Bytes written_;
    std::vector<Bytes> requests_;
    std::map<std::uint32_t, Mask> masks_;
    bool hungUp_ = false;
    std::thread thread_;
};

// A 0x4127 WCDMA cell id log packet's payload (32 bytes) the decoders write a cell from.
[[nodiscard]] Bytes wcdmaCellIdPayload(std::uint32_t cellId);

}  // namespace pyx::diag::test
