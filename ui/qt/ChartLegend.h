// ChartLegend: the legend of a chart: one entry per line (a swatch of the line's colour, the leaf's name and
// its value), in as many columns as the width allows (fewer where that shows every name whole at the cost of
// a row or two), each a button that a tap or click toggles. The value stands whole at the entry's right; a
// name too long for what is left is cut in its middle, so that names that differ only at their end
// ("Measured RSRP", "Measured RSRQ") stay apart.
//
// Contract: setEntries shows the entries; the same number of entries updates the buttons in place (no
// flicker at each redraw), another number rebuilds them. A hidden line's entry is drawn faint with a hollow
// swatch. Tapping an entry emits toggled with its index; the owner shows or hides the line and gives the
// legend its new state.
#pragma once

#include <QAbstractButton>
#include <QGridLayout>
#include <QWidget>
#include <vector>

namespace velmar {

class ChartLegend : public QWidget {
    Q_OBJECT

  public:
    struct Entry {
        QString name;
        QString value;
        QColor colour;
        bool shown = true;
    };
    static constexpr int kEntryWidth = 190;

    explicit ChartLegend(QWidget* parent = nullptr);

    void setEntries(const std::vector<Entry>& entries);
    int entryCount() const { return static_cast<int>(buttons_.size()); }
    QAbstractButton* entry(int index) const { return buttons_.at(static_cast<std::size_t>(index)); }
    int columns() const { return columns_; }
    // The width the widest entry needs to show its name whole beside the widest value it has shown.
    int widestEntryWidth() const;
    // The height that shows every entry at a width.
    int heightForWidth(int width) const override;
    bool hasHeightForWidth() const override { return true; }

  signals:
    void toggled(int index);

  protected:
    void resizeEvent(QResizeEvent* event) override;

  private:
    // As many columns as the width holds (no more than entries), fewer where that shows every name whole.
    int columnsForWidth(int width) const;
    void relayout();

    QGridLayout* grid_;
    std::vector<QAbstractButton*> buttons_;
    int columns_ = 0;
};

}  // namespace velmar
