// VelmarSaveViewController: the snapshot save screen's logic, shared by every front end. The front end draws
// the screen (a history table, a description field, Save and Cancel) and forwards the user's actions here.
//
// Contract: the controller keeps the moment it was created as the snapshot's timestamp and a copy of the save
// contents it was given (the model's getSaveContents: an array of history entries, or none). The table has
// one section with one row per entry, showing the entry's "Description". Save writes the dictionary
// {"Timestamp", "Data", "Description"} (filled in that order, stopping at the first missing value: no save
// contents leaves "Timestamp" alone, an empty description leaves it out) as an XML property list to
// "<diagnostic-log directory>/VelmarSnapshot-<seconds since 1970>.velmar", in place; a failed write is logged
// ("Unable to write snapshot to %s") and shown as the alert "File Error" / "Unable to write file to disk"
// with a "Close" button. Save and Cancel both close the screen through the application's closeSaveView,
// queued on the main queue so that the button's own handling finishes first. Selecting a row, Return in the
// field and a tap on the background only hide the keyboard.
#pragma once

#include <memory>
#include <string>

#include "core/platform/plist/PlistValue.h"
#include "ui/SaveScreenPresenter.h"

namespace velmar {

class VelmarShell;

class VelmarSaveViewController {
  public:
    static constexpr const char* kLayoutName = "VelmarSaveViewController";
    static constexpr const char* kHistoryCellIdentifier = "SaveHistoryContentCell";
    static constexpr const char* kHistoryFontFamily = "Helvetica";
    static constexpr int kHistoryFontSize = 13;
    static constexpr const char* kFileErrorTitle = "File Error";
    static constexpr const char* kFileErrorMessage = "Unable to write file to disk";
    static constexpr const char* kFileErrorButton = "Close";

    // application: the shell that presents the screen and closes it; it outlives the controller.
    VelmarSaveViewController(const PlistValue& saveHistory, VelmarShell& application);
    VelmarSaveViewController(const VelmarSaveViewController&) = delete;
    VelmarSaveViewController& operator=(const VelmarSaveViewController&) = delete;

    // The front end's view while the screen is shown; null when it is gone.
    void setView(SaveScreenView* view) { view_ = view; }
    SaveScreenView* view() const { return view_; }

    double timeStamp() const { return _timeStamp; }
    const PlistValue& saveHistory() const { return _saveHistory; }

    int numberOfSectionsInTableView() const { return 1; }
    std::size_t numberOfRows() const;
    // The "Description" of the entry at row; empty when the entry has none that is text.
    std::string rowText(std::size_t row) const;

    void didSelectRow(std::size_t row);
    bool textFieldShouldReturn();
    void backgroundTouched();
    void savePressed();
    void cancelPressed();

    // The file's root dictionary for a description (an empty one counts as missing).
    PlistValue snapshotDictionary(const std::string& description) const;
    // The file's path for a save at the given moment.
    static std::string snapshotPath(const std::string& directory, double secondsSince1970);

  private:
    void hideKeyboard();
    void queueCloseSaveView();

    double _timeStamp;
    PlistValue _saveHistory;
    VelmarShell& application_;
    SaveScreenView* view_ = nullptr;
};

}  // namespace velmar
