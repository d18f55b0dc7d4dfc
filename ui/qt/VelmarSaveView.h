// VelmarSaveView: the save screen on screen: a bar with Cancel and Save, the description field and the
// history table (one row per entry, in Helvetica 13 or the nearest font, each with a check mark). It covers
// the window and forwards every action to the toolkit-free VelmarSaveViewController.
//
// Contract: present() slides the screen up over the panes; dismiss() detaches it from the controller at once
// (the controller is released right after) and slides it away, deleting it at the end. Return in the field,
// a click on the background and a click on a history row take the keyboard focus off the field.
#pragma once

#include <QLineEdit>
#include <QPushButton>
#include <QWidget>

#include "ui/SaveScreenPresenter.h"
#include "ui/qt/TableView.h"

class QLabel;
class QVariantAnimation;

namespace velmar {

class VelmarSaveView : public QWidget, public SaveScreenView, public TableViewDataSource {
    Q_OBJECT

  public:
    static constexpr int kAnimationMilliseconds = 300;
    static constexpr int kHistoryRowHeight = 44;

    VelmarSaveView(VelmarSaveViewController& controller, QWidget* window);
    ~VelmarSaveView() override;

    void present(bool animated);
    void dismiss(bool animated);
    void coverParent();

    std::string descriptionText() const override;
    void resignDescriptionFocus() override;

    int numberOfRows(TableView& table) override;
    TableViewCell* cellForRow(TableView& table, int row) override;
    void didSelectRow(TableView& table, int row) override;

    QLineEdit* descriptionField() const { return saveDescription_; }
    TableView* historyTable() const { return saveContentTable_; }
    QPushButton* saveButton() const { return save_; }
    QPushButton* cancelButton() const { return cancel_; }
    static QFont historyFont();

  protected:
    void mousePressEvent(QMouseEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;

  private:
    void sizeTableToFit();

    VelmarSaveViewController* controller_;
    QPushButton* cancel_;
    QPushButton* save_;
    QLineEdit* saveDescription_;
    QLabel* historyLabel_;
    TableView* saveContentTable_;
    QVariantAnimation* animation_ = nullptr;
};

}  // namespace velmar
