#include "sources/modem/ModemManagerBaseband.h"

#include <poll.h>

#include <sdbus-c++/sdbus-c++.h>
#include <algorithm>
#include <atomic>
#include <deque>
#include <initializer_list>
#include <map>
#include <stop_token>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

#include "baseband/velk/Names.h"
#include "core/Format.h"
#include "sources/modem/DbusValue.h"
#include "sources/modem/FaultReporter.h"
#include "sources/modem/ModemPayloads.h"
#include "sources/sim/BasebandCommands.h"
#include "sources/sim/DeviceConfig.h"

namespace pyx::modem {

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr char kService[] = "org.freedesktop.ModemManager1";
constexpr char kRootPath[] = "/org/freedesktop/ModemManager1";
constexpr char kModemPathPrefix[] = "/org/freedesktop/ModemManager1/Modem/";
constexpr char kObjectManager[] = "org.freedesktop.DBus.ObjectManager";
constexpr char kProperties[] = "org.freedesktop.DBus.Properties";
constexpr char kModem[] = "org.freedesktop.ModemManager1.Modem";
constexpr char kModem3gpp[] = "org.freedesktop.ModemManager1.Modem.Modem3gpp";
constexpr char kSignal[] = "org.freedesktop.ModemManager1.Modem.Signal";
constexpr char kLocation[] = "org.freedesktop.ModemManager1.Modem.Location";
constexpr char kSim[] = "org.freedesktop.ModemManager1.Sim";
constexpr char kBearer[] = "org.freedesktop.ModemManager1.Bearer";
constexpr std::uint32_t kLocation3gppLacCi = 1;

constexpr milliseconds kWaitSlice{50};
constexpr std::chrono::seconds kSimRereadPeriod{30};

bool nameIs(const sdbus::Error& e, std::initializer_list<std::string_view> names) {
    return std::find(names.begin(), names.end(), e.getName()) != names.end();
}
bool notRunning(const sdbus::Error& e) {
    return nameIs(e, {"org.freedesktop.DBus.Error.ServiceUnknown",
                      "org.freedesktop.DBus.Error.NameHasNoOwner"});
}
bool timedOut(const sdbus::Error& e) {
    return nameIs(e, {"org.freedesktop.DBus.Error.NoReply", "org.freedesktop.DBus.Error.Timeout",
                      "org.freedesktop.DBus.Error.TimedOut", "System.Error.ETIMEDOUT"});
}
bool refused(const sdbus::Error& e) {
    return nameIs(e, {"org.freedesktop.DBus.Error.AccessDenied",
                      "org.freedesktop.DBus.Error.InteractiveAuthorizationRequired",
                      "org.freedesktop.ModemManager1.Error.Core.Unauthorized",
                      "org.freedesktop.PolicyKit1.Error.NotAuthorized"});
}
bool unsupported(const sdbus::Error& e) {
    return nameIs(e, {"org.freedesktop.ModemManager1.Error.Core.Unsupported",
                      "org.freedesktop.DBus.Error.UnknownMethod",
                      "org.freedesktop.DBus.Error.UnknownInterface",
                      "org.freedesktop.DBus.Error.UnknownObject"});
}
// The connection itself is broken (the bus went away): start over with a new one.
bool connectionLost(const sdbus::Error& e) {
    return e.getName().starts_with("System.Error.") && !timedOut(e);
}

using Properties = std::map<std::string, sdbus::Variant>;
using Interfaces = std::map<std::string, Properties>;
using ManagedObjects = std::map<sdbus::ObjectPath, Interfaces>;

}  // namespace

class ModemManagerBaseband::Poller {
  public:
    Poller(const ModemManagerBaseband::Options& options, ModemManagerBaseband::Shared& shared)
        : options_(options), shared_(shared) {}

    // Polls until stop, handing events to sink; then puts the modem's signal rate back.
    void run(const std::stop_token& stop, velk::client::Transport::EventSink sink) {
        sink_ = std::move(sink);
        while (!stop.stop_requested()) {
            const milliseconds wait = cycle(stop);
            sleep(stop, wait);
        }
        restoreSignal();
    }

