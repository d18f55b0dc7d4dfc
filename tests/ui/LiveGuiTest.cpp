#ifdef VELMAR_WITH_QT

#include "tests/ui/LiveGuiTest.h"

#include <QApplication>
#include <cstdlib>

#include "LogGenerator/LogGenerator.h"
#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "tests/ui/QtTestApplication.h"

namespace velmar::testing {

void LiveGuiTest::SetUp() {
    qtTestApplication();
    setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
    setenv("XDG_CONFIG_HOME", config_.path().c_str(), 1);
    setenv("XDG_STATE_HOME", state_.path().c_str(), 1);
    unsetenv("VELMAR_SYSROOT");
    MainQueue::setCurrent(&queue_);
}

void LiveGuiTest::TearDown() {
    app_.reset();
    QApplication::processEvents();
    Clock::setNowForTesting(std::nullopt);
    MainQueue::setCurrent(nullptr);
    ArrayLock::releaseOutstandingForTesting();
}

VelmarApp& LiveGuiTest::makeApp() {
    app_ = std::make_unique<VelmarApp>(
        [](std::string_view technology) { return LogGenerator::generatorFromTechnology(technology); },
        queue_);
    return *app_;
}

}  // namespace velmar::testing

#endif  // VELMAR_WITH_QT
