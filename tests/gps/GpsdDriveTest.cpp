// A drive as a user records one: a real gpsd (gpsfake plays an NMEA log the test writes into
// it, on a free local port), `pyxonctl listen --gps --record`, then info and every export
// format, the map exports opened with GDAL's ogrinfo as QGIS would open them. And gpsd absent,
// started late and gone: one line each, the run goes on.
#include <gtest/gtest.h>

#include <netinet/in.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cmath>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <future>
#include <iterator>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "tests/support/ProgramRun.h"

namespace {

using Json = nlohmann::json;
using pyx::test::ProgramRun;
namespace fs = std::filesystem;

struct Point {
    double lat;
    double lon;
};

class TempDir {
  public:
    TempDir() {
        std::string pattern = (fs::temp_directory_path() / "pyxon-gps-XXXXXX").string();
        path_ = ::mkdtemp(pattern.data());
    }
    ~TempDir() {
        std::error_code ignored;
        fs::remove_all(path_, ignored);
    }
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;
    [[nodiscard]] std::string file(const std::string& name) const { return path_ / name; }

  private:
    fs::path path_;
};

int freePort() {
    const int s = ::socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    address.sin_port = 0;
    ::bind(s, reinterpret_cast<sockaddr*>(&address), sizeof address);
    socklen_t size = sizeof address;
    ::getsockname(s, reinterpret_cast<sockaddr*>(&address), &size);
    ::close(s);
    return ntohs(address.sin_port);
}

std::string checksummed(const std::string& body) {
    unsigned sum = 0;
    for (const char c : body) sum ^= static_cast<unsigned char>(c);
    char tail[8];
    std::snprintf(tail, sizeof tail, "*%02X\r\n", sum);
    return "$" + body + tail;
}

// Degrees as NMEA writes them: DDMM.MMMM (DDDMM.MMMM for longitude) and the hemisphere.
std::string nmeaAngle(double value, bool latitude) {
    const double a = std::abs(value);
    const int d = static_cast<int>(a);
    char text[32];
    std::snprintf(text, sizeof text, latitude ? "%02d%07.4f,%c" : "%03d%07.4f,%c", d, (a - d) * 60,
                  latitude ? (value >= 0 ? 'N' : 'S') : (value >= 0 ? 'E' : 'W'));
    return text;
}

// A straight drive north-east through Paris, one fix a second from 12:00:00 on 2026-11-24: an
// RMC (position, speed, course, date) and a GGA (altitude) each. Returns the points as NMEA
// carries them (to a ten-thousandth of a minute).
std::vector<Point> writeTrack(const std::string& path, int fixes) {
    std::ofstream out(path, std::ios::binary);
    std::vector<Point> points;
    for (int i = 0; i < fixes; ++i) {
        const double lat = 48.8566 + i * 0.0001;
        const double lon = 2.3522 + i * 0.00015;
        char time[16];
        std::snprintf(time, sizeof time, "12%02d%02d.00", i / 60, i % 60);
        out << checksummed("GPRMC," + std::string(time) + ",A," + nmeaAngle(lat, true) + "," +
                           nmeaAngle(lon, false) + ",010.0,045.0,241126,,,A");
        out << checksummed("GPGGA," + std::string(time) + "," + nmeaAngle(lat, true) + "," +
                           nmeaAngle(lon, false) + ",1,08,0.9,35.0,M,47.0,M,,");
        points.push_back({std::round(lat * 600000) / 600000, std::round(lon * 600000) / 600000});
    }
    return points;
}

// gpsfake, playing log once into a gpsd of its own on port; stopped with its gpsd at the end.
class Gpsfake {
  public:
    Gpsfake(const std::string& log, int port, double cycle) {
        pid_ = ::fork();
        if (pid_ == 0) {
            ::setpgid(0, 0);
            // gpsfake starts gpsd, which Debian keeps in /usr/sbin.
            ::setenv("PATH", "/usr/sbin:/usr/bin:/sbin:/bin", 1);
            const std::string portText = std::to_string(port);
            const std::string cycleText = std::to_string(cycle);
            ::execl("/usr/bin/gpsfake", "gpsfake", "-1", "-q", "-P", portText.c_str(), "-c",
                    cycleText.c_str(), log.c_str(), static_cast<char*>(nullptr));
            ::_exit(127);
        }
    }
    ~Gpsfake() { stop(); }
    Gpsfake(const Gpsfake&) = delete;
    Gpsfake& operator=(const Gpsfake&) = delete;

    // Stops gpsfake and its gpsd (gpsfake stays after its log has been played).
    void stop() {
        if (pid_ <= 0) return;
        ::kill(-pid_, SIGTERM);
        ::waitpid(pid_, nullptr, 0);
        pid_ = -1;
    }

