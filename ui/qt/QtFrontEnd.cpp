#include "ui/qt/QtFrontEnd.h"

#include <signal.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <QApplication>
#include <QSocketNotifier>

#include "core/ArrayLock.h"
#include "ui/qt/QtMainQueue.h"
#include "ui/qt/VelmarApp.h"

namespace velmar {

int runQtFrontEnd(int argc, char** argv, GeneratorFactory factory, bool fullscreen) {
    QApplication application(argc, argv);
    QApplication::setApplicationName(QStringLiteral("velmar"));
    QApplication::setApplicationDisplayName(QStringLiteral("Velmar"));

    // SIGTERM and SIGINT end the program through the event loop, so that termination runs normally.
    sigset_t handled;
    sigemptyset(&handled);
    sigaddset(&handled, SIGTERM);
    sigaddset(&handled, SIGINT);
    sigprocmask(SIG_BLOCK, &handled, nullptr);
    const int signalFd = signalfd(-1, &handled, SFD_CLOEXEC | SFD_NONBLOCK);
    std::unique_ptr<QSocketNotifier> signalNotifier;
    if (signalFd >= 0) {
        signalNotifier = std::make_unique<QSocketNotifier>(signalFd, QSocketNotifier::Read);
        QObject::connect(signalNotifier.get(), &QSocketNotifier::activated, &application, [signalFd] {
            signalfd_siginfo info{};
            while (read(signalFd, &info, sizeof info) == sizeof info) {
            }
            QCoreApplication::quit();
        });
    }

    int status = 0;
    {
        QtMainQueue queue;
        MainQueue::setCurrent(&queue);
        VelmarApp app(std::move(factory), queue);
        QObject::connect(&application, &QCoreApplication::aboutToQuit, &application,
                         [&app] { app.applicationWillTerminate(); });
        app.applicationDidFinishLaunching(fullscreen);
        status = QApplication::exec();
        app.applicationWillTerminate();
        MainQueue::setCurrent(nullptr);
    }
    ArrayLock::releaseOutstandingForTesting();
    signalNotifier.reset();
    if (signalFd >= 0) {
        close(signalFd);
    }
    return status;
}

}  // namespace velmar
