// VelmarCell: a pane's row. A key-only cell (for inner nodes) holds the key label; a key/value cell (for
// leaves) holds the key and value labels inside a horizontally scrollable view, so that a long pair scrolls
// sideways within its row.
//
// Contract: the key is drawn in the bold system font of 15 pixels, the value in the regular one. setLayoutKey
// and setLayout place the labels by the CellLayout rules (margin 10, gap 50, scroll view height 50),
// measuring both texts in the bold font, and the cell keeps to the layout it was last given when it is
// resized. A cell keeps the kind it was made as: a key-only cell has no value label and no scroll view, so a
// value given to it is not shown.
#pragma once

#include <QFont>
#include <QLabel>
#include <QScrollArea>

#include "ui/CellLayout.h"
#include "ui/qt/TableView.h"

namespace velmar {

class VelmarCell : public TableViewCell {
    Q_OBJECT

  public:
    enum class Kind { KeyOnly, KeyValue };
    static const CellMetrics kMetrics;

    // initWithStyleKey: a key-only cell.
    static VelmarCell* initWithStyleKey(const QString& reuseIdentifier);
    // initWithStyle: a key/value cell.
    static VelmarCell* initWithStyle(const QString& reuseIdentifier);

    Kind kind() const { return kind_; }
    QString key() const { return key_->text(); }
    void setKey(const QString& text);
    // Empty for a key-only cell.
    QString value() const { return value_ ? value_->text() : QString(); }
    void setValue(const QString& text);

    void setLayoutKey();
    void setLayout();

    QLabel* keyLabel() const { return key_; }
    QLabel* valueLabel() const { return value_; }
    QScrollArea* view() const { return view_; }

    static QFont keyFont();
    static QFont valueFont();
    // A text's size in the bold key font, as the layout measures it.
    static CellSize measure(const QString& text);

  protected:
    void layoutSubviews() override;

  private:
    VelmarCell(Kind kind, const QString& reuseIdentifier);
    enum class Layout { None, Key, KeyValue };

    Kind kind_;
    Layout layout_ = Layout::None;
    QLabel* key_ = nullptr;
    QLabel* value_ = nullptr;
    QScrollArea* view_ = nullptr;
    QWidget* content_ = nullptr;
};

}  // namespace velmar
