#include "recordings/RecordingWriter.h"

#include <sqlite3.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/statvfs.h>

#include <algorithm>
#include <cerrno>
#include <condition_variable>
#include <cstring>
#include <deque>
#include <filesystem>
#include <mutex>
#include <optional>
#include <thread>
#include <utility>

#include "core/Format.h"
#include "core/Log.h"
#include "recordings/RecordCodec.h"
#include "recordings/RecordingError.h"
#include "recordings/RecordingFormat.h"
#include "recordings/RecordingReader.h"
#include "recordings/SqliteDatabase.h"
#include "recordings/SqliteStatement.h"

namespace pyx::recordings {
namespace {

using Clock = std::chrono::steady_clock;

std::int64_t wallNow() {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
               std::chrono::system_clock::now().time_since_epoch())
        .count();
}

std::int64_t monoNow() {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(Clock::now().time_since_epoch())
        .count();
}

// An event, or a GPS fix (fix set, the rest empty): both keep their order on one queue.
struct Pending {
    std::string stream;
    std::int64_t wallNs;
    std::int64_t monoNs;
    Value object;
    std::optional<gps::Fix> fix;
};

// What a failed write means to the user, in a few words. SQLite reports a failed write as an
// I/O error without saying why, so the usual causes are looked at: the process's file-size
// limit and the free space of the folder.
std::string whyWriteFailed(const SqliteError& error, const std::string& path) {
    switch (error.primaryCode()) {
        case SQLITE_FULL:
            return "the disk is full";
        case SQLITE_READONLY:
            return "the file or its folder is read-only";
        case SQLITE_CANTOPEN:
            return "the file or its folder cannot be written";
        case SQLITE_IOERR:
            break;
        default:
            return error.what();
    }
    rlimit limit{};
    if (::getrlimit(RLIMIT_FSIZE, &limit) == 0 && limit.rlim_cur != RLIM_INFINITY) {
        std::error_code ignored;
        const std::uintmax_t size = std::max(std::filesystem::file_size(path, ignored),
                                             std::filesystem::file_size(path + "-wal", ignored));
        if (size != static_cast<std::uintmax_t>(-1) && size + 65536 >= limit.rlim_cur)
            return "the file reached the size limit";
    }
    const std::string folder = std::filesystem::path(path).parent_path().empty()
                                   ? std::string(".")
                                   : std::filesystem::path(path).parent_path().string();
    struct statvfs space {};
    if (::statvfs(folder.c_str(), &space) == 0 &&
        static_cast<std::uintmax_t>(space.f_bavail) * space.f_frsize < std::uintmax_t{1024} * 1024)
        return "the disk is full";
    if (error.systemErrno() == EROFS || error.systemErrno() == EACCES)
        return "the file or its folder is read-only";
    return std::string("writing failed: ") + error.what();
}

struct FileIdentity {
    dev_t device = 0;
    ino_t inode = 0;
};

std::optional<FileIdentity> identityOf(const std::string& path) {
    struct stat info {};
    if (::stat(path.c_str(), &info) != 0) return std::nullopt;
    return FileIdentity{info.st_dev, info.st_ino};
}

}  // namespace

struct RecordingWriter::State {
    explicit State(Options o) : options(std::move(o)) {}

    const Options options;

    mutable std::mutex mutex;  // guards what follows
    std::condition_variable wake;
    std::condition_variable committed;
    std::deque<Pending> queue;
    std::uint64_t queuedSeq = 0;     // events put on the queue so far
    std::uint64_t committedSeq = 0;  // of those, committed (or given up) so far
    bool flushWanted = false;
    bool closing = false;
    bool closed = false;
    bool stopped = false;
    bool droppedSaid = false;
    Counts counts;

    std::thread thread;

    void add(std::string_view stream, Value&& object) {
        enqueue(Pending{std::string(stream), wallNow(), monoNow(), std::move(object), {}});
    }

    void addFix(const gps::Fix& fix) { enqueue(Pending{{}, 0, 0, Value(), fix}); }

    void enqueue(Pending&& pending) {
        bool sayDropped = false;
        {
            const std::lock_guard lock(mutex);
            // After close the recording is over: what still arrives is no loss.
            if (closing) return;
            if (stopped) {
                ++counts.dropped;
                return;
            }
            if (queue.size() >= options.queueCapacity) {
                ++counts.dropped;
                sayDropped = !droppedSaid;
                droppedSaid = true;
            } else {
                queue.push_back(std::move(pending));
                ++queuedSeq;
            }
        }
        if (sayDropped) {
            systemFault(
                format("recording %s: the writer cannot keep up; events are dropped while "
                       "its queue is full (counted when the recording closes)",
                       options.path.c_str()));
        } else {
            wake.notify_one();
        }
    }

