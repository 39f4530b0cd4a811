#include "gps/GpsdClient.h"

#include <gps.h>

#include <cerrno>
#include <cmath>
#include <cstring>
#include <memory>
#include <optional>

#include "core/Log.h"

namespace pyx::gps {
namespace {

std::optional<double> finite(double value) {
    return std::isfinite(value) ? std::optional(value) : std::nullopt;
}

std::int64_t wallNowNs() {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
               std::chrono::system_clock::now().time_since_epoch())
        .count();
}

// The connection, closed however the session ends.
struct Connection {
    gps_data_t data{};
    bool open = false;
    ~Connection() {
        if (open) {
            gps_stream(&data, WATCH_DISABLE, nullptr);
            gps_close(&data);
        }
    }
};

}  // namespace

GpsdClient::GpsdClient(Options options) : options_(std::move(options)) {
    thread_ = std::thread([this] { run(); });
}

GpsdClient::~GpsdClient() {
    {
        const std::lock_guard lock(mutex_);
        stop_ = true;
    }
    wake_.notify_all();
    thread_.join();
    if (const std::uint64_t skipped = malformed_.load(); skipped > 0)
        systemFault("gps: skipped " + std::to_string(skipped) + " reports from gpsd at " +
                    options_.address.text() +
                    " whose position was not one (latitude or longitude out of range)");
}

bool GpsdClient::pause() {
    std::unique_lock lock(mutex_);
    return !wake_.wait_for(lock, options_.retry, [this] { return stop_; });
}

void GpsdClient::run() {
    const std::string where = options_.address.text();
    const std::string retry = std::to_string((options_.retry.count() + 999) / 1000);
    bool saidUnreachable = false;
    bool everConnected = false;
    for (;;) {
        {
            const std::lock_guard lock(mutex_);
            if (stop_) return;
        }
        auto connection = std::make_unique<Connection>();
        if (gps_open(options_.address.host.c_str(), options_.address.port.c_str(),
                     &connection->data) != 0) {
            const int error = errno;
            state_ = GpsdState::Unreachable;
            if (!saidUnreachable)
                systemFault("gps: gpsd is not reachable at " + where + " (" +
                            (error > 0 ? std::strerror(error) : gps_errstr(error)) +
                            "); going on without positions, trying again every " + retry + " s");
            saidUnreachable = true;
            if (!pause()) return;
            continue;
        }
        connection->open = true;
        gps_stream(&connection->data, WATCH_ENABLE | WATCH_JSON, nullptr);
        state_ = GpsdState::NoFix;
        if (saidUnreachable || everConnected) systemFault("gps: connected to gpsd at " + where);
        saidUnreachable = false;
        everConnected = true;
        session(&connection->data);
        connection.reset();
        {
            const std::lock_guard lock(mutex_);
            if (stop_) return;
        }
        state_ = GpsdState::Unreachable;
        systemFault("gps: lost gpsd at " + where +
                    "; going on without positions, trying again every " + retry + " s");
        saidUnreachable = true;
        if (!pause()) return;
    }
}

void GpsdClient::session(void* opaque) {
    auto* const data = static_cast<gps_data_t*>(opaque);
    // The fix time last handed on: a report of another class (SKY) can leave the fix's flags
    // set, and must not hand the same fix on again.
    std::int64_t lastTimeNs = -1;
    for (;;) {
        {
            const std::lock_guard lock(mutex_);
            if (stop_) return;
        }
        // Half a second at most, so that a stop is seen soon.
        if (!gps_waiting(data, 500'000)) {
            if (errno != 0 && errno != EINTR && errno != EAGAIN) return;
            continue;
        }
        errno = 0;
        if (gps_read(data, nullptr, 0) < 0) return;  // gpsd went away
        if ((data->set & MODE_SET) == 0) continue;
        if (data->fix.mode < MODE_2D) {
            state_ = GpsdState::NoFix;
            continue;
        }
        if ((data->set & LATLON_SET) == 0) continue;
        const double lat = data->fix.latitude;
        const double lon = data->fix.longitude;
        if (!std::isfinite(lat) || !std::isfinite(lon) || std::abs(lat) > 90 ||
            std::abs(lon) > 180) {
            ++malformed_;
            continue;
        }
        // A fix without its time (gpsd has not yet seen the date) waits for the next one.
        if ((data->set & TIME_SET) == 0 || data->fix.time.tv_sec <= 0) continue;
        Fix fix;
        fix.receivedNs = wallNowNs();
        fix.timeNs = static_cast<std::int64_t>(data->fix.time.tv_sec) * 1'000'000'000 +
                     data->fix.time.tv_nsec;
        if (fix.timeNs == lastTimeNs) continue;
        lastTimeNs = fix.timeNs;
        fix.mode = data->fix.mode >= MODE_3D ? FixMode::ThreeD : FixMode::TwoD;
        fix.lat = lat;
        fix.lon = lon;
        if (fix.mode == FixMode::ThreeD) fix.altM = finite(data->fix.altMSL);
        fix.speedMps = finite(data->fix.speed);
        fix.trackDeg = finite(data->fix.track);
        fix.horizontalErrorM = finite(data->fix.eph);
        state_ = GpsdState::Fix;
        ++fixes_;
        if (options_.onFix) options_.onFix(fix);
    }
}

}  // namespace pyx::gps
