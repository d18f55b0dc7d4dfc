#include "ui/qt/ChartLegend.h"

#include <QApplication>
#include <QPainter>
#include <algorithm>

namespace velmar {

namespace {

constexpr int kSwatch = 12;
constexpr int kEntryHeight = 30;
constexpr int kMargin = 8;
constexpr int kGap = 6;
constexpr int kTextLeft = kMargin + kSwatch + kGap;
// A single column that shows every name whole is preferred to more columns that cut names, unless it makes
// the legend more than this many rows taller.
constexpr int kMostExtraRowsForWholeNames = 2;

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
        widestValue_ = std::max(widestValue_, fontMetrics().horizontalAdvance(value_));
        setToolTip(entry.name + QStringLiteral("  ") + entry.value);
        colour_ = entry.colour;
        shown_ = entry.shown;
        update();
    }
    bool shown() const { return shown_; }
    QSize sizeHint() const override { return {ChartLegend::kEntryWidth, kEntryHeight}; }
    // The width that shows the name uncut beside the widest value it has shown, so that values that change
    // width at each redraw do not move the columns back and forth.
    int naturalWidth() const {
        QFont bold = font();
        bold.setBold(true);
        return kTextLeft + QFontMetrics(bold).horizontalAdvance(text()) + kGap + widestValue_ + kMargin;
    }

  protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.setRenderHint(QPainter::Antialiasing);
        if (isDown()) {
            painter.fillRect(rect(), QColor(0xd9, 0xd9, 0xd9));
        }
        const QRectF swatch(kMargin, (height() - kSwatch) / 2.0, kSwatch, kSwatch);
        painter.setPen(QPen(colour_, 2));
        painter.setBrush(shown_ ? QBrush(colour_) : Qt::NoBrush);
        painter.drawRoundedRect(swatch.adjusted(1, 1, -1, -1), 2, 2);
        QColor ink(0x22, 0x22, 0x22);
        if (!shown_) {
            ink = QColor(0xa0, 0xa0, 0xa0);
        }
        painter.setPen(ink);
        const int left = kTextLeft;
        const int right = width() - kMargin;
        const int valueWidth = std::min(fontMetrics().horizontalAdvance(value_), std::max(0, right - left));
        painter.drawText(QRect(right - valueWidth, 0, valueWidth, height()),
                         Qt::AlignVCenter | Qt::AlignRight, value_);
        const int nameWidth = std::max(0, right - valueWidth - kGap - left);
        QFont bold = font();
        bold.setBold(true);
        painter.setFont(bold);
        painter.drawText(QRect(left, 0, nameWidth, height()), Qt::AlignVCenter | Qt::AlignLeft,
                         QFontMetrics(bold).elidedText(text(), Qt::ElideMiddle, nameWidth));
    }

  private:
    QString value_;
    int widestValue_ = 0;
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
    // New names or values may fit in other columns.
    relayout();
}

int ChartLegend::widestEntryWidth() const {
    int widest = 0;
    for (QAbstractButton* button : buttons_) {
        widest = std::max(widest, static_cast<LegendButton*>(button)->naturalWidth());
    }
    return widest;
}

int ChartLegend::columnsForWidth(int width) const {
    const int entries = static_cast<int>(buttons_.size());
    const QMargins margins = grid_->contentsMargins();
    const int inner = std::max(0, width - margins.left() - margins.right());
    const int most = std::clamp(inner / kEntryWidth, 1, std::max(1, entries));
    const int widest = widestEntryWidth();
    const auto rows = [entries](int columns) { return (entries + columns - 1) / columns; };
    for (int columns = most; columns >= 1; --columns) {
        if (inner / columns >= widest) {
            return rows(columns) <= rows(most) + kMostExtraRowsForWholeNames ? columns : most;
        }
    }
    return most;
}

int ChartLegend::heightForWidth(int width) const {
    const int columns = columnsForWidth(width);
    const int rows = (static_cast<int>(buttons_.size()) + columns - 1) / columns;
    const QMargins margins = grid_->contentsMargins();
    return rows * kEntryHeight + margins.top() + margins.bottom();
}

void ChartLegend::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    relayout();
}

void ChartLegend::relayout() {
    const int columns = columnsForWidth(width());
    if (columns == columns_) {
        return;
    }
    columns_ = columns;
    updateGeometry();
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
