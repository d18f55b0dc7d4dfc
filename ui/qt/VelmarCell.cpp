#include "ui/qt/VelmarCell.h"

#include <QApplication>
#include <QFontMetrics>
#include <QScrollBar>
#include <QScroller>

namespace velmar {

const CellMetrics VelmarCell::kMetrics{10, 50, 50};

namespace {

QLabel* makeLabel(QWidget* parent, const QFont& font) {
    auto* label = new QLabel(parent);
    label->setFont(font);
    label->setAlignment(Qt::AlignLeft | Qt::AlignVCenter);
    label->setTextFormat(Qt::PlainText);
    label->setAttribute(Qt::WA_TransparentForMouseEvents);
    QPalette palette = label->palette();
    palette.setColor(QPalette::WindowText, Qt::black);
    label->setPalette(palette);
    return label;
}

QRect toQRect(const CellRect& rect) {
    return {rect.x, rect.y, rect.width, rect.height};
}

}  // namespace

QFont VelmarCell::keyFont() {
    QFont font = QApplication::font();
    font.setPixelSize(15);
    font.setBold(true);
    return font;
}

QFont VelmarCell::valueFont() {
    QFont font = QApplication::font();
    font.setPixelSize(15);
    font.setBold(false);
    return font;
}

CellSize VelmarCell::measure(const QString& text) {
    const QFontMetrics metrics(keyFont());
    return {metrics.horizontalAdvance(text), metrics.height()};
}

VelmarCell* VelmarCell::initWithStyleKey(const QString& reuseIdentifier) {
    return new VelmarCell(Kind::KeyOnly, reuseIdentifier);
}

VelmarCell* VelmarCell::initWithStyle(const QString& reuseIdentifier) {
    return new VelmarCell(Kind::KeyValue, reuseIdentifier);
}

VelmarCell::VelmarCell(Kind kind, const QString& reuseIdentifier)
    : TableViewCell(reuseIdentifier), kind_(kind) {
    if (kind == Kind::KeyOnly) {
        key_ = makeLabel(this, keyFont());
        return;
    }
    view_ = new QScrollArea(this);
    view_->setFrameShape(QFrame::NoFrame);
    view_->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    view_->setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    view_->setWidgetResizable(false);
    view_->setFocusPolicy(Qt::NoFocus);
    view_->viewport()->setAutoFillBackground(false);
    view_->setAutoFillBackground(false);
    content_ = new QWidget;
    content_->setAutoFillBackground(false);
    content_->setAttribute(Qt::WA_TransparentForMouseEvents);
    view_->setWidget(content_);
    content_->setAutoFillBackground(false);
    key_ = makeLabel(content_, keyFont());
    value_ = makeLabel(content_, valueFont());
    // Touch screens swipe a long row sideways; the list itself scrolls with mouse drags and touch.
    QScroller::grabGesture(view_->viewport(), QScroller::TouchGesture);
    QScrollerProperties properties = QScroller::scroller(view_->viewport())->scrollerProperties();
    properties.setScrollMetric(QScrollerProperties::VerticalOvershootPolicy,
                               QVariant::fromValue(QScrollerProperties::OvershootAlwaysOff));
    QScroller::scroller(view_->viewport())->setScrollerProperties(properties);
}

void VelmarCell::setKey(const QString& text) {
    key_->setText(text);
}

void VelmarCell::setValue(const QString& text) {
    if (value_ != nullptr) {
        value_->setText(text);
    }
}

void VelmarCell::setLayoutKey() {
    layout_ = Layout::Key;
    const QRect bounds = contentBounds();
    const CellSize keySize = measure(key_->text());
    key_->setGeometry(toQRect(
        layoutKeyOnlyCell({bounds.x(), bounds.y(), bounds.width(), bounds.height()}, keySize, kMetrics)));
}

void VelmarCell::setLayout() {
    if (view_ == nullptr) {
        // A key-only cell has nothing but its key to place.
        setLayoutKey();
        layout_ = Layout::KeyValue;
        return;
    }
    layout_ = Layout::KeyValue;
    const QRect bounds = contentBounds();
    const KeyValueCellLayout layout =
        layoutKeyValueCell({bounds.x(), bounds.y(), bounds.width(), bounds.height()}, measure(key_->text()),
                           measure(value_->text()), kMetrics);
    key_->setGeometry(toQRect(layout.key));
    value_->setGeometry(toQRect(layout.value));
    content_->resize(layout.contentSize.width, layout.contentSize.height);
    view_->setGeometry(toQRect(layout.scrollFrame));
    if (!layout.scrolls()) {
        view_->horizontalScrollBar()->setValue(0);
    }
}

void VelmarCell::layoutSubviews() {
    switch (layout_) {
        case Layout::Key:
            setLayoutKey();
            break;
        case Layout::KeyValue:
            setLayout();
            break;
        case Layout::None:
            break;
    }
}

}  // namespace velmar
