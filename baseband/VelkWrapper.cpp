#include "baseband/VelkWrapper.h"

#include <fstream>
#include <iterator>
#include <mutex>
#include <utility>

#include "baseband/EventRecord.h"
#include "core/Format.h"
#include "core/Log.h"

namespace pyx {

namespace {

constexpr char kClientName[] = "pyxtool";
constexpr char kQueueLabel[] = "com.mirelo.Pyxon.serialQ.queue";
// What is sent as the application ID, whatever string passed the gate.
constexpr std::int64_t kAppIDValue = 2;
constexpr std::int64_t kPayloadTypeValue = 0;

constexpr char kAddConfigName[] = "-[VelkWrapper addTelxConfigForAppId:andProtofFilePath:]";
constexpr char kRemoveConfigName[] = "-[VelkWrapper removeTelxConfigForAppid:]";
constexpr char kQueryName[] =
    "-[VelkWrapper querySpecificMetric:triggerRef:triggerType:triggerID:profileID:metricID:]";
constexpr char kListenName[] = "-[VelkWrapper listen]";
constexpr char kHandlerName[] = "-[VelkWrapper listen]_block_invoke";

bool isOurAppId(std::string_view appId) {
    return appId == kClientName;
}

// The whole file; an unreadable or missing file gives no bytes.
Bytes readWholeFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) return {};
    Bytes bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (in.bad()) return {};
    return bytes;
}

void logResult(const char* method, const velk::Result& result) {
    systemLog(format("%s: error=%d msg=%s", method, result.code, result.message.c_str()));
}

enum class EventKind { Trigger, Metric };

}  // namespace

struct VelkWrapper::Impl {
    explicit Impl(MainQueue& queue) : mainQueue(queue) {}

    MainQueue& mainQueue;
    std::shared_ptr<velk::client::Manager> velkManager;

    // The delegate is set on the main thread and read by the handlers on the serial queue.
    mutable std::mutex delegateMutex;
    std::weak_ptr<VelkWrapperDelegate> delegate;

    [[nodiscard]] std::shared_ptr<VelkWrapperDelegate> currentDelegate() const {
        const std::lock_guard lock(delegateMutex);
        return delegate.lock();
    }

    // Sends one command and logs its outcome, success included.
    bool perform(const char* method, const char* command, const Dict& input) const {
        Value output;  // the reply slot; the reply is not read
        const velk::Result result =
            velk::client::PerformCommand(velkManager, command, Value(input), &output);
        logResult(method, result);
        return result.code == velk::kCodeSuccess;
    }
};

std::shared_ptr<VelkWrapper> VelkWrapper::sharedInstance() {
    // Created on first use (start-up, on the main thread) and kept for the life of the process.
    static const std::shared_ptr<VelkWrapper> instance = create();
    return instance;
}

std::shared_ptr<VelkWrapper> VelkWrapper::create(MainQueue& mainQueue) {
    // The constructor is private; the new object is owned at once.
    std::shared_ptr<VelkWrapper> wrapper(new VelkWrapper(mainQueue));
    return wrapper;
}

VelkWrapper::VelkWrapper(MainQueue& mainQueue) : impl_(std::make_unique<Impl>(mainQueue)) {
    const std::string name = kClientName;
    impl_->velkManager = velk::client::CreateManager(name, queue());
}

VelkWrapper::~VelkWrapper() = default;

SerialQueue& VelkWrapper::queue() {
    static SerialQueue serialQueue(kQueueLabel);
    return serialQueue;
}

bool VelkWrapper::addTelxConfigForAppId(std::string_view appId, const std::string& protofFilePath) {
    if (!isOurAppId(appId)) return false;
    Dict input;
    input.append(velk::kKeyAppID, Value(kAppIDValue));
    input.append(velk::kKeyPayload, Value(readWholeFile(protofFilePath)));
    input.append(velk::kKeyPayloadType, Value(kPayloadTypeValue));
    return impl_->perform(kAddConfigName, velk::kCommandAddConfiguration, input);
}

bool VelkWrapper::removeTelxConfigForAppid(std::string_view appId) {
    if (!isOurAppId(appId)) return false;
    Dict input;
    input.append(velk::kKeyAppID, Value(kAppIDValue));
    return impl_->perform(kRemoveConfigName, velk::kCommandClearConfiguration, input);
}

bool VelkWrapper::querySpecificMetric(std::string_view appId, std::int32_t triggerRef,
                                      std::int32_t triggerType, std::int32_t triggerID,
                                      std::int32_t profileID, std::int32_t metricID) {
    if (!isOurAppId(appId)) return false;
    Dict input;
    input.append(velk::kKeyAppID, Value(kAppIDValue));
    input.append(velk::kKeyPayloadType, Value(kPayloadTypeValue));
    input.append(velk::kKeyTriggerRef, Value(static_cast<std::int64_t>(triggerRef)));
    input.append(velk::kKeyTriggerType, Value(static_cast<std::int64_t>(triggerType)));
    input.append(velk::kKeyTriggerID, Value(static_cast<std::int64_t>(triggerID)));
    input.append(velk::kKeyProfileID, Value(static_cast<std::int64_t>(profileID)));
    input.append(velk::kKeyMetricID, Value(static_cast<std::int64_t>(metricID)));
    return impl_->perform(kQueryName, velk::kCommandQueryMetric, input);
}

void VelkWrapper::listen() {
    // The handlers hold the wrapper weakly: the manager they are registered with belongs to it.
    const auto handlerFor = [weak = weak_from_this()](EventKind kind) {
        return [weak, kind](const Value& event) {
            const std::shared_ptr<VelkWrapper> self = weak.lock();
            if (!self) return;
            Value record(metricRecordFromEvent(event));
            // The whole record with its payload in hex: built only when someone reads it.
            if (systemLogSink().on())
                systemLog(format(kind == EventKind::Trigger ? "%s: EventTrigger dict=%s"
                                                            : "%s: MetricsTrigger dict=%s",
                                 kHandlerName, record.description().c_str()));
            // With no delegate at this moment, the event ends here.
            if (!self->impl_->currentDelegate()) return;
            // The task holds the wrapper weakly too, so that a wrapper that goes away (at the
            // latest when the process ends) takes its manager and event delivery with it.
            self->impl_->mainQueue.post([weak, kind, record = std::move(record)] {
                const std::shared_ptr<VelkWrapper> wrapper = weak.lock();
                if (!wrapper) return;
                const std::shared_ptr<VelkWrapperDelegate> delegate =
                    wrapper->impl_->currentDelegate();
                if (!delegate) return;
                // What the delegate throws goes to the main queue's error handler.
                if (kind == EventKind::Trigger) {
                    delegate->eventsDidUpdate(record.asDict());
                } else {
                    delegate->metricsDidUpdate(record.asDict());
                }
            });
        };
    };
    velk::client::RegisterEventHandler(impl_->velkManager, velk::kEventTrigger,
                                       handlerFor(EventKind::Trigger));
    velk::client::RegisterEventHandler(impl_->velkManager, velk::kEventMetric,
                                       handlerFor(EventKind::Metric));
    velk::client::EventsOff(impl_->velkManager);
    velk::client::EventsOn(impl_->velkManager);
    systemLog(format("%s: listening for events", kListenName));
}

std::shared_ptr<VelkWrapperDelegate> VelkWrapper::delegate() const {
    return impl_->currentDelegate();
}

void VelkWrapper::setDelegate(std::weak_ptr<VelkWrapperDelegate> delegate) {
    const std::lock_guard lock(impl_->delegateMutex);
    impl_->delegate = std::move(delegate);
}

}  // namespace pyx
