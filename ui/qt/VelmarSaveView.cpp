#include "ui/qt/VelmarSaveView.h"

#include <QApplication>
#include <QEasingCurve>
#include <QHBoxLayout>
#include <QLabel>
#include <QMouseEvent>
#include <QPainter>
#include <QVBoxLayout>
#include <QVariantAnimation>

#include "ui/VelmarSaveViewController.h"

namespace velmar {

namespace {

const QColor kBackgroundColour(0xef, 0xef, 0xf4);
const QColor kBarColour(0xf7, 0xf7, 0xf7);
const QColor kBorderColour(0xb2, 0xb2, 0xb2);
const QColor kTintColour(0x00, 0x7a, 0xff);
constexpr int kBarHeight = 44;

QPushButton* makeBarButton(const QString& text, bool bold, QWidget* parent) {
    auto* button = new QPushButton(text, parent);
    button->setFlat(true);
    button->setCursor(Qt::PointingHandCursor);
    QFont font = QApplication::font();
    font.setPixelSize(17);
    font.setBold(bold);
    button->setFont(font);
    QPalette palette = button->palette();
    palette.setColor(QPalette::ButtonText, kTintColour);
    button->setPalette(palette);
    return button;
}

// One history row: the entry's description and a check mark.
class HistoryCell : public TableViewCell {
  public:
    explicit HistoryCell(const QString& identifier) : TableViewCell(identifier) {
        label_ = new QLabel(this);
        label_->setTextFormat(Qt::PlainText);
        label_->setAttribute(Qt::WA_TransparentForMouseEvents);
        QPalette palette = label_->palette();
        palette.setColor(QPalette::WindowText, Qt::black);
        label_->setPalette(palette);
    }
    QLabel* label() const { return label_; }

  protected:
    void layoutSubviews() override {
        const QRect bounds = contentBounds();
        label_->setGeometry(bounds.adjusted(15, 0, -4, 0));
    }

  private:
    QLabel* label_;
};

}  // namespace

QFont VelmarSaveView::historyFont() {
    QFont font(QString::fromUtf8(VelmarSaveViewController::kHistoryFontFamily));
    font.setStyleHint(QFont::SansSerif);
    font.setPixelSize(VelmarSaveViewController::kHistoryFontSize);
    return font;
}

VelmarSaveView::VelmarSaveView(VelmarSaveViewController& controller, QWidget* window)
    : QWidget(window), controller_(&controller) {
    setObjectName(QString::fromUtf8(VelmarSaveViewController::kLayoutName));
    setAttribute(Qt::WA_StyledBackground, false);

    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);

    auto* bar = new QWidget(this);
    bar->setFixedHeight(kBarHeight);
    bar->setAutoFillBackground(true);
    QPalette barPalette = bar->palette();
    barPalette.setColor(QPalette::Window, kBarColour);
    bar->setPalette(barPalette);
    auto* barLayout = new QHBoxLayout(bar);
    barLayout->setContentsMargins(6, 0, 6, 0);
    cancel_ = makeBarButton(QStringLiteral("Cancel"), false, bar);
    save_ = makeBarButton(QStringLiteral("Save"), true, bar);
    auto* title = new QLabel(QStringLiteral("Save Snapshot"), bar);
    QFont titleFont = QApplication::font();
    titleFont.setPixelSize(17);
    titleFont.setBold(true);
    title->setFont(titleFont);
    title->setAlignment(Qt::AlignCenter);
    barLayout->addWidget(cancel_);
    barLayout->addWidget(title, 1);
    barLayout->addWidget(save_);
    layout->addWidget(bar);

    auto* body = new QVBoxLayout;
    body->setContentsMargins(12, 16, 12, 12);
    body->setSpacing(6);
    auto* descriptionLabel = new QLabel(QStringLiteral("Description"), this);
    QFont sectionFont = QApplication::font();
    sectionFont.setPixelSize(13);
    descriptionLabel->setFont(sectionFont);
    body->addWidget(descriptionLabel);
    saveDescription_ = new QLineEdit(this);
    saveDescription_->setPlaceholderText(QStringLiteral("What was happening"));
    QFont fieldFont = QApplication::font();
    fieldFont.setPixelSize(17);
    saveDescription_->setFont(fieldFont);
    saveDescription_->setMinimumHeight(40);
    saveDescription_->setClearButtonEnabled(true);
    body->addWidget(saveDescription_);
    body->addSpacing(14);
    historyLabel_ = new QLabel(this);
    historyLabel_->setFont(sectionFont);
    body->addWidget(historyLabel_);
    saveContentTable_ = new TableView(this);
    saveContentTable_->setRowHeight(kHistoryRowHeight);
    saveContentTable_->setDataSource(this);
    saveContentTable_->setFocusPolicy(Qt::NoFocus);
    body->addWidget(saveContentTable_);
    body->addStretch(1);
    layout->addLayout(body, 1);

