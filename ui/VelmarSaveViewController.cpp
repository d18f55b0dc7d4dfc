#include "ui/VelmarSaveViewController.h"

#include <cmath>

#include "core/platform/Clock.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "ui/DiagnosticLogDirectory.h"
#include "ui/SnapshotFileWriter.h"
#include "ui/VelmarShell.h"

namespace velmar {

VelmarSaveViewController::VelmarSaveViewController(const PlistValue& saveHistory, VelmarShell& application)
    : _timeStamp(Clock::now()), _saveHistory(saveHistory.shallowCopy()), application_(application) {}

std::size_t VelmarSaveViewController::numberOfRows() const {
    const PlistArrayRef& entries = _saveHistory.array();
    return entries ? entries->size() : 0;
}

std::string VelmarSaveViewController::rowText(std::size_t row) const {
    const PlistArrayRef& entries = _saveHistory.array();
    if (!entries || row >= entries->size()) {
        return {};
    }
    const PlistDictionaryRef& entry = entries->at(row).dictionary();
    const std::string* text = entry ? entry->get("Description").string() : nullptr;
    return text ? *text : std::string();
}

void VelmarSaveViewController::hideKeyboard() {
    if (view_ != nullptr) {
        view_->resignDescriptionFocus();
    }
}

void VelmarSaveViewController::didSelectRow(std::size_t) {
    hideKeyboard();
}

bool VelmarSaveViewController::textFieldShouldReturn() {
    hideKeyboard();
    return true;
}

void VelmarSaveViewController::backgroundTouched() {
    hideKeyboard();
}

PlistValue VelmarSaveViewController::snapshotDictionary(const std::string& description) const {
    auto snapshot = PlistDictionary::create();
    snapshot->set("Timestamp", Clock::utcDescription(_timeStamp));
    if (_saveHistory.isNone()) {
        return snapshot;
    }
    snapshot->set("Data", _saveHistory);
    if (!description.empty()) {
        snapshot->set("Description", description);
    }
    return snapshot;
}

std::string VelmarSaveViewController::snapshotPath(const std::string& directory, double secondsSince1970) {
    return stringWithFormat("%s/VelmarSnapshot-%ld.velmar", directory.c_str(),
                            static_cast<long>(std::floor(secondsSince1970)));
}

void VelmarSaveViewController::savePressed() {
    const PlistValue snapshot = snapshotDictionary(view_ ? view_->descriptionText() : std::string());
    std::string why;
    const std::optional<std::string> directory = DiagnosticLogDirectory::create(&why);
    const std::string path = snapshotPath(directory.value_or(DiagnosticLogDirectory::path()), Clock::now());
    if (!directory || !writeSnapshotFile(snapshot, path, &why)) {
        SystemLog::log(kLogError, "Unable to write snapshot to %s", path.c_str());
        SystemLog::log(kLogError, "Snapshot not written: %s", why.c_str());
        application_.showAlert(kFileErrorTitle, kFileErrorMessage, kFileErrorButton);
    }
    queueCloseSaveView();
}

void VelmarSaveViewController::cancelPressed() {
    queueCloseSaveView();
}

void VelmarSaveViewController::queueCloseSaveView() {
    VelmarShell& application = application_;
    std::weak_ptr<bool> alive = application.aliveToken();
    application.queue().async([&application, alive] {
        if (!alive.expired()) {
            application.closeSaveView();
        }
    });
}

}  // namespace velmar
