#include "ui/qt/TableView.h"

#include <QGuiApplication>
#include <QKeyEvent>
#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>
#include <QScrollBar>
#include <QScroller>
#include <QStyleHints>
#include <algorithm>

namespace velmar {

namespace {
const QColor kSeparatorColour(0xc8, 0xc7, 0xcc);
const QColor kSelectedColour(0xd9, 0xd9, 0xd9);
const QColor kChevronColour(0xc7, 0xc7, 0xcc);
const QColor kCheckColour(0x00, 0x7a, 0xff);
constexpr int kSeparatorInset = 10;
}  // namespace

TableViewCell::TableViewCell(QString reuseIdentifier, QWidget* parent)
    : QWidget(parent), reuseIdentifier_(std::move(reuseIdentifier)) {
    // A new cell starts at the width of a phone's table; the table gives it its real width before it shows.
    resize(320, 50);
}

void TableViewCell::setAccessory(Accessory accessory) {
    if (accessory_ != accessory) {
        accessory_ = accessory;
        update();
    }
}

void TableViewCell::setSelected(bool selected) {
    if (selected_ != selected) {
        selected_ = selected;
        update();
    }
}

QRect TableViewCell::contentBounds() const {
    const int reserved = accessory_ == Accessory::None ? kRightInset : kAccessoryWidth;
    return {0, 0, std::max(0, width() - reserved), height()};
}

void TableViewCell::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    layoutSubviews();
}