    // lost: events taken off the queue that did not make it into the file (the rest of the
    // batch, and what the open transaction held).
    void stop(const std::string& why, std::uint64_t lost = 0) {
        std::uint64_t recorded = 0;
        {
            const std::lock_guard lock(mutex);
            stopped = true;
            counts.stopped = true;
            counts.dropped += lost + queue.size();
            queue.clear();
            committedSeq = queuedSeq;
            recorded = counts.recorded;
        }
        committed.notify_all();
        systemFault(format("recording %s stopped: %s (%llu events recorded); the program goes on",
                           options.path.c_str(), why.c_str(),
                           static_cast<unsigned long long>(recorded)));
    }

    SqliteDatabase open(std::int64_t& sessionID, FileIdentity& identity) {
        const bool fresh = !std::filesystem::exists(options.path);
        SqliteDatabase db(options.path, fresh ? SqliteDatabase::Mode::ReadWriteCreate
                                              : SqliteDatabase::Mode::ReadWrite);
        db.execute(
            "PRAGMA journal_mode=WAL; PRAGMA synchronous=NORMAL; PRAGMA wal_autocheckpoint=4000;");
        if (fresh) {
            db.execute("BEGIN");
            db.execute(format("PRAGMA application_id=%d; PRAGMA user_version=%d;", kApplicationID,
                              kFormatVersion));
            db.execute(kSchema);
            db.execute(kPositionsSchema);
            SqliteStatement meta = db.prepare("INSERT INTO meta(key, value) VALUES(?, ?)");
            meta.bind(1, std::string_view("format_version"));
            meta.bind(2, static_cast<std::int64_t>(kFormatVersion));
            meta.step();
            meta.reset();
            meta.bind(1, std::string_view("created_ns"));
            meta.bind(2, wallNow());
            meta.step();
            meta.reset();
            meta.bind(1, std::string_view("program"));
            meta.bind(2, std::string_view("pyxon"));
            meta.step();
            db.execute("COMMIT");
        } else if (db.queryInteger("PRAGMA user_version") < kFirstFormatWithPositions) {
            // An older recording gains the positions table as this session is added to it.
            db.execute("BEGIN");
            db.execute(kPositionsSchema);
            db.execute(format("PRAGMA user_version=%d;", kFirstFormatWithPositions));
            db.execute(format("UPDATE meta SET value=%d WHERE key='format_version';",
                              kFirstFormatWithPositions));
            db.execute("COMMIT");
        }
        const RecordingSession& s = options.session;
        SqliteStatement insert = db.prepare(
            "INSERT INTO sessions(start_ns, program_version, source, seed, speed, host) "
            "VALUES(?, ?, ?, ?, ?, ?)");
        insert.bind(1, wallNow());
        insert.bind(2, std::string_view(s.programVersion));
        insert.bind(3, std::string_view(s.source));
        insert.bindOrNull(4, s.seed);
        insert.bindOrNull(5, s.speed);
        insert.bind(6, std::string_view(s.host));
        insert.step();
        sessionID = sqlite3_last_insert_rowid(db.handle());
        const auto opened = identityOf(options.path);
        if (!opened) throw SqliteError(SQLITE_CANTOPEN, 0, "the file vanished as it was opened");
        identity = *opened;
        return db;
    }

