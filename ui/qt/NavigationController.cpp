#include "ui/qt/NavigationController.h"

#include <QApplication>
#include <QEasingCurve>
#include <QFontMetrics>
#include <QKeyEvent>
#include <QPainter>
#include <QVBoxLayout>
#include <algorithm>

#include "ui/qt/VelmarPaneController.h"

namespace velmar {

namespace {

const QColor kBarColour(0xf7, 0xf7, 0xf7);
const QColor kBorderColour(0xb2, 0xb2, 0xb2);
constexpr int kBackButtonMinWidth = 80;
constexpr int kBackButtonMaxWidth = 220;

// The title bar: a back button on the left and the title centred over the whole width. The back button names
// the pane below, cut to the room the title leaves it; a title too long for what is left is cut at its end.
class TitleBar : public QWidget {
  public:
    TitleBar(QWidget* parent, QToolButton*& back, QLabel*& title) : QWidget(parent) {
        setFixedHeight(NavigationController::kTitleBarHeight);
        title_ = title = new QLabel(this);
        QFont titleFont = QApplication::font();
        titleFont.setPixelSize(17);
        titleFont.setBold(true);
        title_->setFont(titleFont);
        title_->setAlignment(Qt::AlignCenter);
        title_->setTextFormat(Qt::PlainText);
        back_ = back = new QToolButton(this);
        back_->setFocusPolicy(Qt::NoFocus);
        back_->setCursor(Qt::PointingHandCursor);
        QFont backFont = QApplication::font();
        backFont.setPixelSize(17);
        back_->setFont(backFont);
        // Flat, as on a touch screen: no frame, not even under the mouse.
        back_->setStyleSheet(QStringLiteral("QToolButton { border: none; padding: 0 6px; color: #007aff; }"));
        back_->setVisible(false);
    }

    void setTitles(const QString& title, const QString& backTitle) {
        title_->setToolTip(title);
        fullTitle_ = title;
        backTitle_ = backTitle;
        relayout();
    }

    void relayout() {
        const QFontMetrics titleMetrics(title_->font());
        const int titleWidth = std::min(width(), titleMetrics.horizontalAdvance(fullTitle_));
        // Whatever the centred title leaves on its left, within reason.
        const int room =
            std::clamp((width() - titleWidth) / 2 - 12, kBackButtonMinWidth, kBackButtonMaxWidth);
        const QFontMetrics backMetrics(back_->font());
        const QString text =
            QStringLiteral("‹ ") + backMetrics.elidedText(backTitle_, Qt::ElideRight, room - 30);
        if (back_->text() != text) {
            back_->setText(text);
        }
        const QSize backSize = back_->sizeHint().boundedTo(QSize(room, height()));
        back_->setGeometry(4, (height() - backSize.height()) / 2, backSize.width(), backSize.height());
        const int reserved = back_->isVisible() ? backSize.width() + 8 : 8;
        const int titleRoom = std::max(0, width() - 2 * reserved);
        title_->setGeometry(reserved, 0, titleRoom, height());
        // A title longer than its room is cut at the end, never drawn under the back button.
        const QString shown = titleMetrics.elidedText(fullTitle_, Qt::ElideRight, titleRoom);
        if (title_->text() != shown) {
            title_->setText(shown);
        }
    }

  protected:
    void resizeEvent(QResizeEvent*) override { relayout(); }
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.fillRect(rect(), kBarColour);
        painter.fillRect(QRect(0, height() - 1, width(), 1), kBorderColour);
    }

  private:
    QToolButton* back_;
    QLabel* title_;
    QString fullTitle_;
    QString backTitle_;
};

}  // namespace

NavigationController::NavigationController(QWidget* parent) : QWidget(parent) {
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    bar_ = new TitleBar(this, back_, title_);
    layout->addWidget(bar_);
    area_ = new QWidget(this);
    area_->setAutoFillBackground(true);
    QPalette palette = area_->palette();
    palette.setColor(QPalette::Window, Qt::white);
    area_->setPalette(palette);
    layout->addWidget(area_, 1);
    area_->installEventFilter(this);
    connect(back_, &QToolButton::clicked, this, [this] { popPane(true); });
}

NavigationController::~NavigationController() {
    if (animation_ != nullptr) {
        animation_->disconnect();
        animation_->stop();
    }
}

Pane& NavigationController::paneAt(std::size_t index) {
    return *panes_.at(index);
}

VelmarPaneController* NavigationController::pane(std::size_t index) const {
    return qobject_cast<VelmarPaneController*>(panes_.at(index));
}

VelmarPaneController* NavigationController::topPane() const {
    return qobject_cast<VelmarPaneController*>(topScreen());
}

QRect NavigationController::paneArea() const {
    return area_->rect();
}

void NavigationController::setRootPane(NavigationScreen* pane) {
    finishAnimation();
    pane->setParent(area_);
    panes_.assign(1, pane);
    pane->viewWillAppear();
    if (willShow_) {
        willShow_(*pane);
    }
    pane->setGeometry(paneArea());
    pane->show();
    pane->setFocus();
    updateTitleBar();
}