  private:
    // One poll; returns how long to wait before the next.
    milliseconds cycle(const std::stop_token& stop) {
        milliseconds period{0};
        std::uint64_t generation = 0;
        {
            const std::lock_guard lock(shared_.mutex);
            period = shared_.configured ? shared_.period : options_.defaultPeriod;
            generation = shared_.generation;
        }
        if (generation != generation_) {
            generation_ = generation;
            signalRate_.reset();  // set up again at the new rate
        }
        bool read = false;
        try {
            read = readOnce(period);
        } catch (const std::exception& e) {
            faults_.say("poll", std::string("the modem source could not read the modem: ") +
                                    e.what() + "; trying again");
        }
        if (!read) {
            answerQueries(false);
            return options_.retryPeriod;
        }
        if (stop.stop_requested()) return milliseconds{0};
        answerQueries(true);
        emitDue();
        return period;
    }

    // Reads the modem; false when there is nothing to read (no bus, no service, no modem).
    bool readOnce(milliseconds period) {
        if (!connect()) return false;
        try {
            const auto objects = managedObjects();
            if (!objects) return false;
            const auto path = chooseModem(*objects);
            if (!path) return false;
            const Interfaces& interfaces = objects->at(sdbus::ObjectPath(*path));
            setUpSignal(*path, interfaces, period);
            readModemFacts(*path, interfaces);
            faults_.clear("poll");
            return true;
        } catch (const sdbus::Error& e) {
            if (connectionLost(e)) {
                dropConnection(e.getMessage());
            } else {
                faults_.say("poll", "ModemManager: " + e.getName() + ": " + e.getMessage());
            }
            return false;
        }
    }

    bool connect() {
        if (connection_) return true;
        try {
            connection_ = sdbus::createSystemBusConnection();
            manager_ = sdbus::createProxy(*connection_, kService, kRootPath);
            manager_->registerSignalHandler(kObjectManager, "InterfacesAdded",
                                            [this](sdbus::Signal&) {
                                                rescan_ = true;
                                                simStale_ = true;
                                            });
            manager_->registerSignalHandler(kObjectManager, "InterfacesRemoved",
                                            [this](sdbus::Signal&) { rescan_ = true; });
            manager_->finishRegistration();
            faults_.clear("bus");
            return true;
        } catch (const sdbus::Error& e) {
            dropConnection(e.getMessage());
            return false;
        }
    }

    void dropConnection(const std::string& why) {
        faults_.say("bus", "the system D-Bus cannot be reached (" + why +
                               "); the modem source waits for it");
        proxies_.clear();
        manager_.reset();
        connection_.reset();
        loseModem();
    }

    sdbus::IProxy& proxy(const std::string& path) {
        auto it = proxies_.find(path);
        if (it == proxies_.end())
            it = proxies_.emplace(path, sdbus::createProxy(*connection_, kService, path)).first;
        return *it->second;
    }

    std::string timeoutText() const {
        return format("%lld ms", static_cast<long long>(options_.callTimeout.count()));
    }

    // A failed call that is neither a lost connection nor handled by the caller: one line
    // under the method's topic.
    void callFailed(const std::string& method, const sdbus::Error& e) {
        if (connectionLost(e)) throw e;
        if (timedOut(e)) {
            faults_.say("call " + method, "ModemManager did not answer " + method + " within " +
                                              timeoutText() + "; asking again at the next poll");
        } else {
            faults_.say("call " + method, "ModemManager " + method + " failed: " + e.getName() +
                                              ": " + e.getMessage());
        }
    }

    std::optional<ManagedObjects> managedObjects() {
        ManagedObjects objects;
        try {
            manager_->callMethod("GetManagedObjects")
                .onInterface(kObjectManager)
                .withTimeout(options_.callTimeout)
                .storeResultsTo(objects);
        } catch (const sdbus::Error& e) {
            if (notRunning(e)) {
                faults_.clear("call GetManagedObjects");
                faults_.say("service",
                            "ModemManager is not running (no org.freedesktop.ModemManager1 on the "
                            "system D-Bus): start it with 'sudo systemctl start ModemManager'; "
                            "waiting for it");
                loseModem();
            } else {
                // A lost connection drops the modem with it; anything else (a late answer)
                // only skips this poll.
                callFailed("GetManagedObjects", e);
            }
            return std::nullopt;
        }
        faults_.clear("call GetManagedObjects");
        faults_.say("service", "ModemManager is running on the system D-Bus");
        return objects;
    }

    static std::optional<std::uint32_t> modemNumber(const std::string& path) {
        if (!path.starts_with(kModemPathPrefix)) return std::nullopt;
        const std::string digits = path.substr(std::string_view(kModemPathPrefix).size());
        if (digits.empty() || digits.size() > 9 ||
            !std::all_of(digits.begin(), digits.end(), [](char c) { return c >= '0' && c <= '9'; }))
            return std::nullopt;
        return static_cast<std::uint32_t>(std::stoul(digits));
    }

