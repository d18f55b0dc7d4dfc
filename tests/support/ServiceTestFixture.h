// ServiceTest: the fixture of the tests that run kxserverd: a private runtime directory (so that tests never
// share ports), a system bus that never exists (so that no test reaches the machine's), a poll main queue
// for the test's clients, and bounded waits.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "tests/support/KxTestClient.h"
#include "tests/support/ServiceProcess.h"
#include "tests/support/TestPaths.h"

namespace velmar::testing {

class ServiceTest : public ::testing::Test {
  protected:
    static constexpr double kWaitSeconds = 60.0;

    void SetUp() override {
        ASSERT_FALSE(runtime_.path().empty());
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        // What the test itself runs (runProcess, BackgroundProcess) inherits a system bus that never exists.
        setenv("DBUS_SYSTEM_BUS_ADDRESS", unreachableSystemBus(files_.path()).c_str(), 1);
        MainQueue::setCurrent(&queue_);
    }
    void TearDown() override {
        clients_.clear();
        service_.reset();
        MainQueue::setCurrent(nullptr);
        unsetenv("VELMAR_RUNTIME_DIR");
        unsetenv("DBUS_SYSTEM_BUS_ADDRESS");
    }

    // Starts kxserverd with arguments (log lines at notice and above mirrored to its standard error), and
    // the environment's extra assignments, and waits until it serves.
    ServiceProcess& startService(const std::vector<std::string>& arguments,
                                 const std::vector<std::string>& environment = {}) {
        std::vector<std::string> all = arguments;
        all.push_back("--log-stderr");
        std::vector<std::string> assignments = {"VELMAR_LOG_LEVEL=notice"};
        assignments.insert(assignments.end(), environment.begin(), environment.end());
        service_ = std::make_unique<ServiceProcess>(all, files_.path(), assignments);
        const bool serving = service_->waitUntilServing(kWaitSeconds);
        EXPECT_TRUE(serving) << service_->errorOutput();
        return *service_;
    }

    KxTestClient& newClient(bool readBlobs = true) {
        clients_.push_back(
            std::make_unique<KxTestClient>(queue_, "client" + std::to_string(clients_.size() + 1)));
        KxTestClient& client = *clients_.back();
        const bool connected = client.connect(readBlobs);
        EXPECT_TRUE(connected) << client.error();
        return client;
    }

    // Turns the clients' queue until predicate holds; false when the time ran out.
    bool runUntil(const std::function<bool()>& predicate, double seconds = kWaitSeconds) {
        return queue_.runUntil(predicate, seconds);
    }

    static std::string samplePath(const std::string& name) {
        return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
    }
    static std::string dataPath(const std::string& name) { return testDataPath("service/" + name); }

    TemporaryDirectory runtime_;
    TemporaryDirectory files_;
    PollMainQueue queue_;
    std::unique_ptr<ServiceProcess> service_;
    std::vector<std::unique_ptr<KxTestClient>> clients_;
};

}  // namespace velmar::testing
