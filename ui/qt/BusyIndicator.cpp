#include "ui/qt/BusyIndicator.h"

#include <QPainter>
#include <QTimerEvent>

namespace velmar {

namespace {
constexpr int kSpokes = 12;
constexpr int kFrameMilliseconds = 83;  // one turn per second
}  // namespace

BusyIndicator::BusyIndicator(QWidget* parent) : QWidget(parent) {
    setFixedSize(20, 20);
    setAttribute(Qt::WA_TranslucentBackground);
    setVisible(false);
}

void BusyIndicator::startAnimating() {
    if (!timer_.isActive()) {
        timer_.start(kFrameMilliseconds, this);
    }
    setVisible(true);
}

void BusyIndicator::stopAnimating() {
    timer_.stop();
    if (hidesWhenStopped_) {
        setVisible(false);
    }
    update();
}

void BusyIndicator::setHidesWhenStopped(bool hides) {
    hidesWhenStopped_ = hides;
    if (!isAnimating()) {
        setVisible(!hides);
    }
}

void BusyIndicator::timerEvent(QTimerEvent* event) {
    if (event->timerId() == timer_.timerId()) {
        phase_ = (phase_ + 1) % kSpokes;
        update();
    }
}

void BusyIndicator::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.translate(width() / 2.0, height() / 2.0);
    const qreal outer = qMin(width(), height()) / 2.0 - 1.0;
    const qreal inner = outer * 0.45;
    for (int spoke = 0; spoke < kSpokes; ++spoke) {
        // The spoke at the phase is darkest; the ones behind it fade.
        const int age = (phase_ - spoke + kSpokes) % kSpokes;
        QColor colour(0x80, 0x80, 0x80);
        colour.setAlphaF(isAnimating() ? 1.0 - age * (0.8 / kSpokes) : 0.5);
        painter.setPen(QPen(colour, 2.0, Qt::SolidLine, Qt::RoundCap));
        painter.save();
        painter.rotate(spoke * 360.0 / kSpokes);
        painter.drawLine(QPointF(0, -inner), QPointF(0, -outer));
        painter.restore();
    }
}

}  // namespace velmar