    connect(cancel_, &QPushButton::clicked, this, [this] {
        if (controller_ != nullptr) {
            controller_->cancelPressed();
        }
    });
    connect(save_, &QPushButton::clicked, this, [this] {
        if (controller_ != nullptr) {
            controller_->savePressed();
        }
    });
    connect(saveDescription_, &QLineEdit::returnPressed, this, [this] {
        if (controller_ != nullptr) {
            controller_->textFieldShouldReturn();
        }
    });

    // viewDidLoad: the delegate is set above; then the table is sized to fit its rows.
    const std::size_t rows = controller.numberOfRows();
    historyLabel_->setText(rows == 1 ? QStringLiteral("History: 1 entry")
                                     : QStringLiteral("History: %1 entries").arg(rows));
    saveContentTable_->reloadData();
    sizeTableToFit();
    controller.setView(this);
}

VelmarSaveView::~VelmarSaveView() {
    if (controller_ != nullptr) {
        controller_->setView(nullptr);
    }
}

void VelmarSaveView::sizeTableToFit() {
    const int rows = saveContentTable_->numberOfRows();
    // As tall as its rows, within what the screen leaves (it scrolls beyond that).
    const int available = std::max(kHistoryRowHeight, height() - 200);
    saveContentTable_->setFixedHeight(std::min(rows * kHistoryRowHeight, available));
    saveContentTable_->setVisible(rows > 0);
}

void VelmarSaveView::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    sizeTableToFit();
}

void VelmarSaveView::coverParent() {
    if (parentWidget() != nullptr) {
        const QRect area = parentWidget()->rect();
        if (animation_ == nullptr) {
            setGeometry(area);
        } else {
            resize(area.size());
        }
    }
}

void VelmarSaveView::present(bool animated) {
    coverParent();
    raise();
    show();
    saveDescription_->setFocus();
    if (!animated || parentWidget() == nullptr) {
        return;
    }
    const int height = parentWidget()->height();
    animation_ = new QVariantAnimation(this);
    animation_->setStartValue(height);
    animation_->setEndValue(0);
    animation_->setDuration(kAnimationMilliseconds);
    animation_->setEasingCurve(QEasingCurve::OutCubic);
    connect(animation_, &QVariantAnimation::valueChanged, this,
            [this](const QVariant& y) { move(0, y.toInt()); });
    connect(animation_, &QVariantAnimation::finished, this, [this] {
        animation_->deleteLater();
        animation_ = nullptr;
        move(0, 0);
    });
    move(0, height);
    animation_->start();
}

void VelmarSaveView::dismiss(bool animated) {
    if (controller_ != nullptr) {
        controller_->setView(nullptr);
        controller_ = nullptr;
    }
    setEnabled(false);
    if (animation_ != nullptr) {
        animation_->disconnect(this);
        animation_->stop();
        animation_->deleteLater();
        animation_ = nullptr;
    }
    if (!animated || parentWidget() == nullptr || !isVisible()) {
        hide();
        deleteLater();
        return;
    }
    animation_ = new QVariantAnimation(this);
    animation_->setStartValue(y());
    animation_->setEndValue(parentWidget()->height());
    animation_->setDuration(kAnimationMilliseconds);
    animation_->setEasingCurve(QEasingCurve::InCubic);
    connect(animation_, &QVariantAnimation::valueChanged, this,
            [this](const QVariant& y) { move(0, y.toInt()); });
    connect(animation_, &QVariantAnimation::finished, this, [this] {
        hide();
        deleteLater();
    });
    animation_->start();
}

std::string VelmarSaveView::descriptionText() const {
    return saveDescription_->text().toStdString();
}

void VelmarSaveView::resignDescriptionFocus() {
    saveDescription_->clearFocus();
}

int VelmarSaveView::numberOfRows(TableView&) {
    return controller_ != nullptr ? static_cast<int>(controller_->numberOfRows()) : 0;
}

TableViewCell* VelmarSaveView::cellForRow(TableView& table, int row) {
    const QString identifier = QString::fromUtf8(VelmarSaveViewController::kHistoryCellIdentifier);
    auto* cell = static_cast<HistoryCell*>(table.dequeueReusableCell(identifier));
    if (cell == nullptr) {
        cell = new HistoryCell(identifier);
    }
    const QString text = controller_ != nullptr
                             ? QString::fromStdString(controller_->rowText(static_cast<std::size_t>(row)))
                             : QString();
    cell->label()->setText(text);
    cell->label()->setFont(historyFont());
    cell->setAccessory(TableViewCell::Accessory::Checkmark);
    return cell;
}

void VelmarSaveView::didSelectRow(TableView&, int row) {
    if (controller_ != nullptr) {
        controller_->didSelectRow(static_cast<std::size_t>(row));
    }
}

void VelmarSaveView::mousePressEvent(QMouseEvent* event) {
    // The background control: a click anywhere that no control takes.
    if (controller_ != nullptr) {
        controller_->backgroundTouched();
    }
    event->accept();
}

void VelmarSaveView::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.fillRect(rect(), kBackgroundColour);
    painter.fillRect(QRect(0, kBarHeight - 1, width(), 1), kBorderColour);
}

}  // namespace velmar
