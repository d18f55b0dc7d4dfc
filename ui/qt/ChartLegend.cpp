#include "ui/qt/ChartLegend.h"

#include <QApplication>
#include <QPainter>
#include <algorithm>

namespace velmar {

namespace {

constexpr int kSwatch = 12;
constexpr int kEntryHeight = 30;

// One legend entry: a swatch and a text, left-aligned, cut at the end when the column is narrow.
class LegendButton : public QAbstractButton {
  public:
    explicit LegendButton(QWidget* parent) : QAbstractButton(parent) {
        setFocusPolicy(Qt::NoFocus);
        setCursor(Qt::PointingHandCursor);
        setMinimumHeight(kEntryHeight);
        QFont font = QApplication::font();
        font.setPixelSize(12);
        setFont(font);
    }
    void setEntry(const ChartLegend::Entry& entry) {
        if (entry.name == text() && entry.value == value_ && entry.colour == colour_ &&
            entry.shown == shown_) {
            return;
        }
        setText(entry.name);
        value_ = entry.value;
        setToolTip(entry.name + QStringLiteral("  ") + entry.value);
        colour_ = entry.colour;
        shown_ = entry.shown;
        update();
    }
    bool shown() const { return shown_; }
    QSize sizeHint() const override { return {ChartLegend::kEntryWidth, kEntryHeight}; }

  protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.setRenderHint(QPainter::Antialiasing);
        if (isDown()) {
            painter.fillRect(rect(), QColor(0xd9, 0xd9, 0xd9));
        }
        const QRectF swatch(8, (height() - kSwatch) / 2.0, kSwatch, kSwatch);
        painter.setPen(QPen(colour_, 2));
        painter.setBrush(shown_ ? QBrush(colour_) : Qt::NoBrush);
        painter.drawRoundedRect(swatch.adjusted(1, 1, -1, -1), 2, 2);
        QColor ink(0x22, 0x22, 0x22);
        if (!shown_) {
            ink = QColor(0xa0, 0xa0, 0xa0);
        }
        painter.setPen(ink);
        const int left = 8 + kSwatch + 6;
        const int right = width() - 8;
        const int valueWidth = std::min(fontMetrics().horizontalAdvance(value_), std::max(0, right - left));
        painter.drawText(QRect(right - valueWidth, 0, valueWidth, height()),
                         Qt::AlignVCenter | Qt::AlignRight, value_);
        const int nameWidth = std::max(0, right - valueWidth - 6 - left);
        QFont bold = font();
        bold.setBold(true);
        painter.setFont(bold);
        painter.drawText(QRect(left, 0, nameWidth, height()), Qt::AlignVCenter | Qt::AlignLeft,
                         QFontMetrics(bold).elidedText(text(), Qt::ElideMiddle, nameWidth));
    }

  private:
    QString value_;
    QColor colour_;
    bool shown_ = true;
};

}  // namespace

ChartLegend::ChartLegend(QWidget* parent) : QWidget(parent) {
    grid_ = new QGridLayout(this);
    grid_->setContentsMargins(4, 2, 4, 2);
    grid_->setHorizontalSpacing(0);
    grid_->setVerticalSpacing(0);
}

void ChartLegend::setEntries(const std::vector<Entry>& entries) {
    if (entries.size() != buttons_.size()) {
        for (QAbstractButton* button : buttons_) {
            delete button;
        }
        buttons_.clear();
        for (std::size_t i = 0; i < entries.size(); ++i) {
            auto* button = new LegendButton(this);
            connect(button, &QAbstractButton::clicked, this,
                    [this, i] { emit toggled(static_cast<int>(i)); });
            buttons_.push_back(button);
        }
        columns_ = 0;
        relayout();
    }
    for (std::size_t i = 0; i < entries.size(); ++i) {
        static_cast<LegendButton*>(buttons_[i])->setEntry(entries[i]);
    }
}

int ChartLegend::heightForWidth(int width) const {
    const int columns = std::max(1, width / kEntryWidth);
    const int rows = (static_cast<int>(buttons_.size()) + columns - 1) / columns;
    const QMargins margins = grid_->contentsMargins();
    return rows * kEntryHeight + margins.top() + margins.bottom();
}

void ChartLegend::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    relayout();
}

void ChartLegend::relayout() {
    const int columns = std::max(1, width() / kEntryWidth);
    if (columns == columns_) {
        return;
    }
    columns_ = columns;
    for (QAbstractButton* button : buttons_) {
        grid_->removeWidget(button);
    }
    for (std::size_t i = 0; i < buttons_.size(); ++i) {
        grid_->addWidget(buttons_[i], static_cast<int>(i) / columns, static_cast<int>(i) % columns);
    }
    for (int column = 0; column < grid_->columnCount(); ++column) {
        grid_->setColumnStretch(column, column < columns ? 1 : 0);
    }
}

}  // namespace velmar