    std::optional<std::string> chooseModem(const ManagedObjects& objects) {
        std::optional<std::uint32_t> chosen;
        for (const auto& [path, interfaces] : objects) {
            if (!interfaces.contains(kModem)) continue;
            const auto number = modemNumber(path);
            if (!number) continue;
            if (options_.modemIndex ? *number == *options_.modemIndex
                                    : (!chosen || *number < *chosen))
                chosen = number;
        }
        if (!chosen) {
            if (modem_) {
                faults_.say("modem",
                            "the modem " + *modem_ + " is gone; no new values until it comes back");
            } else if (options_.modemIndex) {
                faults_.say("modem", format("ModemManager has no modem %s%u; waiting for it",
                                            kModemPathPrefix, *options_.modemIndex));
            } else {
                faults_.say("modem", "ModemManager knows no modem yet; waiting for one");
            }
            loseModem();
            return std::nullopt;
        }
        const std::string path = kModemPathPrefix + std::to_string(*chosen);
        if (modem_ != path) {
            restoreSignal();
            loseModem();
            modem_ = path;
            const Properties& modem = objects.at(sdbus::ObjectPath(path)).at(kModem);
            const auto text = [&](const char* key) {
                const auto it = modem.find(key);
                const Value v = it == modem.end() ? Value() : toValue(it->second);
                return v.isString() ? v.asString() : std::string("?");
            };
            faults_.say("modem", "using the modem " + path + " (" + text("Manufacturer") + " " +
                                     text("Model") + ")");
        }
        return path;
    }

    // Sets the modem's signal rate back to what it was before this source set it up.
    void restoreSignal() {
        const auto original = std::exchange(originalRate_, std::nullopt);
        const auto current = std::exchange(signalRate_, std::nullopt);
        if (!connection_ || !modem_ || !original || !current || *original == *current) return;
        try {
            proxy(*modem_)
                .callMethod("Setup")
                .onInterface(kSignal)
                .withTimeout(options_.callTimeout)
                .withArguments(*original);
        } catch (const sdbus::Error& e) {
            faults_.say("setup", "ModemManager could not set the signal rate of " + *modem_ +
                                     " back to " + std::to_string(*original) +
                                     " s: " + e.getName() + ": " + e.getMessage());
        }
    }

    // Forgets the modem in use: a modem that comes back is set up afresh.
    void loseModem() {
        modem_.reset();
        signalRate_.reset();
        originalRate_.reset();
        signalRefused_ = false;
        cellInfoUnavailable_ = false;
        locationUnavailable_ = false;
        reading_ = {};
        haveReading_ = false;
        forgetSim();
        for (const char* topic : {"setup", "cells", "location"}) faults_.clear(topic);
    }

    void setUpSignal(const std::string& path, const Interfaces& interfaces, milliseconds period) {
        const auto rate =
            static_cast<std::uint32_t>(std::max<long long>(1, (period.count() + 999) / 1000));
        if (signalRefused_ || signalRate_ == rate) return;
        // The modem's own rate, put back when the source stops.
        std::optional<std::uint32_t> before;
        if (const auto i = interfaces.find(kSignal); i != interfaces.end())
            if (const auto p = i->second.find("Rate"); p != i->second.end())
                if (const Value v = toValue(p->second); v.isUInt() && v.asUInt() <= 0xFFFFFFFFU)
                    before = static_cast<std::uint32_t>(v.asUInt());
        try {
            proxy(path)
                .callMethod("Setup")
                .onInterface(kSignal)
                .withTimeout(options_.callTimeout)
                .withArguments(rate);
            if (!signalRate_) originalRate_ = before;
            signalRate_ = rate;
            faults_.clear("call Signal.Setup");
        } catch (const sdbus::Error& e) {
            if (refused(e)) {
                signalRefused_ = true;
                faults_.say("setup",
                            "ModemManager refused Signal.Setup on " + path +
                                " for want of authorisation (" + e.getName() +
                                "): run as a user that polkit lets control modems (root, or see "
                                "the org.freedesktop.ModemManager1.Device.Control action); signal "
                                "strengths stay as the modem last set them, the rest is shown");
            } else if (unsupported(e)) {
                signalRefused_ = true;
                faults_.say("setup", "the modem " + path +
                                         " cannot report signal strengths (Signal.Setup: " +
                                         e.getName() + ")");
            } else {
                callFailed("Signal.Setup", e);
            }
        }
    }