void NavigationController::pushPane(NavigationScreen* pane, bool animated) {
    finishAnimation();
    NavigationScreen* outgoing = topScreen();
    if (outgoing != nullptr) {
        outgoing->viewWillDisappear();
    }
    pane->setParent(area_);
    panes_.push_back(pane);
    pane->viewWillAppear();
    if (willShow_) {
        willShow_(*pane);
    }
    updateTitleBar();
    transition(pane, outgoing, true, animated, {});
}

void NavigationController::popPane(bool animated) {
    if (panes_.size() > 1) {
        popToPane(panes_.size() - 2, animated);
    }
}

void NavigationController::popToPane(std::size_t index, bool animated) {
    if (index + 1 >= panes_.size()) {
        return;
    }
    finishAnimation();
    NavigationScreen* outgoing = topScreen();
    outgoing->viewWillDisappear();
    std::vector<NavigationScreen*> discarded(panes_.begin() + static_cast<std::ptrdiff_t>(index) + 1,
                                             panes_.end());
    panes_.resize(index + 1);
    NavigationScreen* incoming = topScreen();
    incoming->viewWillAppear();
    if (willShow_) {
        willShow_(*incoming);
    }
    updateTitleBar();
    transition(incoming, outgoing, false, animated, std::move(discarded));
}

void NavigationController::transition(NavigationScreen* incoming, NavigationScreen* outgoing, bool forward,
                                      bool animated, std::vector<NavigationScreen*> discarded) {
    const QRect area = paneArea();
    const int width = area.width();
    incoming->setGeometry(area);
    incoming->show();
    incoming->setFocus();
    auto finish = [outgoing, discarded, area] {
        if (outgoing != nullptr) {
            outgoing->hide();
            outgoing->setGeometry(area);
        }
        for (NavigationScreen* pane : discarded) {
            pane->hide();
            pane->deleteLater();
        }
    };
    if (!animated || outgoing == nullptr || width <= 0) {
        incoming->move(0, 0);
        finish();
        return;
    }
    // Push: the new pane slides in from the right over the old one, which drifts a third to the left.
    // Pop: the reverse.
    if (forward) {
        incoming->raise();
    } else {
        outgoing->raise();
    }
    auto place = [incoming, outgoing, forward, width](double progress) {
        if (forward) {
            incoming->move(static_cast<int>(width * (1.0 - progress)), 0);
            outgoing->move(static_cast<int>(-width / 3.0 * progress), 0);
        } else {
            outgoing->move(static_cast<int>(width * progress), 0);
            incoming->move(static_cast<int>(-width / 3.0 * (1.0 - progress)), 0);
        }
    };
    place(0.0);
    finishTransition_ = [place, finish] {
        place(1.0);
        finish();
    };
    animation_ = new QVariantAnimation(this);
    animation_->setStartValue(0.0);
    animation_->setEndValue(1.0);
    animation_->setDuration(kAnimationMilliseconds);
    animation_->setEasingCurve(QEasingCurve::OutCubic);
    connect(animation_, &QVariantAnimation::valueChanged, this,
            [place](const QVariant& value) { place(value.toDouble()); });
    connect(animation_, &QVariantAnimation::finished, this, [this] { finishAnimation(); });
    animation_->start();
}

void NavigationController::finishAnimation() {
    if (animation_ == nullptr) {
        return;
    }
    QVariantAnimation* animation = animation_;
    animation_ = nullptr;
    animation->disconnect(this);
    animation->stop();
    animation->deleteLater();
    if (finishTransition_) {
        auto finish = std::move(finishTransition_);
        finishTransition_ = nullptr;
        finish();
    }
}

void NavigationController::paneTitleChanged(NavigationScreen* pane) {
    const std::size_t count = panes_.size();
    if ((count >= 1 && panes_[count - 1] == pane) || (count >= 2 && panes_[count - 2] == pane)) {
        updateTitleBar();
    }
}

void NavigationController::updateTitleBar() {
    NavigationScreen* top = topScreen();
    const bool canGoBack = panes_.size() > 1;
    back_->setVisible(canGoBack);
    static_cast<TitleBar*>(bar_)->setTitles(top ? top->title() : QString(),
                                            canGoBack ? panes_[panes_.size() - 2]->title() : QString());
}

bool NavigationController::eventFilter(QObject* watched, QEvent* event) {
    if (watched == area_ && event->type() == QEvent::Resize) {
        finishAnimation();
        if (NavigationScreen* top = topScreen()) {
            top->setGeometry(paneArea());
        }
    }
    return QWidget::eventFilter(watched, event);
}

void NavigationController::keyPressEvent(QKeyEvent* event) {
    const bool back = event->key() == Qt::Key_Escape || event->key() == Qt::Key_Backspace ||
                      event->key() == Qt::Key_Left || event->key() == Qt::Key_Back;
    if (back && panes_.size() > 1) {
        popPane(true);
        event->accept();
        return;
    }
    QWidget::keyPressEvent(event);
}

}  // namespace velmar
