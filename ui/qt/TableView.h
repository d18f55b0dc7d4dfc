// TableView: a one-section list of fixed-height rows built from reusable cell widgets, for touch and
// keyboard.
//
// Contract: the data source answers the number of rows and configures a cell for a row; it takes a cell from
// dequeueReusableCell (cells that left the screen or were handed back by reloadData) or makes a new one.
// Only the rows on screen have cells. reloadData hands back every cell on screen, in row order, and asks
// again for each visible row, so a row usually gets back the very cell it had (nothing moves, nothing
// flickers); which cell a row gets is otherwise the queue's business, whatever kind of cell it is. The
// scroll position is kept (clamped to the new height) and so is the selected row while it exists. A tap on a
// row, or Enter / Return / → on the selected row, selects it and tells the data source. A long press (held
// for the platform's press-and-hold interval without moving or scrolling), a right click, or the Menu key on
// the selected row tells the data source of a long press instead, without selecting; the release that ends
// a long press is no tap. ↑ ↓ PgUp PgDn Home End move the selection. Scrolling is kinetic (QScroller) for
// touch and mouse drags.
#pragma once

#include <QAbstractScrollArea>
#include <QBasicTimer>
#include <QString>
#include <deque>
#include <functional>
#include <map>

namespace velmar {

class TableView;

class TableViewCell : public QWidget {
    Q_OBJECT

  public:
    enum class Accessory { None, DisclosureIndicator, Checkmark };
    static constexpr int kAccessoryWidth = 34;
    // Room kept free at the right edge of a cell without an accessory, as the key's margin does on the left.
    static constexpr int kRightInset = 10;

    TableViewCell(QString reuseIdentifier, QWidget* parent = nullptr);

    const QString& reuseIdentifier() const { return reuseIdentifier_; }
    Accessory accessory() const { return accessory_; }
    void setAccessory(Accessory accessory);
    bool isSelected() const { return selected_; }
    void setSelected(bool selected);
    // The content area: the cell without the accessory's room (or the right inset), at (0, 0).
    QRect contentBounds() const;

  protected:
    // Lays the cell's own labels out again; called whenever the cell changes size.
    virtual void layoutSubviews() {}
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void timerEvent(QTimerEvent* event) override;

  private:
    friend class TableView;
    void cancelPress();

    QString reuseIdentifier_;
    Accessory accessory_ = Accessory::None;
    bool selected_ = false;
    bool pressed_ = false;
    bool longPressed_ = false;
    QBasicTimer longPressTimer_;
    QPoint pressPosition_;
    int pressScroll_ = 0;
    TableView* table_ = nullptr;
};

class TableViewDataSource {
  public:
    virtual ~TableViewDataSource() = default;
    virtual int numberOfRows(TableView& table) = 0;
    virtual TableViewCell* cellForRow(TableView& table, int row) = 0;
    virtual void didSelectRow(TableView& table, int row) { (void)table, (void)row; }
    virtual void didLongPressRow(TableView& table, int row) { (void)table, (void)row; }
};

class TableView : public QAbstractScrollArea {
    Q_OBJECT

  public:
    explicit TableView(QWidget* parent = nullptr);
    ~TableView() override;

    void setDataSource(TableViewDataSource* dataSource) { dataSource_ = dataSource; }
    void setRowHeight(int height);
    int rowHeight() const { return rowHeight_; }
    int numberOfRows() const { return rows_; }

    void reloadData();
    // A cell handed back with this identifier, now owned by the caller's row; null when there is none.
    TableViewCell* dequeueReusableCell(const QString& identifier);
    // The cell showing row, null when the row is off screen.
    TableViewCell* cellForRow(int row) const;
    // The visible row of a cell, -1 for another widget.
    int rowForCell(const TableViewCell* cell) const;
    // The row at a point of the viewport, -1 below the last row.
    int rowAt(const QPoint& viewportPoint) const;
    QRect rectForRow(int row) const;

    int selectedRow() const { return selectedRow_; }
    void selectRow(int row);
    void deselectRow(int row);
    void scrollToRow(int row);
    // Selects a row and tells the data source, as a tap does.
    void activateRow(int row);
    // Tells the data source of a long press on a row.
    void longPressRow(int row);

    // Cells created so far (to check reuse).
    int cellsOnScreen() const { return static_cast<int>(visible_.size()); }

  protected:
    void scrollContentsBy(int dx, int dy) override;
    void resizeEvent(QResizeEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    bool viewportEvent(QEvent* event) override;

  private:
    friend class TableViewCell;
    void cellTapped(TableViewCell* cell);
    void cellLongPressed(TableViewCell* cell);
    int scrollPosition() const;
    void updateScrollRange();
    void layoutCells();
    void enqueue(TableViewCell* cell);

    TableViewDataSource* dataSource_ = nullptr;
    int rowHeight_ = 50;
    int rows_ = 0;
    int selectedRow_ = -1;
    std::map<int, TableViewCell*> visible_;
    std::deque<TableViewCell*> reuseQueue_;
    bool layingOut_ = false;
};

}  // namespace velmar