    std::optional<Properties> getAll(const std::string& path, const char* interface) {
        Properties properties;
        try {
            proxy(path)
                .callMethod("GetAll")
                .onInterface(kProperties)
                .withTimeout(options_.callTimeout)
                .withArguments(std::string(interface))
                .storeResultsTo(properties);
        } catch (const sdbus::Error& e) {
            callFailed(std::string(interface) + " properties", e);
            return std::nullopt;
        }
        faults_.clear("call " + std::string(interface) + " properties");
        return properties;
    }

    // A dictionary-valued property (Signal.Lte...) as a Dict; a value of another type is
    // left out with one line.
    Dict dictionaryProperty(const Interfaces& interfaces, const char* interface,
                            const char* property, const char* name) {
        const auto i = interfaces.find(interface);
        if (i == interfaces.end()) return {};
        const auto p = i->second.find(property);
        if (p == i->second.end()) return {};
        Value v = toValue(p->second);
        if (v.isDict()) return std::move(v.asDict());
        faults_.once(format("ModemManager %s: is %s, not a dictionary (a{sv}); left out", name,
                            p->second.peekValueType().c_str()));
        return {};
    }

    static Dict propertiesOf(const Interfaces& interfaces, const char* interface) {
        const auto i = interfaces.find(interface);
        return i == interfaces.end() ? Dict{} : toDict(i->second);
    }

    void readModemFacts(const std::string& path, const Interfaces& interfaces) {
        ModemFacts facts;
        facts.modem = propertiesOf(interfaces, kModem);
        facts.modem3gpp = propertiesOf(interfaces, kModem3gpp);
        facts.signalLte = dictionaryProperty(interfaces, kSignal, "Lte", "Signal.Lte");
        facts.signalUmts = dictionaryProperty(interfaces, kSignal, "Umts", "Signal.Umts");
        facts.signalGsm = dictionaryProperty(interfaces, kSignal, "Gsm", "Signal.Gsm");

        readSim(facts);
        if (const Value* bearers = facts.modem.find("Bearers"); bearers && bearers->isArray()) {
            for (const Value& bearer : bearers->asArray()) {
                if (!bearer.isString()) continue;
                if (auto properties = getAll(bearer.asString(), kBearer))
                    facts.bearers.push_back(toDict(*properties));
            }
        }
        readCells(path, facts);
        if (!facts.cells) readLocation(path, interfaces, facts);

        FieldIssues issues;
        reading_ = readModem(facts, issues);
        for (const std::string& line : issues) faults_.once(line);
        haveReading_ = true;
    }

    // The SIM's properties hardly change: read again only for another SIM, when ModemManager
    // says an object came, or after kSimRereadPeriod.
    void readSim(ModemFacts& facts) {
        const Value* sim = facts.modem.find("Sim");
        if (!sim || !sim->isString() || sim->asString() == "/") {
            forgetSim();
            return;
        }
        const std::string& path = sim->asString();
        if (path != simPath_ || simStale_ || Clock::now() - simReadAt_ >= kSimRereadPeriod) {
            forgetSim();
            simStale_ = false;
            if (auto properties = getAll(path, kSim)) {
                simFacts_ = toDict(*properties);
                simPath_ = path;
                simReadAt_ = Clock::now();
            }
        }
        facts.sim = simFacts_;
    }

    void forgetSim() {
        simPath_.clear();
        simFacts_ = {};
    }

    void readCells(const std::string& path, ModemFacts& facts) {
        if (cellInfoUnavailable_) return;
        std::vector<Properties> cells;
        try {
            proxy(path)
                .callMethod("GetCellInfo")
                .onInterface(kModem)
                .withTimeout(options_.callTimeout)
                .storeResultsTo(cells);
        } catch (const sdbus::Error& e) {
            if (unsupported(e)) {
                cellInfoUnavailable_ = true;
                faults_.say("cells", "the modem " + path +
                                         " cannot list its cells (GetCellInfo: " + e.getName() +
                                         "); showing registration, access technology and "
                                         "location instead");
            } else if (refused(e)) {
                cellInfoUnavailable_ = true;
                faults_.say("cells", "ModemManager refused GetCellInfo on " + path +
                                         " for want of authorisation (" + e.getName() +
                                         "): run as a user that polkit lets control modems; "
                                         "showing registration, access technology and location "
                                         "instead");
            } else {
                callFailed("GetCellInfo", e);
            }
            return;
        }
        faults_.clear("call GetCellInfo");
        std::vector<Dict> out;
        out.reserve(cells.size());
        for (const auto& cell : cells) out.push_back(toDict(cell));
        facts.cells = std::move(out);
    }

