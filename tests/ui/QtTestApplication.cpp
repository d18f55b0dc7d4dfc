#ifdef VELMAR_WITH_QT

#include "tests/ui/QtTestApplication.h"

namespace velmar::testing {

QApplication& qtTestApplication() {
    static QApplication* application = [] {
        // Never a real window in a test, whatever display the session has.
        qputenv("QT_QPA_PLATFORM", "offscreen");
        static int argc = 1;
        static char name[] = "ui_tests";
        static char* argv[] = {name, nullptr};
        return new QApplication(argc, argv);
    }();
    return *application;
}

}  // namespace velmar::testing

#endif
