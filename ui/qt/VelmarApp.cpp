#include "ui/qt/VelmarApp.h"

#include <QApplication>
#include <QEvent>
#include <QMessageBox>
#include <QPushButton>
#include <QScreen>
#include <QShortcut>
#include <QVBoxLayout>

#include "ui/qt/NavigationController.h"
#include "ui/qt/VelmarPaneController.h"
#include "ui/qt/VelmarSaveView.h"

namespace velmar {

VelmarApp::VelmarApp(GeneratorFactory factory, MainQueue& queue) : shell_(std::move(factory), queue) {
    shell_.setSaveScreenPresenter(this);
}

VelmarApp::~VelmarApp() {
    applicationWillTerminate();
    shell_.setSaveScreenPresenter(nullptr);
}

void VelmarApp::applicationDidFinishLaunching(bool fullscreen) {
    shell_.getSaveButtonPref();
    _window = std::make_unique<QWidget>();
    _window->setWindowTitle(QStringLiteral("Velmar"));
    _window->setObjectName(QStringLiteral("VelmarWindow"));
    auto* layout = new QVBoxLayout(_window.get());
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    _navController = new NavigationController(_window.get());
    _navController->setWillShowDelegate(
        [this](NavigationScreen& screen) { shell_.navigationWillShow(screen); });
    layout->addWidget(_navController);
    _window->installEventFilter(this);
    auto* save = new QShortcut(QKeySequence::Save, _window.get());
    connect(save, &QShortcut::activated, this, [this] {
        if (allowSaveButton()) {
            showSaveView();
        }
    });

    auto* root = new VelmarPaneController(nullptr, "/", *this);
    _navController->setRootPane(root);
    // The shell gives the root pane "Connecting" with the indicator and queues the first restartMonitor.
    shell_.launch(*_navController);
    if (fullscreen) {
        _window->showFullScreen();
    } else {
        _window->resize(kPhoneWidth, kPhoneHeight);
        _window->show();
    }
    _window->activateWindow();
}

void VelmarApp::applicationWillTerminate() {
    if (terminated_ || !_window) {
        return;
    }
    terminated_ = true;
    shell_.terminate();
    if (alert_) {
        delete alert_;
    }
    _window->hide();
    _navController = nullptr;
    _window.reset();
}

void VelmarApp::presentSaveScreen(VelmarSaveViewController& controller, bool animated) {
    if (!_window) {
        return;
    }
    if (saveView_) {
        saveView_->dismiss(false);
    }
    saveView_ = new VelmarSaveView(controller, _window.get());
    saveView_->present(animated);
}

void VelmarApp::dismissSaveScreen(bool animated) {
    if (saveView_) {
        VelmarSaveView* view = saveView_;
        saveView_ = nullptr;
        view->dismiss(animated);
    }
    if (_navController != nullptr) {
        if (NavigationScreen* top = _navController->topScreen()) {
            top->setFocus();
        }
    }
}

void VelmarApp::showAlert(const std::string& title, const std::string& message,
                          const std::string& cancelButtonTitle) {
    // Parented to the window, not to the save screen, so that it stays after the screen closes; opened
    // without a nested event loop, so that the monitor keeps running behind it.
    auto* alert = new QMessageBox(_window.get());
    alert->setAttribute(Qt::WA_DeleteOnClose);
    alert->setWindowModality(Qt::WindowModal);
    alert->setIcon(QMessageBox::NoIcon);
    alert->setWindowTitle(QString::fromStdString(title));
    alert->setText(QString::fromStdString(title));
    alert->setInformativeText(QString::fromStdString(message));
    alert->addButton(QString::fromStdString(cancelButtonTitle), QMessageBox::RejectRole);
    // Wide enough for the message on one line on a phone-sized window.
    alert->setStyleSheet(QStringLiteral("QLabel { min-width: 240px; }"));
    alert_ = alert;
    alert->open();
}

bool VelmarApp::eventFilter(QObject* watched, QEvent* event) {
    if (watched == _window.get() && event->type() == QEvent::Resize && saveView_) {
        saveView_->coverParent();
    }
    return QObject::eventFilter(watched, event);
}

}  // namespace velmar