    void readLocation(const std::string& path, const Interfaces& interfaces, ModemFacts& facts) {
        if (!interfaces.contains(kLocation) || locationUnavailable_) return;
        std::map<std::uint32_t, sdbus::Variant> location;
        try {
            proxy(path)
                .callMethod("GetLocation")
                .onInterface(kLocation)
                .withTimeout(options_.callTimeout)
                .storeResultsTo(location);
        } catch (const sdbus::Error& e) {
            if (refused(e) || unsupported(e)) {
                locationUnavailable_ = true;
                faults_.say("location", "ModemManager Location.GetLocation on " + path +
                                            " refused (" + e.getName() +
                                            "); the cell's area and identity stay unknown");
            } else {
                callFailed("Location.GetLocation", e);
            }
            return;
        }
        faults_.clear("call Location.GetLocation");
        if (const auto it = location.find(kLocation3gppLacCi); it != location.end())
            facts.location.append("3gpp", toValue(it->second));
    }

    // Answers the waiting queries: with the trigger, and the metric when this poll read the
    // modem (fresh); a poll that read nothing has no values to give.
    void answerQueries(bool fresh) {
        std::deque<sim::MetricQuery> queries;
        {
            const std::lock_guard lock(shared_.mutex);
            queries.swap(shared_.queries);
        }
        const std::uint64_t now = sim::wallClockMs();
        FieldIssues issues;
        for (const sim::MetricQuery& q : queries) {
            sink_(velk::kEventTrigger,
                  sim::triggerEvent(q.triggerID, q.triggerRef, q.triggerType, q.profileID));
            if (!fresh || !haveReading_) continue;
            std::optional<Bytes> payload;
            if (q.metricID == sim::kSimFilesMetricID) {
                payload = simFilesPayload(reading_, now);
            } else if (const ModemKind* kind = findModemKind(q.metricID)) {
                payload = kind->write(reading_, now, issues);
            }
            if (payload)
                sink_(velk::kEventMetric, sim::metricEvent(q.metricID, std::move(*payload)));
        }
        for (const std::string& line : issues) faults_.once(line);
    }

    void emitDue() {
        std::vector<std::int64_t> due;
        {
            const std::lock_guard lock(shared_.mutex);
            const auto now = Clock::now();
            for (auto& item : shared_.schedule) {
                if (item.next > now) continue;
                item.next = std::max(item.next + item.period, now + item.period - kWaitSlice);
                due.push_back(item.metricID);
            }
        }
        const std::uint64_t now = sim::wallClockMs();
        FieldIssues issues;
        for (const std::int64_t id : due) {
            const ModemKind* kind = findModemKind(id);
            if (kind == nullptr) continue;
            if (auto payload = kind->write(reading_, now, issues))
                sink_(velk::kEventMetric, sim::metricEvent(id, std::move(*payload)));
        }
        for (const std::string& line : issues) faults_.once(line);
    }

    // Waits for wait, or less when stopped, asked something or told of a modem coming or
    // going; D-Bus signals are handled meanwhile.
    void sleep(const std::stop_token& stop, milliseconds wait) {
        const auto until = Clock::now() + wait;
        rescan_ = false;
        while (!stop.stop_requested() && !rescan_ && !shared_.wake.exchange(false)) {
            const auto left = std::chrono::duration_cast<milliseconds>(until - Clock::now());
            if (left <= milliseconds{0}) return;
            const auto slice = std::min(left, kWaitSlice);
            if (!connection_) {
                std::this_thread::sleep_for(slice);
                continue;
            }
            try {
                while (connection_->processPendingRequest()) {
                }
                const auto data = connection_->getEventLoopPollData();
                pollfd fd{data.fd, static_cast<short>(data.events), 0};
                ::poll(&fd, 1, static_cast<int>(slice.count()));
                while (connection_->processPendingRequest()) {
                }
            } catch (const sdbus::Error& e) {
                dropConnection(e.getMessage());
            }
        }
    }

    const ModemManagerBaseband::Options& options_;
    ModemManagerBaseband::Shared& shared_;
    velk::client::Transport::EventSink sink_;
    FaultReporter faults_;

    std::unique_ptr<sdbus::IConnection> connection_;
    std::unique_ptr<sdbus::IProxy> manager_;
    std::map<std::string, std::unique_ptr<sdbus::IProxy>> proxies_;
    bool rescan_ = false;

