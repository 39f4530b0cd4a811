// A client of gpsd: positions for a drive, from whichever receiver gpsd serves (a USB puck, the
// modem's own NMEA port). It speaks gpsd's protocol through gpsd's own library (libgps: ?WATCH
// with JSON, TPV reports) on a thread of its own, so that the program never waits on gpsd.
//
// gpsd absent, stopped or restarted: one line says so, the client tries again every retry
// interval, and the program goes on without positions meanwhile; one line says when positions
// come again. Reports without a 2D or 3D fix, or with a position that is not one (latitude
// beyond ±90°, not a number), are skipped; the latter are counted as malformed and said in one
// line when the client stops.
#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

#include "gps/Fix.h"
#include "gps/GpsdAddress.h"

namespace pyx::gps {

// What the client knows of gpsd, for a status line.
enum class GpsdState : std::uint8_t {
    Connecting,   // not yet tried
    Unreachable,  // gpsd not running there, or gone; retrying
    NoFix,        // connected, no position yet (or the receiver lost it)
    Fix,          // the latest report had a 2D or 3D fix
};

class GpsdClient {
  public:
    struct Options {
        GpsdAddress address;
        std::chrono::milliseconds retry{3000};
        // Called on the client's thread with each fix; keep it short (post it on).
        std::function<void(const Fix&)> onFix;
    };

    // Starts the thread at once.
    explicit GpsdClient(Options options);
    // Stops the thread (within about half a second) and closes the connection.
    ~GpsdClient();
    GpsdClient(const GpsdClient&) = delete;
    GpsdClient& operator=(const GpsdClient&) = delete;

    [[nodiscard]] GpsdState state() const { return state_.load(); }
    [[nodiscard]] std::uint64_t fixes() const { return fixes_.load(); }
    [[nodiscard]] std::uint64_t malformed() const { return malformed_.load(); }
    [[nodiscard]] const GpsdAddress& address() const { return options_.address; }

  private:
    void run();
    // Reads reports until told to stop or the connection breaks.
    void session(void* data);
    // Waits for the retry interval unless told to stop; whether to go on.
    bool pause();

    const Options options_;
    std::atomic<GpsdState> state_{GpsdState::Connecting};
    std::atomic<std::uint64_t> fixes_{0};
    std::atomic<std::uint64_t> malformed_{0};
    std::mutex mutex_;
    std::condition_variable wake_;
    bool stop_ = false;
    std::thread thread_;
};

}  // namespace pyx::gps