    void run() {
        std::int64_t sessionID = 0;
        FileIdentity identity;
        std::optional<SqliteDatabase> db;
        std::optional<SqliteStatement> prepared;
        std::optional<SqliteStatement> preparedFix;
        try {
            db.emplace(open(sessionID, identity));
            prepared.emplace(db->prepare(
                "INSERT INTO events(session, stream, wall_ns, mono_ns, metric_id, payload, "
                "record) VALUES(?, ?, ?, ?, ?, ?, ?)"));
            preparedFix.emplace(db->prepare(
                "INSERT INTO positions(session, time_ns, received_ns, mode, lat, lon, alt_m, "
                "speed_mps, track_deg, horizontal_error_m) VALUES(?, ?, ?, ?, ?, ?, ?, ?, ?, ?)"));
        } catch (const SqliteError& error) {
            stop("cannot open it: " + whyWriteFailed(error, options.path));
            return;
        }
        SqliteStatement& insert = *prepared;
        SqliteStatement& insertFix = *preparedFix;
        std::uint64_t inTransactionFixes = 0;
        EncodedRecord encoded;
        std::deque<Pending> batch;
        bool inTransaction = false;
        Clock::time_point transactionStart;
        std::uint64_t inTransactionCount = 0;
        std::uint64_t batchSeq = 0;
        for (;;) {
            bool closeNow = false;
            bool flushNow = false;
            {
                std::unique_lock lock(mutex);
                const auto ready = [this] { return !queue.empty() || closing || flushWanted; };
                if (inTransaction) {
                    wake.wait_until(lock, transactionStart + options.commitInterval, ready);
                } else {
                    wake.wait(lock, ready);
                }
                batch.swap(queue);
                batchSeq = queuedSeq;
                closeNow = closing;
                flushNow = flushWanted;
                flushWanted = false;
            }
            std::size_t written = 0;  // of the batch
            try {
                for (Pending& event : batch) {
                    if (!inTransaction) {
                        db->execute("BEGIN");
                        inTransaction = true;
                        transactionStart = Clock::now();
                    }
                    if (event.fix) {
                        const gps::Fix& f = *event.fix;
                        insertFix.bind(1, sessionID);
                        insertFix.bind(2, f.timeNs);
                        insertFix.bind(3, f.receivedNs);
                        insertFix.bind(4, static_cast<std::int64_t>(f.mode));
                        insertFix.bind(5, f.lat);
                        insertFix.bind(6, f.lon);
                        insertFix.bindOrNull(7, f.altM);
                        insertFix.bindOrNull(8, f.speedMps);
                        insertFix.bindOrNull(9, f.trackDeg);
                        insertFix.bindOrNull(10, f.horizontalErrorM);
                        insertFix.step();
                        insertFix.reset();
                        ++inTransactionFixes;
                        ++written;
                        continue;
                    }
                    encodeRecord(event.object, encoded);
                    insert.bind(1, sessionID);
                    insert.bind(2, std::string_view(event.stream));
                    insert.bind(3, event.wallNs);
                    insert.bind(4, event.monoNs);
                    insert.bindOrNull(5, encoded.metricID);
                    if (encoded.payload) {
                        insert.bindBlob(6, *encoded.payload);
                    } else {
                        insert.bindNull(6);
                    }
                    insert.bindBlob(7, encoded.form);
                    insert.step();
                    insert.reset();
                    ++inTransactionCount;
                    ++written;
                }
                batch.clear();
                written = 0;
                const bool due =
                    inTransaction && Clock::now() - transactionStart >= options.commitInterval;
                if (inTransaction && (due || closeNow || flushNow)) {
                    db->execute("COMMIT");
                    inTransaction = false;
                    const auto now = identityOf(options.path);
                    if (!now || now->device != identity.device || now->inode != identity.inode) {
                        // Committed, but to a file that is no longer there to be read.
                        stop("the file was removed or replaced", inTransactionCount);
                        return;
                    }
                    {
                        const std::lock_guard lock(mutex);
                        counts.recorded += inTransactionCount;
                        counts.positions += inTransactionFixes;
                    }
                    inTransactionCount = 0;
                    inTransactionFixes = 0;
                }
                if (!inTransaction) {
                    {
                        const std::lock_guard lock(mutex);
                        committedSeq = batchSeq;
                    }
                    committed.notify_all();
                }
            } catch (const SqliteError& error) {
                // The open transaction is rolled back as the file closes.
                stop(whyWriteFailed(error, options.path),
                     inTransactionCount + (batch.size() - written));
                return;
            }
            if (closeNow && !inTransaction) return;
        }
    }
};

RecordingWriter::RecordingWriter(Options options) {
    std::error_code error;
    const auto status = std::filesystem::status(options.path, error);
    if (std::filesystem::is_directory(status))
        throw RecordingError(RecordingError::Kind::NotAFile, options.path,
                             "is a directory, not a recording file");
    if (std::filesystem::exists(status)) {
        if (!options.append)
            throw RecordingError(RecordingError::Kind::Exists, options.path,
                                 "exists already; give --append to add a session to it, or "
                                 "choose another name");
        // Appending to something that is not a recording (or a newer one) is refused now.
        const RecordingReader check(options.path);
    }
    state_ = std::make_shared<State>(std::move(options));
    state_->thread = std::thread([state = state_] { state->run(); });
}

RecordingWriter::~RecordingWriter() {
    close();
}

void RecordingWriter::add(std::string_view stream, const Value& object) {
    state_->add(stream, Value(object));
}

void RecordingWriter::add(std::string_view stream, Value&& object) {
    state_->add(stream, std::move(object));
}

void RecordingWriter::addFix(const gps::Fix& fix) {
    state_->addFix(fix);
}

void RecordingWriter::flush() {
    std::unique_lock lock(state_->mutex);
    const std::uint64_t target = state_->queuedSeq;
    state_->flushWanted = true;
    state_->wake.notify_one();
    state_->committed.wait(lock, [this, target] {
        return state_->committedSeq >= target || state_->stopped || state_->closed;
    });
}

void RecordingWriter::close() {
    {
        const std::lock_guard lock(state_->mutex);
        if (state_->closing) return;
        state_->closing = true;
    }
    state_->wake.notify_one();
    state_->thread.join();
    Counts counts;
    {
        const std::lock_guard lock(state_->mutex);
        state_->closed = true;
        counts = state_->counts;
    }
    state_->committed.notify_all();
    if (!counts.stopped)
        systemFault(format(
            "recording %s: %llu events recorded, %llu dropped%s", state_->options.path.c_str(),
            static_cast<unsigned long long>(counts.recorded),
            static_cast<unsigned long long>(counts.dropped),
            counts.positions > 0
                ? format(", %llu positions", static_cast<unsigned long long>(counts.positions))
                      .c_str()
                : ""));
}

RecordingWriter::Counts RecordingWriter::counts() const {
    const std::lock_guard lock(state_->mutex);
    return state_->counts;
}

}  // namespace pyx::recordings
