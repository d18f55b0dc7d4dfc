#include "ui/terminal/TerminalSaveForm.h"

#include <algorithm>

#include "ui/VelmarSaveViewController.h"
#include "ui/terminal/TerminalText.h"

namespace velmar {

namespace {

constexpr int kMaxWidth = 72;
constexpr int kMinWidth = 24;

}  // namespace

TerminalSaveForm::TerminalSaveForm(VelmarSaveViewController& controller) : controller_(&controller) {
    controller.setView(this);
}

TerminalSaveForm::~TerminalSaveForm() {
    detach();
}

void TerminalSaveForm::detach() {
    if (controller_ != nullptr) {
        controller_->setView(nullptr);
        controller_ = nullptr;
    }
}

std::string TerminalSaveForm::descriptionText() const {
    return TerminalText::encodeUtf8(text_);
}

void TerminalSaveForm::resignDescriptionFocus() {
    if (focus_ == Focus::Description) {
        focus_ = Focus::Save;
    }
}

std::size_t TerminalSaveForm::rows() const {
    return controller_ ? controller_->numberOfRows() : 0;
}

void TerminalSaveForm::moveFocus(int step) {
    static constexpr Focus kOrder[] = {Focus::Description, Focus::History, Focus::Save, Focus::Cancel};
    int index = 0;
    for (int i = 0; i < 4; ++i) {
        if (kOrder[i] == focus_) {
            index = i;
        }
    }
    do {
        index = (index + step + 4) % 4;
    } while (kOrder[index] == Focus::History && rows() == 0);
    focus_ = kOrder[index];
}

void TerminalSaveForm::handleKey(const TerminalKey& key) {
    if (controller_ == nullptr) {
        return;
    }
    using Kind = TerminalKey::Kind;
    switch (key.kind) {
        case Kind::Escape:
            controller_->cancelPressed();
            return;
        case Kind::Tab:
            moveFocus(1);
            return;
        case Kind::BackTab:
            moveFocus(-1);
            return;
        default:
            break;
    }
    switch (focus_) {
        case Focus::Description:
            switch (key.kind) {
                case Kind::Character:
                    text_.insert(text_.begin() + cursor_, key.ch);
                    ++cursor_;
                    break;
                case Kind::Backspace:
                    if (cursor_ > 0) {
                        text_.erase(text_.begin() + cursor_ - 1);
                        --cursor_;
                    }
                    break;
                case Kind::Delete:
                    if (cursor_ < static_cast<int>(text_.size())) {
                        text_.erase(text_.begin() + cursor_);
                    }
                    break;
                case Kind::Left:
                    cursor_ = std::max(0, cursor_ - 1);
                    break;
                case Kind::Right:
                    cursor_ = std::min(static_cast<int>(text_.size()), cursor_ + 1);
                    break;
                case Kind::Home:
                    cursor_ = 0;
                    break;
                case Kind::End:
                    cursor_ = static_cast<int>(text_.size());
                    break;
                case Kind::Enter:
                    // Return ends the description and saves, as the user who typed it means; Esc cancels.
                    controller_->textFieldShouldReturn();
                    controller_->savePressed();
                    break;
                case Kind::Down:
                    moveFocus(1);
                    break;
                default:
                    break;
            }
            return;
        case Focus::History: {
            const int count = static_cast<int>(rows());
            switch (key.kind) {
                case Kind::Up:
                    if (historyRow_ == 0) {
                        focus_ = Focus::Description;
                    } else {
                        --historyRow_;
                    }
                    break;
                case Kind::Down:
                    historyRow_ = std::min(count - 1, historyRow_ + 1);
                    break;
                case Kind::Home:
                    historyRow_ = 0;
                    break;
                case Kind::End:
                    historyRow_ = std::max(0, count - 1);
                    break;
                case Kind::Enter:
                    controller_->didSelectRow(static_cast<std::size_t>(historyRow_));
                    break;
                default:
                    break;
            }
            return;
        }
        case Focus::Save:
        case Focus::Cancel:
            switch (key.kind) {
                case Kind::Left:
                case Kind::Right:
                    focus_ = focus_ == Focus::Save ? Focus::Cancel : Focus::Save;
                    break;
                case Kind::Up:
                    moveFocus(-1);
                    break;
                case Kind::Enter:
                    if (focus_ == Focus::Save) {
                        controller_->savePressed();
                    } else {
                        controller_->cancelPressed();
                    }
                    break;
                default:
                    if (key.is(U' ')) {
                        if (focus_ == Focus::Save) {
                            controller_->savePressed();
                        } else {
                            controller_->cancelPressed();
                        }
                    }
                    break;
            }
            return;
    }
}

void TerminalSaveForm::draw(TerminalCanvas& canvas) const {
    const bool ascii = canvas.ascii();
    const int count = static_cast<int>(rows());
    const int width = std::min(kMaxWidth, canvas.columns() - 4);
    if (width < kMinWidth || canvas.rows() < 10) {
        // Too small for a form: one line that says so.
        canvas.fill(0, 0, canvas.columns(), kAttrReverse);
        canvas.put(0, 0, "Save: enlarge the terminal (Esc cancels)", kAttrReverse);
        return;
    }
    // Border, blank, field, blank, heading, history..., blank, buttons, hint border.
    const int fixed = 8;
    const int historyRows = std::clamp(count, 1, std::max(1, canvas.rows() - 2 - fixed));
    const int height = fixed + historyRows;
    const int top = std::max(0, (canvas.rows() - height) / 2);
    const int left = (canvas.columns() - width) / 2;
    canvas.box(top, left, height, width);
    canvas.put(top, left + 2, " Save Snapshot ", kAttrBold);

    // The description field.
    const int fieldRow = top + 2;
    const std::string label = "Description: ";
    const int fieldLeft = canvas.put(fieldRow, left + 2, label, kAttrNormal);
    const int fieldWidth = left + width - 2 - fieldLeft;
    const bool editing = focus_ == Focus::Description;
    canvas.fill(fieldRow, fieldLeft, fieldLeft + fieldWidth, kAttrUnderline);
    // Shows the part of the text around the cursor.
    int first = 0;
    while (TerminalText::width(std::u32string_view(text_).substr(static_cast<std::size_t>(first),
                                                                 static_cast<std::size_t>(cursor_ - first)),
                               ascii) > fieldWidth - 1) {
        ++first;
    }
    const std::u32string_view visible = std::u32string_view(text_).substr(static_cast<std::size_t>(first));
    const int cursorColumn =
        canvas.put(fieldRow, fieldLeft, visible.substr(0, static_cast<std::size_t>(cursor_ - first)),
                   kAttrUnderline, fieldLeft, fieldLeft + fieldWidth);
    canvas.put(fieldRow, cursorColumn, visible.substr(static_cast<std::size_t>(cursor_ - first)),
               kAttrUnderline, fieldLeft, fieldLeft + fieldWidth);
    if (editing && cursorColumn < fieldLeft + fieldWidth) {
        const TerminalCell& under = canvas.at(fieldRow, cursorColumn);
        canvas.fill(fieldRow, cursorColumn, cursorColumn + 1, kAttrReverse,
                    under.continuation ? U' ' : under.ch);
    }

    // The history list.
    const int headingRow = top + 4;
    canvas.put(
        headingRow, left + 2,
        count == 1 ? std::string("History: 1 entry") : "History: " + std::to_string(count) + " entries",
        kAttrBold);
    if (historyRow_ < historyTop_) {
        historyTop_ = historyRow_;
    } else if (historyRow_ >= historyTop_ + historyRows) {
        historyTop_ = historyRow_ - historyRows + 1;
    }
    for (int line = 0; line < historyRows && historyTop_ + line < count; ++line) {
        const int row = historyTop_ + line;
        const int canvasRow = headingRow + 1 + line;
        const bool selected = focus_ == Focus::History && row == historyRow_;
        const std::uint8_t attr = selected ? kAttrReverse : kAttrNormal;
        canvas.fill(canvasRow, left + 2, left + width - 2, attr);
        canvas.put(canvasRow, left + 3, std::u32string(1, ascii ? U'*' : U'✓'), attr, 0, canvas.columns());
        canvas.put(
            canvasRow, left + 5,
            TerminalText::decodeUtf8(controller_ ? controller_->rowText(static_cast<std::size_t>(row)) : ""),
            attr, left + 5, left + width - 2);
    }

    // The buttons, centred.
    const int buttonRow = top + height - 2;
    const std::string save = "[ Save ]";
    const std::string cancel = "[ Cancel ]";
    const int buttonsWidth = static_cast<int>(save.size() + 3 + cancel.size());
    const int buttonsLeft = left + (width - buttonsWidth) / 2;
    canvas.put(buttonRow, buttonsLeft, save, focus_ == Focus::Save ? kAttrReverse | kAttrBold : kAttrBold);
    canvas.put(buttonRow, buttonsLeft + static_cast<int>(save.size()) + 3, cancel,
               focus_ == Focus::Cancel ? kAttrReverse : kAttrNormal);
    canvas.put(top + height - 1, left + 2, " Tab: next  Enter: choose  Esc: cancel ", kAttrDim);
}

}  // namespace velmar