void TableViewCell::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.fillRect(rect(), selected_ || pressed_ ? kSelectedColour : QColor(Qt::white));
    painter.fillRect(QRect(kSeparatorInset, height() - 1, width() - kSeparatorInset, 1), kSeparatorColour);
    if (accessory_ == Accessory::None) {
        return;
    }
    painter.setRenderHint(QPainter::Antialiasing);
    const QPointF centre(width() - kAccessoryWidth / 2.0, height() / 2.0);
    if (accessory_ == Accessory::DisclosureIndicator) {
        painter.setPen(QPen(kChevronColour, 2.5, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
        QPainterPath chevron;
        chevron.moveTo(centre + QPointF(-3, -6));
        chevron.lineTo(centre + QPointF(3, 0));
        chevron.lineTo(centre + QPointF(-3, 6));
        painter.drawPath(chevron);
    } else {
        painter.setPen(QPen(kCheckColour, 2.5, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
        QPainterPath check;
        check.moveTo(centre + QPointF(-6, 0));
        check.lineTo(centre + QPointF(-2, 5));
        check.lineTo(centre + QPointF(6, -6));
        painter.drawPath(check);
    }
}

void TableViewCell::mousePressEvent(QMouseEvent* event) {
    if (event->button() == Qt::LeftButton) {
        pressed_ = true;
        longPressed_ = false;
        pressPosition_ = event->position().toPoint();
        pressScroll_ = table_ != nullptr ? table_->scrollPosition() : 0;
        longPressTimer_.start(QGuiApplication::styleHints()->mousePressAndHoldInterval(), this);
        update();
        event->accept();
        return;
    }
    if (event->button() == Qt::RightButton && table_ != nullptr) {
        event->accept();
        table_->cellLongPressed(this);
        return;
    }
    QWidget::mousePressEvent(event);
}

void TableViewCell::mouseMoveEvent(QMouseEvent* event) {
    if (longPressTimer_.isActive() && (event->position().toPoint() - pressPosition_).manhattanLength() >
                                          QGuiApplication::styleHints()->startDragDistance()) {
        longPressTimer_.stop();  // a drag, not a press
    }
    QWidget::mouseMoveEvent(event);
}

void TableViewCell::timerEvent(QTimerEvent* event) {
    if (event->timerId() != longPressTimer_.timerId()) {
        QWidget::timerEvent(event);
        return;
    }
    longPressTimer_.stop();
    if (!pressed_ || table_ == nullptr || table_->scrollPosition() != pressScroll_) {
        return;  // the finger scrolled the list meanwhile
    }
    pressed_ = false;
    longPressed_ = true;
    update();
    table_->cellLongPressed(this);
}

void TableViewCell::cancelPress() {
    pressed_ = false;
    longPressed_ = false;
    longPressTimer_.stop();
}

void TableViewCell::mouseReleaseEvent(QMouseEvent* event) {
    longPressTimer_.stop();
    if (event->button() == Qt::LeftButton && longPressed_) {
        longPressed_ = false;
        event->accept();
        return;  // the end of a long press is no tap
    }
    if (event->button() != Qt::LeftButton || !pressed_) {
        QWidget::mouseReleaseEvent(event);
        return;
    }
    pressed_ = false;
    update();
    event->accept();
    // A drag that turned into scrolling ends outside the cell (or is never delivered): no tap.
    if (rect().contains(event->position().toPoint()) && table_ != nullptr) {
        table_->cellTapped(this);
    }
}

TableView::TableView(QWidget* parent) : QAbstractScrollArea(parent) {
    setFrameShape(QFrame::NoFrame);
    setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    setVerticalScrollBarPolicy(Qt::ScrollBarAsNeeded);
    setFocusPolicy(Qt::StrongFocus);
    viewport()->setAutoFillBackground(true);
    QPalette palette = viewport()->palette();
    palette.setColor(QPalette::Base, Qt::white);
    palette.setColor(QPalette::Window, Qt::white);
    viewport()->setPalette(palette);
    verticalScrollBar()->setSingleStep(rowHeight_ / 2);
    QScroller::grabGesture(viewport(), QScroller::LeftMouseButtonGesture);
    QScrollerProperties properties = QScroller::scroller(viewport())->scrollerProperties();
    properties.setScrollMetric(QScrollerProperties::HorizontalOvershootPolicy,
                               QVariant::fromValue(QScrollerProperties::OvershootAlwaysOff));
    QScroller::scroller(viewport())->setScrollerProperties(properties);
}

TableView::~TableView() {
    QScroller::ungrabGesture(viewport());
}

void TableView::setRowHeight(int height) {
    rowHeight_ = std::max(1, height);
    verticalScrollBar()->setSingleStep(rowHeight_ / 2);
    updateScrollRange();
    layoutCells();
}

void TableView::updateScrollRange() {
    const int contentHeight = rows_ * rowHeight_;
    QScrollBar* bar = verticalScrollBar();
    bar->setPageStep(viewport()->height());
    bar->setRange(0, std::max(0, contentHeight - viewport()->height()));
}

void TableView::enqueue(TableViewCell* cell) {
    reuseQueue_.push_back(cell);
}

TableViewCell* TableView::dequeueReusableCell(const QString& identifier) {
    const auto found = std::find_if(reuseQueue_.begin(), reuseQueue_.end(), [&](TableViewCell* cell) {
        return cell->reuseIdentifier() == identifier;
    });
    if (found == reuseQueue_.end()) {
        return nullptr;
    }
    TableViewCell* cell = *found;
    reuseQueue_.erase(found);
    return cell;
}

void TableView::reloadData() {
    rows_ = dataSource_ ? std::max(0, dataSource_->numberOfRows(*this)) : 0;
    if (selectedRow_ >= rows_) {
        selectedRow_ = -1;
    }
    // The cells on screen go to the front of the queue in row order, so that each row gets its own back.
    std::vector<TableViewCell*> handedBack;
    for (const auto& [row, cell] : visible_) {
        handedBack.push_back(cell);
    }
    visible_.clear();
    reuseQueue_.insert(reuseQueue_.begin(), handedBack.begin(), handedBack.end());
    updateScrollRange();
    layoutCells();
}

TableViewCell* TableView::cellForRow(int row) const {
    const auto found = visible_.find(row);
    return found == visible_.end() ? nullptr : found->second;
}

int TableView::rowForCell(const TableViewCell* cell) const {
    for (const auto& [row, visibleCell] : visible_) {
        if (visibleCell == cell) {
            return row;
        }
    }
    return -1;
}

int TableView::rowAt(const QPoint& viewportPoint) const {
    if (viewportPoint.y() < 0) {
        return -1;
    }
    const int row = (viewportPoint.y() + verticalScrollBar()->value()) / rowHeight_;
    return row < rows_ ? row : -1;
}

QRect TableView::rectForRow(int row) const {
    return {0, row * rowHeight_ - verticalScrollBar()->value(), viewport()->width(), rowHeight_};
}

void TableView::layoutCells() {
    if (layingOut_ || dataSource_ == nullptr) {
        return;
    }
    layingOut_ = true;
    const int offset = verticalScrollBar()->value();
    const int first = offset / rowHeight_;
    const int last =
        rows_ == 0 ? -1 : std::min(rows_ - 1, (offset + std::max(1, viewport()->height()) - 1) / rowHeight_);
    for (auto it = visible_.begin(); it != visible_.end();) {
        if (it->first < first || it->first > last) {
            enqueue(it->second);
            it = visible_.erase(it);
        } else {
            ++it;
        }
    }
    for (int row = first; row <= last; ++row) {
        TableViewCell* cell = cellForRow(row);
        if (cell == nullptr) {
            // Placed before the data source lays it out, so the cell measures against its real width.
            cell = dataSource_->cellForRow(*this, row);
            if (cell == nullptr) {
                continue;
            }
            if (cell->parentWidget() != viewport()) {
                cell->setParent(viewport());
            }
            cell->table_ = this;
            visible_[row] = cell;
        }
        cell->setGeometry(rectForRow(row));
        cell->setSelected(row == selectedRow_);
        cell->show();
    }
    for (TableViewCell* cell : reuseQueue_) {
        if (cell->isVisible()) {
            cell->hide();
        }
        cell->cancelPress();
    }
    layingOut_ = false;
}

void TableView::scrollContentsBy(int, int) {
    layoutCells();
}

void TableView::resizeEvent(QResizeEvent* event) {
    QAbstractScrollArea::resizeEvent(event);
    updateScrollRange();
    layoutCells();
}

bool TableView::viewportEvent(QEvent* event) {
    return QAbstractScrollArea::viewportEvent(event);
}

void TableView::selectRow(int row) {
    if (row < 0 || row >= rows_) {
        return;
    }
    if (TableViewCell* previous = cellForRow(selectedRow_)) {
        previous->setSelected(false);
    }
    selectedRow_ = row;
    if (TableViewCell* cell = cellForRow(row)) {
        cell->setSelected(true);
    }
}

void TableView::deselectRow(int row) {
    if (row != selectedRow_ || row < 0) {
        return;
    }
    if (TableViewCell* cell = cellForRow(row)) {
        cell->setSelected(false);
    }
    selectedRow_ = -1;
}

void TableView::scrollToRow(int row) {
    if (row < 0 || row >= rows_) {
        return;
    }
    QScrollBar* bar = verticalScrollBar();
    const int top = row * rowHeight_;
    if (top < bar->value()) {
        bar->setValue(top);
    } else if (top + rowHeight_ > bar->value() + viewport()->height()) {
        bar->setValue(top + rowHeight_ - viewport()->height());
    }
}

void TableView::activateRow(int row) {
    if (row < 0 || row >= rows_) {
        return;
    }
    selectRow(row);
    if (dataSource_ != nullptr) {
        dataSource_->didSelectRow(*this, row);
    }
}

void TableView::longPressRow(int row) {
    if (row < 0 || row >= rows_ || dataSource_ == nullptr) {
        return;
    }
    dataSource_->didLongPressRow(*this, row);
}

void TableView::cellTapped(TableViewCell* cell) {
    activateRow(rowForCell(cell));
}

void TableView::cellLongPressed(TableViewCell* cell) {
    longPressRow(rowForCell(cell));
}

int TableView::scrollPosition() const {
    return verticalScrollBar()->value();
}

void TableView::keyPressEvent(QKeyEvent* event) {
    // Keys this list does not use (← Backspace Esc among them) go on to the navigation stack.
    if (rows_ == 0) {
        event->ignore();
        return;
    }
    const int page = std::max(1, viewport()->height() / rowHeight_ - 1);
    const int current = selectedRow_ >= 0 ? selectedRow_ : -1;
    int target = -2;
    switch (event->key()) {
        case Qt::Key_Up:
            target = current < 0 ? verticalScrollBar()->value() / rowHeight_ : current - 1;
            break;
        case Qt::Key_Down:
            target = current < 0 ? verticalScrollBar()->value() / rowHeight_ : current + 1;
            break;
        case Qt::Key_PageUp:
            target = std::max(0, current - page);
            break;
        case Qt::Key_PageDown:
            target = current < 0 ? page : current + page;
            break;
        case Qt::Key_Home:
            target = 0;
            break;
        case Qt::Key_End:
            target = rows_ - 1;
            break;
        case Qt::Key_Return:
        case Qt::Key_Enter:
        case Qt::Key_Right:
            if (current >= 0) {
                activateRow(current);
                event->accept();
                return;
            }
            break;
        case Qt::Key_Menu:
            if (current >= 0) {
                longPressRow(current);
                event->accept();
                return;
            }
            break;
        default:
            break;
    }
    if (target == -2) {
        event->ignore();
        return;
    }
    target = std::clamp(target, 0, rows_ - 1);
    selectRow(target);
    scrollToRow(target);
    event->accept();
}

}  // namespace velmar