    std::optional<std::string> modem_;
    std::optional<std::uint32_t> signalRate_;    // what this source set up
    std::optional<std::uint32_t> originalRate_;  // what the modem had before
    bool signalRefused_ = false;
    bool cellInfoUnavailable_ = false;
    bool locationUnavailable_ = false;
    std::uint64_t generation_ = 0;
    ModemReading reading_;
    bool haveReading_ = false;
    std::string simPath_;  // the SIM whose properties simFacts_ holds; empty: none read
    Dict simFacts_;
    Clock::time_point simReadAt_;
    bool simStale_ = false;
};

ModemManagerBaseband::ModemManagerBaseband(Options options) : options_(options) {
    // sdbus-c++ keeps a process-wide bus for the messages inside variants, made on first use
    // and destroyed at exit in the reverse order of making. Making it now, before the manager
    // that will own this transport, lets it outlive the polling thread, which that manager
    // stops at exit.
    static_cast<void>(sdbus::Variant());
}

ModemManagerBaseband::~ModemManagerBaseband() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

velk::Result ModemManagerBaseband::performCommand(const std::string& command, const Value& input,
                                                  Value* output) {
    static_cast<void>(output);  // no command has a reply object
    auto checked = sim::commandInput(input);
    if (auto* refused = std::get_if<velk::Result>(&checked)) return std::move(*refused);
    const Dict& dict = *std::get<const Dict*>(checked);

    if (command == velk::kCommandAddConfiguration) {
        auto parsed = sim::parseConfiguration(dict);
        if (auto* refused = std::get_if<velk::Result>(&parsed)) return std::move(*refused);
        const sim::DeviceConfig& config = std::get<sim::DeviceConfig>(parsed);
        std::vector<Shared::Due> schedule;
        milliseconds period = options_.defaultPeriod;
        bool any = false;
        for (const auto& item : config.metrics) {
            if (findModemKind(item.id) == nullptr) continue;
            const milliseconds itemPeriod{item.periodMs};
            schedule.push_back({item.id, itemPeriod, Clock::now()});
            period = any ? std::min(period, itemPeriod) : itemPeriod;
            any = true;
        }
        const std::size_t written = schedule.size();
        {
            const std::lock_guard lock(shared_.mutex);
            shared_.configured = true;
            shared_.schedule = std::move(schedule);
            shared_.period = period;
            ++shared_.generation;
        }
        shared_.wake = true;
        return velk::Result(
            velk::kCodeSuccess,
            format("configuration accepted: %zu metrics, %zu of them from the "
                   "modem, polled every %lld ms",
                   config.metrics.size(), written, static_cast<long long>(period.count())));
    }
    if (command == velk::kCommandClearConfiguration) {
        {
            const std::lock_guard lock(shared_.mutex);
            shared_.configured = false;
            shared_.schedule.clear();
            ++shared_.generation;
        }
        return velk::Result(velk::kCodeSuccess, "configuration cleared");
    }
    if (command == velk::kCommandQueryMetric) {
        auto parsed = sim::parseQuery(dict);
        if (auto* refused = std::get_if<velk::Result>(&parsed)) return std::move(*refused);
        sim::MetricQuery query = std::get<sim::MetricQuery>(parsed);
        const std::int64_t asked = query.metricID;
        query.metricID = sim::answeringMetric(query);
        if (findModemKind(query.metricID) == nullptr)
            return velk::Result(velk::kCodeUnknownMetric,
                                format("metric 0x%llX is not one the modem source reports",
                                       static_cast<unsigned long long>(asked)));
        {
            const std::lock_guard lock(shared_.mutex);
            shared_.queries.push_back(query);
        }
        shared_.wake = true;
        return velk::Result(velk::kCodeSuccess, "Success");
    }
    return velk::Result(velk::kCodeUnknownCommand, format("unknown command '%s'", command.c_str()));
}

void ModemManagerBaseband::startEvents(EventSink sink) {
    const std::lock_guard control(controlMutex_);
    stopThread();
    if (!poller_) poller_ = std::make_unique<Poller>(options_, shared_);
    thread_ = std::jthread([poller = poller_.get(), sink = std::move(sink)](
                               const std::stop_token& stop) { poller->run(stop, sink); });
}

void ModemManagerBaseband::stopEvents() {
    const std::lock_guard control(controlMutex_);
    stopThread();
}

void ModemManagerBaseband::stopThread() {
    if (!thread_.joinable()) return;
    thread_.request_stop();
    thread_.join();
}

}  // namespace pyx::modem
