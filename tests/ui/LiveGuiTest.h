// LiveGuiTest: the fixture of the tests that run the graphical monitor in this process (offscreen Qt) against
// a real kxserverd: private runtime, configuration and state directories, the Qt main queue as the current
// one, and the application with the real generators.
#pragma once

#ifdef VELMAR_WITH_QT

#include <gtest/gtest.h>

#include <memory>

#include "tests/support/TestPaths.h"
#include "ui/qt/QtMainQueue.h"
#include "ui/qt/VelmarApp.h"

namespace velmar::testing {

class LiveGuiTest : public ::testing::Test {
  protected:
    void SetUp() override;
    void TearDown() override;

    // Creates the application with the generators of every technology (not launched yet).
    VelmarApp& makeApp();
    NavigationController& navigation() { return *app_->navigationController(); }

    TemporaryDirectory runtime_;
    TemporaryDirectory config_;
    TemporaryDirectory state_;
    QtMainQueue queue_;
    std::unique_ptr<VelmarApp> app_;
};

}  // namespace velmar::testing

#endif  // VELMAR_WITH_QT
