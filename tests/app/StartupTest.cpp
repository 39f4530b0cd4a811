// The start-up sequence and the order in which the shared pieces come to be, against a
// transport that records what was sent.
#include <gtest/gtest.h>

#include <filesystem>

#include "app/Bundle.h"
#include "app/RootNavigationController.h"
#include "baseband/VelkWrapper.h"
#include "baseband/velk/Client.h"
#include "core/Log.h"
#include "metrics/MetricValidator.h"
#include "tests/baseband/FakeTransport.h"

namespace {

using pyx::Bundle;
using pyx::CapturedLines;
using pyx::MetricValidator;
using pyx::RootNavigationController;
using pyx::Value;
using pyx::VelkWrapper;
using pyx::testing::FakeTransport;

// Remembers, each time delivery starts, whether the client had a delegate at that moment.
class DelegateProbe : public FakeTransport {
  public:
    void startEvents(EventSink sink) override {
        if (auto c = client.lock()) delegateAtStart.push_back(c->delegate() != nullptr);
        FakeTransport::startEvents(std::move(sink));
    }
    std::weak_ptr<VelkWrapper> client;
    std::vector<bool> delegateAtStart;
};

class Startup : public ::testing::Test {
  protected:
    void SetUp() override {
        transport = std::make_shared<DelegateProbe>();
        velk::client::SetTransportFactory([t = transport] { return t; });
        client = VelkWrapper::create(mainQueue);
        transport->client = client;
        validator = MetricValidator::create(client);
    }
    void TearDown() override { velk::client::SetTransportFactory({}); }

    std::vector<std::string> commandNames() const {
        std::vector<std::string> names;
        for (const auto& c : transport->commands()) names.push_back(c.name);
        return names;
    }

    static Bundle sourceResources() { return Bundle(PYXON_SOURCE_RESOURCES); }

    pyx::MainQueue mainQueue;
    std::shared_ptr<DelegateProbe> transport;
    std::shared_ptr<VelkWrapper> client;
    std::shared_ptr<MetricValidator> validator;
};

TEST_F(Startup, StoreListensBeforeItBecomesTheDelegate) {
    ASSERT_EQ(transport->delegateAtStart.size(), 1U);
    EXPECT_FALSE(transport->delegateAtStart.front());
    EXPECT_EQ(client->delegate(), validator);
    EXPECT_TRUE(transport->commands().empty()) << "no command before the root view loads";
}

TEST_F(Startup, MissingResourceSendsOnlyTheClearCommand) {
    CapturedLines out(pyx::standardOutputSink());
    RootNavigationController root(client, validator,
                                  Bundle(std::filesystem::path("/nonexistent/pyxon")));
    root.viewDidLoad();
    EXPECT_EQ(commandNames(), (std::vector<std::string>{velk::kCommandClearConfiguration}));
    EXPECT_EQ(transport->starts(), 1) << "no second listen";
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"Metric Log File path doesnt exist"}));
}

TEST_F(Startup, RefusedPushDoesNotListenAgainNorQuery) {
    transport->answerWith(velk::Result{5, "refused"});
    CapturedLines out(pyx::standardOutputSink());
    RootNavigationController root(client, validator, sourceResources());
    root.viewDidLoad();
    EXPECT_EQ(commandNames(), (std::vector<std::string>{velk::kCommandClearConfiguration,
                                                        velk::kCommandAddConfiguration}));
    EXPECT_EQ(transport->starts(), 1);
    EXPECT_FALSE(out.contains("Querying SIM files"));
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"pushing metric file"}));
}

TEST_F(Startup, SuccessfulPushListensAgainAndQueriesTheSimFilesOnce) {
    CapturedLines out(pyx::standardOutputSink());
    RootNavigationController root(client, validator, sourceResources());
    root.viewDidLoad();
    EXPECT_EQ(commandNames(), (std::vector<std::string>{velk::kCommandClearConfiguration,
                                                        velk::kCommandAddConfiguration,
                                                        velk::kCommandQueryMetric}));
    EXPECT_EQ(transport->starts(), 2) << "listen re-arms delivery";
    EXPECT_EQ(out.lines(), (std::vector<std::string>{"pushing metric file", "Querying SIM files"}));
}