  private:
    pid_t pid_ = -1;
};

std::string slurp(const std::string& path) {
    std::ifstream in(path);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

ProgramRun pyxonctl(const std::string& arguments) {
    return ProgramRun::shell(std::string("'") + PYXONCTL_PATH + "' " + arguments);
}

// The "Feature Count" ogrinfo gives for the (only) layer of file.
long featureCount(const std::string& file) {
    const ProgramRun run = ProgramRun::shell("ogrinfo -ro -al -so '" + file + "'");
    EXPECT_EQ(run.exitCode, 0) << run.err;
    const auto at = run.out.find("Feature Count: ");
    if (at == std::string::npos) {
        ADD_FAILURE() << "ogrinfo named no feature count:\n" << run.out << run.err;
        return -1;
    }
    return std::stol(run.out.substr(at + 15));
}

// A number of a JSON document; a failure naming the document otherwise.
double number(const Json& value, const Json& within) {
    if (value.is_number()) return value.get<double>();
    ADD_FAILURE() << "not a number: " << value.dump() << " in " << within.dump();
    return std::nan("");
}

bool onTrack(const std::vector<Point>& track, double lat, double lon) {
    for (const Point& p : track)
        if (std::abs(p.lat - lat) < 1e-6 && std::abs(p.lon - lon) < 1e-6) return true;
    return false;
}

void needTools() {
    ASSERT_TRUE(fs::exists("/usr/bin/gpsfake")) << "gpsfake is missing (Debian gpsd-clients; "
                                                   "scripts/dev test installs it)";
    ASSERT_TRUE(fs::exists("/usr/bin/ogrinfo")) << "ogrinfo is missing (Debian gdal-bin; "
                                                   "scripts/dev test installs it)";
}

TEST(GpsdDrive, ARecordedDriveExportsItsEventsOnTheDrivenTrackWithTheirRsrp) {
    needTools();
    const TempDir dir;
    const std::vector<Point> track = writeTrack(dir.file("track.nmea"), 60);
    const int port = freePort();
    Gpsfake gpsfake(dir.file("track.nmea"), port, 0.1);
    const std::string recording = dir.file("d.pyxrec");
    const ProgramRun listen =
        pyxonctl("listen --gps 127.0.0.1:" + std::to_string(port) +
                 " --speed 5 --duration 10 --record '" + recording + "' > /dev/null");
    EXPECT_EQ(listen.exitCode, 0) << listen.err;
    gpsfake.stop();

    const ProgramRun info = pyxonctl("info '" + recording + "'");
    ASSERT_EQ(info.exitCode, 0) << info.err;
    const Json summary = Json::parse(info.out);
    ASSERT_TRUE(summary["positions"].is_object()) << info.out;
    const double fixes = number(summary["positions"]["fixes"], summary);
    EXPECT_GE(fixes, 4) << info.out;
    EXPECT_EQ(summary["format_version"], 2);
    const Json box = summary["positions"]["box"];
    EXPECT_GE(number(box["south"], box), track.front().lat - 1e-6);
    EXPECT_LE(number(box["north"], box), track.back().lat + 1e-6);
    EXPECT_GE(number(box["west"], box), track.front().lon - 1e-6);
    EXPECT_LE(number(box["east"], box), track.back().lon + 1e-6);
    EXPECT_EQ(summary["positions"]["first"].get<std::string>().substr(0, 14), "2026-11-24T12:");

    // GeoJSON: points on the track, RSRP on those of the RSRP/RSRQ/SINR kind.
    const std::string geojson = dir.file("d.geojson");
    const ProgramRun exported =
        pyxonctl("export '" + recording + "' --format geojson > '" + geojson + "'");
    EXPECT_EQ(exported.exitCode, 0) << exported.err;
    const Json collection = Json::parse(slurp(geojson));
    EXPECT_EQ(collection["type"], "FeatureCollection");
    const Json& features = collection["features"];
    ASSERT_GE(features.size(), 10u);
    std::size_t withRsrp = 0;
    for (const Json& feature : features) {
        const Json& coordinates = feature["geometry"]["coordinates"];
        // Altitude where gpsd had a 3D fix (a first fix from an RMC alone is 2D).
        ASSERT_GE(coordinates.size(), 2u) << feature.dump();
        ASSERT_LE(coordinates.size(), 3u) << feature.dump();
        ASSERT_TRUE(
            onTrack(track, number(coordinates[1], feature), number(coordinates[0], feature)))
            << feature.dump();
        if (coordinates.size() == 3) {
            EXPECT_DOUBLE_EQ(number(coordinates[2], feature), 35.0);
        }
        if (feature["properties"]["metric"] == "0x3C4F6A") {
            ++withRsrp;
            const double rsrp = number(feature["properties"]["inst_values.0.rsrp0"], feature);
            EXPECT_LT(rsrp, -40);
            EXPECT_GT(rsrp, -141);
            EXPECT_EQ(feature["properties"]["serving_quantity"], "RSRP");
        }
    }
    EXPECT_GT(withRsrp, 0u);
    EXPECT_EQ(featureCount(geojson), static_cast<long>(features.size()));

    // KML: the same points, plus the track as one line.
    const std::string kml = dir.file("d.kml");
    EXPECT_EQ(pyxonctl("export '" + recording + "' --format kml > '" + kml + "'").exitCode, 0);
    EXPECT_EQ(featureCount(kml), static_cast<long>(features.size()) + 1);
    const std::string kmlText = slurp(kml);
    EXPECT_NE(kmlText.find("<LineString>"), std::string::npos);
    EXPECT_NE(kmlText.find("<styleUrl>#level"), std::string::npos);

    // csv and jsonl: the position columns and keys.
    const ProgramRun csv = pyxonctl("export '" + recording + "' --format csv");
    EXPECT_EQ(csv.exitCode, 0) << csv.err;
    const std::string header = csv.out.substr(0, csv.out.find("\r\n"));
    EXPECT_TRUE(
        header.ends_with(",gps_lat,gps_lon,gps_alt_m,gps_speed_mps,gps_track_deg,gps_fix,"
                         "gps_horizontal_error_m"))
        << header;
    const ProgramRun jsonl = pyxonctl("export '" + recording + "' --format jsonl");
    EXPECT_EQ(jsonl.exitCode, 0) << jsonl.err;
    std::istringstream lines(jsonl.out);
    std::size_t placed = 0;
    for (std::string line; std::getline(lines, line);) {
        const Json event = Json::parse(line);
        ASSERT_TRUE(event.contains("gps")) << line;
        if (event["gps"].is_null()) continue;
        ++placed;
        EXPECT_TRUE(
            onTrack(track, number(event["gps"]["lat"], event), number(event["gps"]["lon"], event)))
            << line;
        EXPECT_TRUE(event["gps"]["fix"] == "3D" || event["gps"]["fix"] == "2D") << line;
    }
    // Every placed event the store keeps is a feature; jsonl also places the kinds it ignores.
    EXPECT_GE(placed, features.size());
}

TEST(GpsdDrive, WithoutGpsdOneLineSaysSoAndTheRunGoesOn) {
    const int port = freePort();
    const ProgramRun run =
        pyxonctl("listen --gps 127.0.0.1:" + std::to_string(port) + " --speed 50 --count 5");
    EXPECT_EQ(run.exitCode, 0);
    EXPECT_EQ(std::count(run.out.begin(), run.out.end(), '\n'), 5);
    const std::string start = "gps: gpsd is not reachable at 127.0.0.1:" + std::to_string(port);
    EXPECT_TRUE(run.err.starts_with(start)) << run.err;
    EXPECT_TRUE(run.err.ends_with("; going on without positions, trying again every 3 s\n"))
        << run.err;
    EXPECT_EQ(std::count(run.err.begin(), run.err.end(), '\n'), 1) << run.err;
}

TEST(GpsdDrive, GpsdStartedLateThenGoneIsSaidAndItsFixesAreKept) {
    needTools();
    const TempDir dir;
    writeTrack(dir.file("track.nmea"), 30);
    const int port = freePort();
    const std::string where = "127.0.0.1:" + std::to_string(port);
    const std::string recording = dir.file("d.pyxrec");
    const std::string err = dir.file("err.txt");
    auto listen = std::async(std::launch::async, [&] {
        return pyxonctl("listen --gps " + where + " --speed 5 --duration 25 --record '" +
                        recording + "' > /dev/null 2> '" + err + "'");
    });
    // gpsd is not there yet: the run says so and goes on.
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(15);
    while (slurp(err).find("gps: gpsd is not reachable at " + where) == std::string::npos &&
           std::chrono::steady_clock::now() < deadline)
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    ASSERT_NE(slurp(err).find("gps: gpsd is not reachable at " + where), std::string::npos);
    {
        // gpsd comes: fixes are recorded (read while the recording goes on) ...
        Gpsfake gpsfake(dir.file("track.nmea"), port, 0.1);
        const auto recorded = std::chrono::steady_clock::now() + std::chrono::seconds(15);
        int fixes = 0;
        while (fixes < 3 && std::chrono::steady_clock::now() < recorded) {
            std::this_thread::sleep_for(std::chrono::milliseconds(250));
            const ProgramRun info = pyxonctl("info '" + recording + "'");
            if (info.exitCode != 0) continue;
            const Json summary = Json::parse(info.out);
            if (summary["positions"].is_object())
                fixes = static_cast<int>(number(summary["positions"]["fixes"], summary));
        }
        EXPECT_GE(fixes, 3);
        // ... and goes away again.
    }
    EXPECT_EQ(listen.get().exitCode, 0);
    const std::string said = slurp(err);
    const auto connected = said.find("gps: connected to gpsd at " + where + "\n");
    const auto lost = said.find("gps: lost gpsd at " + where +
                                "; going on without positions, trying again every 3 s\n");
    ASSERT_NE(connected, std::string::npos) << said;
    ASSERT_NE(lost, std::string::npos) << said;
    EXPECT_LT(connected, lost) << said;
    const Json summary = Json::parse(pyxonctl("info '" + recording + "'").out);
    ASSERT_TRUE(summary["positions"].is_object());
    EXPECT_GE(number(summary["positions"]["fixes"], summary), 3);
}

}  // namespace
