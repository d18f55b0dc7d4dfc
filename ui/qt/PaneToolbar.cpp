#include "ui/qt/PaneToolbar.h"

#include <QApplication>
#include <QHBoxLayout>
#include <QPainter>

namespace velmar {

namespace {
const QColor kBarColour(0xf7, 0xf7, 0xf7);
const QColor kBorderColour(0xb2, 0xb2, 0xb2);

// A flat text button in the tint of the title bar's back button, as on a touch screen.
QToolButton* barButton(QWidget* parent, const QString& text, const QString& name) {
    auto* button = new QToolButton(parent);
    button->setText(text);
    button->setObjectName(name);
    button->setStyleSheet(QStringLiteral("QToolButton { border: none; padding: 0 6px; color: #007aff; }"));
    button->setFocusPolicy(Qt::NoFocus);
    QFont font = QApplication::font();
    font.setPixelSize(17);
    button->setFont(font);
    button->setCursor(Qt::PointingHandCursor);
    return button;
}
}  // namespace

PaneToolbar::PaneToolbar(QWidget* parent) : QWidget(parent) {
    setFixedHeight(kHeight);
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(10, 0, 10, 0);
    layout->setSpacing(8);
    indicator_ = new BusyIndicator(this);
    layout->addWidget(indicator_);
    status_ = new QLabel(this);
    QFont font = QApplication::font();
    font.setPixelSize(14);
    status_->setFont(font);
    status_->setTextFormat(Qt::PlainText);
    status_->setAutoFillBackground(false);
    QPalette palette = status_->palette();
    palette.setColor(QPalette::WindowText, QColor(0x33, 0x33, 0x33));
    status_->setPalette(palette);
    status_->setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Preferred);
    layout->addWidget(status_);
    layout->addStretch(1);
    chartButton_ = barButton(this, QStringLiteral("Chart"), QStringLiteral("chartButton"));
    chartButton_->setVisible(false);
    connect(chartButton_, &QToolButton::clicked, this, [this] {
        if (chartAction_) {
            chartAction_();
        }
    });
    layout->addWidget(chartButton_);
}

void PaneToolbar::setChartButtonShown(bool shown) {
    if (chartButton_->isVisibleTo(this) != shown) {
        chartButton_->setVisible(shown);
    }
}

void PaneToolbar::setItems(const QString& status, bool isLoading, bool withSaveButton) {
    if (isLoading) {
        indicator_->startAnimating();
    } else {
        indicator_->stopAnimating();
    }
    if (status_->text() != status) {
        status_->setText(status);
    }
    if (withSaveButton && saveButton_ == nullptr) {
        saveButton_ = barButton(this, QStringLiteral("Save"), QStringLiteral("saveButton"));
        connect(saveButton_, &QToolButton::clicked, this, [this] {
            if (saveAction_) {
                saveAction_();
            }
        });
        static_cast<QHBoxLayout*>(layout())->addWidget(saveButton_);
    } else if (!withSaveButton && saveButton_ != nullptr) {
        delete saveButton_;
        saveButton_ = nullptr;
    }
}

void PaneToolbar::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.fillRect(rect(), kBarColour);
    painter.fillRect(QRect(0, 0, width(), 1), kBorderColour);
}

}  // namespace velmar