TEST_F(Startup, QueryAlwaysCarriesTriggerIdReferenceMetricAndProfile) {
    RootNavigationController root(client, validator, sourceResources());
    root.viewDidLoad();
    const auto commands = transport->commands();
    ASSERT_EQ(commands.size(), 3U);
    const auto& query = commands[2].input.asDict();
    EXPECT_EQ(query.find(velk::kKeyTriggerID)->toInt64(), 0x7F0013);
    EXPECT_EQ(query.find(velk::kKeyTriggerRef)->toInt64(), 9999);
    EXPECT_EQ(query.find(velk::kKeyTriggerType)->toInt64(), 0);
    EXPECT_EQ(query.find(velk::kKeyMetricID)->toInt64(), 0);
    EXPECT_EQ(query.find(velk::kKeyProfileID)->toInt64(), 0);
    EXPECT_EQ(query.find(velk::kKeyAppID)->toInt64(), 2);
}

TEST_F(Startup, PushSendsTheConfigurationResourceBytes) {
    RootNavigationController root(client, validator, sourceResources());
    root.viewDidLoad();
    const auto commands = transport->commands();
    ASSERT_GE(commands.size(), 2U);
    const Value* payload = commands[1].input.asDict().find(velk::kKeyPayload);
    ASSERT_NE(payload, nullptr);
    ASSERT_TRUE(payload->isBytes());
    EXPECT_EQ(payload->asBytes().size(),
              std::filesystem::file_size(std::string(PYXON_SOURCE_RESOURCES) +
                                         "/oru_test_lte.deviceconfig"));
}

TEST(RootNavigation, TakesTheClientsSharedInstanceThenTheStoresThenWaitsForItsView) {
    auto transport = std::make_shared<DelegateProbe>();
    velk::client::SetTransportFactory([transport] { return transport; });
    // The probe watches the shared client, so that it sees whether the store listened before
    // it became the delegate.
    transport->client = VelkWrapper::sharedInstance();
    RootNavigationController root;
    EXPECT_EQ(transport->delegateAtStart, std::vector<bool>{false})
        << "the shared store listens once, before it becomes the delegate";
    EXPECT_EQ(root.myVelkWrapper, VelkWrapper::sharedInstance());
    EXPECT_EQ(root.myMetricValidator, MetricValidator::sharedInstance());
    EXPECT_EQ(root.myMetricValidator->mySharedVelkInstance(), root.myVelkWrapper);
    EXPECT_EQ(root.myVelkWrapper->delegate(), root.myMetricValidator);
    EXPECT_EQ(transport->starts(), 1) << "the store's creation listens once";
    EXPECT_TRUE(transport->commands().empty()) << "the start-up sequence waits for the view";
    EXPECT_EQ(root.myAppID, "pyxtool");
    EXPECT_EQ(root.metricFileName, "oru_test_lte");
    EXPECT_EQ(root.metricFileType, "deviceconfig");
    velk::client::SetTransportFactory({});
}

TEST(ResourceBundle, FindsTheMetricConfigurationInTheSourceResources) {
    const Bundle bundle(PYXON_SOURCE_RESOURCES);
    EXPECT_TRUE(bundle.pathForResource("oru_test_lte", "deviceconfig").has_value());
    EXPECT_FALSE(bundle.pathForResource("oru_test_lte", "nothing").has_value());
}

TEST(ResourceBundle, InstalledProgramUsesShareFolderUnderItsPrefix) {
    const auto prefix = std::filesystem::temp_directory_path() / "pyxon-bundle-test";
    std::filesystem::remove_all(prefix);
    std::filesystem::create_directories(prefix / "bin");
    const auto program = prefix / "bin" / "pyxon";
    EXPECT_EQ(Bundle::forProgram(program, "/fallback").resourcePath(), "/fallback")
        << "no installed resources: the source tree's";
    std::filesystem::create_directories(prefix / PYXON_INSTALL_DATADIR);
    EXPECT_EQ(Bundle::forProgram(program, "/fallback").resourcePath(),
              prefix / PYXON_INSTALL_DATADIR);
    std::filesystem::remove_all(prefix);
}

}  // namespace
