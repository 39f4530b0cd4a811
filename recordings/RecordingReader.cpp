#include "recordings/RecordingReader.h"

#include <sqlite3.h>

#include <filesystem>
#include <utility>

#include "core/Format.h"
#include "recordings/RecordCodec.h"
#include "recordings/RecordingError.h"
#include "recordings/RecordingFormat.h"
#include "recordings/SqliteDatabase.h"
#include "recordings/SqliteStatement.h"

namespace pyx::recordings {
namespace {

bool isDamage(const SqliteError& error) {
    const int code = error.primaryCode();
    return code == SQLITE_CORRUPT || code == SQLITE_NOTADB || code == SQLITE_IOERR ||
           code == SQLITE_FORMAT || code == SQLITE_RANGE;
}

}  // namespace

RecordingReader::RecordingReader(std::string path) : path_(std::move(path)) {
    using Kind = RecordingError::Kind;
    std::error_code error;
    const auto status = std::filesystem::status(path_, error);
    if (!std::filesystem::exists(status))
        throw RecordingError(Kind::Missing, path_, "no such file");
    if (std::filesystem::is_directory(status))
        throw RecordingError(Kind::NotAFile, path_, "is a directory, not a recording");
    if (!std::filesystem::is_regular_file(status))
        throw RecordingError(Kind::NotAFile, path_, "is not a regular file");
    if (std::filesystem::file_size(path_, error) == 0)
        throw RecordingError(Kind::NotARecording, path_,
                             "not a Pyxon recording (the file is empty)");
    try {
        db_ = std::make_unique<SqliteDatabase>(path_, SqliteDatabase::Mode::ReadOnly);
        // A truncated file is shorter than its header says; SQLite refuses it outright unless
        // told to go on, and this connection only reads, so the readable part is handed out.
        db_->execute("PRAGMA writable_schema=ON");
        const long long application = db_->queryInteger("PRAGMA application_id");
        if (application != kApplicationID)
            throw RecordingError(Kind::NotARecording, path_,
                                 "not a Pyxon recording (an SQLite database of something else)");
        formatVersion_ = static_cast<std::int32_t>(db_->queryInteger("PRAGMA user_version"));
    } catch (const SqliteError& e) {
        if (e.primaryCode() == SQLITE_NOTADB)
            throw RecordingError(Kind::NotARecording, path_,
                                 "not a Pyxon recording (not an SQLite database)");
        if (e.primaryCode() == SQLITE_CANTOPEN || e.primaryCode() == SQLITE_PERM)
            throw RecordingError(Kind::Unwritable, path_,
                                 std::string("cannot be read: ") + e.what());
        throw RecordingError(Kind::Damaged, path_, std::string("damaged: ") + e.what());
    }
    if (formatVersion_ > kFormatVersion)
        throw RecordingError(Kind::NewerFormat, path_,
                             format("written in format version %d by a newer Pyxon; this one "
                                    "reads up to version %d",
                                    formatVersion_, kFormatVersion));
    if (formatVersion_ < 1)
        throw RecordingError(Kind::NotARecording, path_,
                             format("not a Pyxon recording (format version %d)", formatVersion_));
}

RecordingReader::~RecordingReader() = default;
RecordingReader::RecordingReader(RecordingReader&&) noexcept = default;
RecordingReader& RecordingReader::operator=(RecordingReader&&) noexcept = default;

RecordingReader::Summary RecordingReader::summary() const {
    Summary summary;
    summary.formatVersion = formatVersion_;
    try {
        SqliteStatement totals =
            db_->prepare("SELECT count(*), min(wall_ns), max(wall_ns) FROM events");
        if (totals.step()) {
            summary.events = static_cast<std::uint64_t>(totals.integer(0));
            if (!totals.isNull(1)) summary.firstNs = totals.integer(1);
            if (!totals.isNull(2)) summary.lastNs = totals.integer(2);
        }
        SqliteStatement kinds = db_->prepare(
            "SELECT metric_id, count(*) FROM events WHERE metric_id IS NOT NULL "
            "GROUP BY metric_id ORDER BY metric_id");
        while (kinds.step())
            summary.kinds[kinds.integer(0)] = static_cast<std::uint64_t>(kinds.integer(1));
        SqliteStatement sessions = db_->prepare(
            "SELECT id, start_ns, program_version, source, seed, speed, host FROM sessions "
            "ORDER BY id");
        while (sessions.step()) {
            RecordingSession session;
            session.id = sessions.integer(0);
            session.startNs = sessions.integer(1);
            session.programVersion = sessions.text(2);
            session.source = sessions.text(3);
            if (!sessions.isNull(4)) session.seed = sessions.integer(4);
            if (!sessions.isNull(5)) session.speed = sessions.real(5);
            session.host = sessions.text(6);
            summary.sessions.push_back(std::move(session));
        }
        if (hasPositions()) {
            SqliteStatement box = db_->prepare(
                "SELECT count(*), min(time_ns), max(time_ns), min(lat), min(lon), max(lat), "
                "max(lon) FROM positions");
            if (box.step() && box.integer(0) > 0)
                summary.positions = Summary::Positions{static_cast<std::uint64_t>(box.integer(0)),
                                                       box.integer(1),
                                                       box.integer(2),
                                                       box.real(3),
                                                       box.real(4),
                                                       box.real(5),
                                                       box.real(6)};
        }
    } catch (const SqliteError& e) {
        throw RecordingError(RecordingError::Kind::Damaged, path_,
                             std::string("damaged: ") + e.what());
    }
    return summary;
}

bool RecordingReader::hasPositions() const {
    return db_->queryInteger(
               "SELECT count(*) FROM sqlite_master WHERE type='table' AND name='positions'") > 0;
}

std::uint64_t RecordingReader::forEachPosition(
    const std::function<bool(const gps::Fix& fix)>& visit) const {
    std::uint64_t handed = 0;
    try {
        if (!hasPositions()) return 0;
        SqliteStatement rows = db_->prepare(
            "SELECT time_ns, received_ns, mode, lat, lon, alt_m, speed_mps, track_deg, "
            "horizontal_error_m FROM positions ORDER BY received_ns, id");
        const auto optional = [&rows](int column) {
            return rows.isNull(column) ? std::nullopt : std::optional(rows.real(column));
        };
        while (rows.step()) {
            gps::Fix fix;
            fix.timeNs = rows.integer(0);
            fix.receivedNs = rows.integer(1);
            const std::int64_t mode = rows.integer(2);
            fix.mode =
                mode >= 0 && mode <= 3 ? static_cast<gps::FixMode>(mode) : gps::FixMode::Unknown;
            fix.lat = rows.real(3);
            fix.lon = rows.real(4);
            fix.altM = optional(5);
            fix.speedMps = optional(6);
            fix.trackDeg = optional(7);
            fix.horizontalErrorM = optional(8);
            ++handed;
            if (!visit(fix)) break;
        }
    } catch (const SqliteError& e) {
        throw RecordingError(RecordingError::Kind::Damaged, path_,
                             format("damaged after %llu positions: %s",
                                    static_cast<unsigned long long>(handed), e.what()));
    }
    return handed;
}

std::uint64_t RecordingReader::forEach(
    const Filter& filter, const std::function<bool(RecordedEvent& event)>& visit) const {
    std::string sql =
        "SELECT id, session, stream, wall_ns, mono_ns, metric_id, payload, record FROM events "
        "WHERE id > ?";
    if (filter.fromNs) sql += " AND wall_ns >= " + std::to_string(*filter.fromNs);
    if (filter.toNs) sql += " AND wall_ns <= " + std::to_string(*filter.toNs);
    if (filter.stream) sql += " AND stream = ?2";
    if (!filter.metricIDs.empty()) {
        sql += " AND metric_id IN (";
        for (std::size_t i = 0; i < filter.metricIDs.size(); ++i)
            sql += (i ? "," : "") + std::to_string(filter.metricIDs[i]);
        sql += ")";
    }
    sql += " ORDER BY id";

    std::uint64_t handed = 0;
    std::int64_t lastID = filter.afterID;
    RecordedEvent event;
    try {
        SqliteStatement rows = db_->prepare(sql);
        rows.bind(1, lastID);
        if (filter.stream) rows.bind(2, std::string_view(*filter.stream));
        while (rows.step()) {
            event.id = rows.integer(0);
            event.session = rows.integer(1);
            event.stream = rows.text(2);
            event.wallNs = rows.integer(3);
            event.monoNs = rows.integer(4);
            const std::optional<std::int64_t> metricID =
                rows.isNull(5) ? std::nullopt : std::optional(rows.integer(5));
            const std::optional<std::span<const std::uint8_t>> payload =
                rows.isNull(6) ? std::nullopt : std::optional(rows.blob(6));
            event.object = decodeRecord(rows.blob(7), metricID, payload);
            lastID = event.id;
            ++handed;
            if (!visit(event)) break;
        }
    } catch (const SqliteError& e) {
        if (!isDamage(e))
            throw RecordingError(RecordingError::Kind::Damaged, path_, e.what(), handed);
        throw RecordingError(
            RecordingError::Kind::Damaged, path_,
            format("damaged after event %lld (%s)", static_cast<long long>(lastID), e.what()),
            handed);
    } catch (const RecordCodecError& e) {
        throw RecordingError(
            RecordingError::Kind::Damaged, path_,
            format("damaged at event %lld (%s)", static_cast<long long>(lastID) + 1, e.what()),
            handed);
    }
    return handed;
}

}  // namespace pyx::recordings
