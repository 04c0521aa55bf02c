// The curve set panels of the full editor's controller: the manager, which edits working
// copies of the custom sets in a modal run that Done keeps and Cancel throws away, its table's
// data source (rename, kind, shortcut, reorder by drag), and the panel that makes a new set.

#include <algorithm>
#include <cctype>

#include "platform/support/BNStringCase.h"
#include "platform/ui/RWAlert.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveSetManagerList.h"
#include "src/resources/TQStrings.h"

namespace {

RWModalService& modal() { return *RWApplicationServices().modal; }

bool isBlank(const std::string& text) {
    return std::all_of(text.begin(), text.end(),
                       [](char c) { return std::isspace(static_cast<unsigned char>(c)) != 0; });
}

// One character, however many bytes it takes in UTF-8.
bool isOneCharacter(const std::string& text) {
    if (text.empty()) return false;
    const auto lead = static_cast<unsigned char>(text[0]);
    const size_t length = lead < 0x80 ? 1 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : 4;
    return text.size() == length;
}

}  // namespace

// ---- The manager -----------------------------------------------------------------------------

TQCurveSetPtr TQCurveEditorCtrl::curveSetAtRow(int64_t row) const {
    if (row < 0 || row >= static_cast<int64_t>(_curveSets.size())) return nullptr;
    return _curveSets[static_cast<size_t>(row)];
}

void TQCurveEditorCtrl::selectManagerRow(int64_t row) {
    if (!_curveSetManagerList) return;
    _curveSetManagerList->selectRowIndexes(RWIndexSet{row}, false);
    _curveSetManagerList->scrollRowToVisible(row);
}

void TQCurveEditorCtrl::showCurveSet(RWActionSender*) {
    // One manager at a time: the sets kept aside are those of the run already open.
    if (!_curveSetManagerPanel || _curveSetsTemp) return;
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    std::vector<TQCurveSetPtr> copies;
    copies.reserve(_curveSets.size());
    for (const TQCurveSetPtr& set : _curveSets) copies.push_back(set ? set->copy() : nullptr);
    const BNString shownName = curveSetName(_selectedCurveSet.get());
    _shownBeforeManaging = _selectedCurveSet;
    _curveSetsTemp = std::move(_curveSets);
    _curveSets = std::move(copies);
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    for (size_t row = 0; row < _curveSets.size(); ++row) {
        if (!_curveSets[row] || _curveSets[row]->curveSetName() != shownName) continue;
        setSelectedCurveSet(_curveSets[row]);
        selectManagerRow(static_cast<int64_t>(row));
        break;
    }
    refreshPopUp();
    modal().runModalForWindow(*_curveSetManagerPanel);
    // Done left the copies as the custom sets, Cancel the originals: the others go.
    _curveSetsTemp.reset();
    _shownBeforeManaging.reset();
}

void TQCurveEditorCtrl::curveSetManagerApply(RWActionSender*) {
    // No row selected: there is no set to show (the toolkit's array access would fail).
    const TQCurveSetPtr set =
        curveSetAtRow(_curveSetManagerList ? _curveSetManagerList->selectedRow() : -1);
    if (!set) return;
    setSelectedCurveSet(set);
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    updateUI();
}

void TQCurveEditorCtrl::curveSetManagerDone(RWActionSender*) {
    _curveSetValid = true;
    // The reload ends a rename in progress, which may refuse its name.
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    if (!_curveSetValid) return;
    modal().stopModal();
    if (_curveSetManagerPanel) _curveSetManagerPanel->setIsVisible(false);
    updateUI();
    refreshPopUp();
}

void TQCurveEditorCtrl::curveSetManagerCancel(RWActionSender*) {
    // A rename still open must not land on the restored sets.
    if (_curveSetManagerList) _curveSetManagerList->abortEditing();
    modal().stopModal();
    if (_curveSetManagerPanel) _curveSetManagerPanel->setIsVisible(false);
    if (!_curveSetsTemp) return;
    std::swap(_curveSets, *_curveSetsTemp);
    const BNString shownName = curveSetName(_selectedCurveSet.get());
    const auto same = std::find_if(_curveSets.begin(), _curveSets.end(), [&](const auto& set) {
        return set && set->curveSetName() == shownName;
    });
    if (same != _curveSets.end()) {
        setSelectedCurveSet(*same);
    } else if (_shownBeforeManaging && _selectedCurveSet != _shownBeforeManaging) {
        // The shown copy was renamed or removed, or the emptied list showed All: what showed
        // before the manager opened comes back, so that Cancel leaves nothing of the run.
        setSelectedCurveSet(_shownBeforeManaging);
    }
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    updateUI();
    refreshPopUp();
}

void TQCurveEditorCtrl::plusMinusPressed(RWActionSender* sender) {
    const auto* pair = dynamic_cast<const RWSegmentedControl*>(sender);
    if (!pair) pair = _plusMinusSegmentedControl.get();
    if (pair && pair->selectedSegment() == 0)
        curveSetManagerNew(sender);
    else
        curveSetManagerDelete(sender);
}

void TQCurveEditorCtrl::curveSetManagerNew(RWActionSender*) {
    // Unique by the list alone: no number of gNewCurveSetIndex here.
    createCurveSetWithName(TQLocalizedString("Curve Editor Curve Set Untitled"));
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    selectManagerRow(static_cast<int64_t>(_curveSets.size()) - 1);
}

void TQCurveEditorCtrl::curveSetManagerDelete(RWActionSender*) {
    const int64_t row = _curveSetManagerList ? _curveSetManagerList->selectedRow() : -1;
    const TQCurveSetPtr set = curveSetAtRow(row);
    // No row selected: nothing to remove (the toolkit's array access would fail).
    if (!set) return;
    removeCurveSet(set.get());
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    if (_curveSets.empty()) {
        setSelectedCurveSet(_curveSetAll);
        return;
    }
    // The shown set stays as it is, even when it was the one removed.
    selectManagerRow(row > 0 ? row - 1 : 0);
}

void TQCurveEditorCtrl::curveSetManagerDuplicate(RWActionSender*) {
    const TQCurveSetPtr set =
        curveSetAtRow(_curveSetManagerList ? _curveSetManagerList->selectedRow() : -1);
    if (!set) return;
    cloneCurveSet(*set);
    if (_curveSetManagerList) _curveSetManagerList->reloadData();
    selectManagerRow(static_cast<int64_t>(_curveSets.size()) - 1);
}

// ---- The manager's table ---------------------------------------------------------------------

int64_t TQCurveEditorCtrl::numberOfRowsInTableView(RWTableView&) {
    return static_cast<int64_t>(_curveSets.size());
}

RWObjectValue TQCurveEditorCtrl::objectValueForTableColumn(RWTableView&,
                                                           const RWTableColumn& column,
                                                           int64_t row) {
    const TQCurveSetPtr set = curveSetAtRow(row);
    if (!set) return {};
    if (column.identifier() == kNameColumn) return RWObjectValue(set->curveSetName());
    if (column.identifier() == kShortcutColumn) return RWObjectValue(set->curveSetShortcut());
    return {};
}

void TQCurveEditorCtrl::willDisplayCell(RWTableView&, RWCell& cell, const RWTableColumn& column,
                                        int64_t row) {
    const TQCurveSetPtr set = curveSetAtRow(row);
    auto* box = dynamic_cast<RWButtonCell*>(&cell);
    if (!set || !box || column.identifier() != kRelativeColumn) return;
    box->setAllowsMixedState(false);
    box->setState(set->isRelative() ? RWOnState : RWOffState);
}

bool TQCurveEditorCtrl::isShortcutTaken(const BNString& shortcut, const TQCurveSet* except) const {
    auto has = [&](const TQCurveSet* set) {
        return set && set != except && set->curveSetShortcut() == shortcut;
    };
    const auto automatic = automaticCurveSets();
    return std::any_of(automatic.begin(), automatic.end(), has) ||
           std::any_of(_curveSets.begin(), _curveSets.end(),
                       [&](const TQCurveSetPtr& set) { return has(set.get()); });
}

void TQCurveEditorCtrl::setObjectValue(RWTableView&, const RWObjectValue& value,
                                       const RWTableColumn& column, int64_t row) {
    const TQCurveSetPtr set = curveSetAtRow(row);
    if (!set) return;
    if (column.identifier() == kRelativeColumn) {
        set->setRelative(value.intValue() != 0);
    } else if (column.identifier() == kNameColumn) {
        const std::string name = value.stringValue();
        // A name of nothing but blanks could not be told from another in the pop-up: the
        // cell shows the old name again.
        if (isBlank(name)) return;
        const bool taken = std::any_of(_curveSets.begin(), _curveSets.end(), [&](const auto& s) {
            return s && s != set && s->curveSetName() == name;
        });
        if (taken) {
            RWAlert alert;
            alert.setMessageText(TQLocalizedString("Curve Editor Curve Set"));
            alert.setInformativeText(TQLocalizedString("Curve Editor Curve Set Exist"));
            alert.setAlertStyle(RWAlertStyleWarning);
            alert.runModal();
            _curveSetValid = false;
            return;
        }
        set->setCurveSetName(name);
    } else if (column.identifier() == kShortcutColumn) {
        const BNString key = BNLowercaseString(value.stringValue());
        // One key, free among all the sets, or none; anything else leaves the shortcut.
        if (!key.empty() && (!isOneCharacter(key) || isShortcutTaken(key, set.get()))) return;
        set->setCurveSetShortcut(key);
    }
    updateUI();
}

bool TQCurveEditorCtrl::writeRows(RWTableView&, const std::vector<int64_t>& rows,
                                  RWPasteboard& pasteboard) {
    _draggedRows = rows;
    pasteboard.declareTypes({kPrivateDragType});
    return true;
}

uint64_t TQCurveEditorCtrl::validateDrop(RWTableView& table, RWDraggingInfo&, int64_t row,
                                         RWTableViewDropOperation) {
    table.setDropRow(row, RWTableViewDropOperation::Above);
    return RWDragOperationMove;
}

bool TQCurveEditorCtrl::acceptDrop(RWTableView& table, RWDraggingInfo&, int64_t row,
                                   RWTableViewDropOperation) {
    const auto count = static_cast<int64_t>(_curveSets.size());
    for (const int64_t dragged : _draggedRows) {
        // Rows of a drag that a reload overtook.
        if (dragged < 0 || dragged >= static_cast<int64_t>(_curveSets.size())) continue;
        const TQCurveSetPtr set = _curveSets[static_cast<size_t>(dragged)];
        _curveSets.erase(_curveSets.begin() + dragged);
        if (row > dragged) --row;
        if (row < count && row <= static_cast<int64_t>(_curveSets.size()))
            _curveSets.insert(_curveSets.begin() + row, set);
        else
            _curveSets.push_back(set);
    }
    _draggedRows.clear();
    table.reloadData();
    table.selectRowIndexes(RWIndexSet{row}, false);
    return true;
}

// ---- The new-set panel -----------------------------------------------------------------------

void TQCurveEditorCtrl::showNewCurveSet(RWActionSender*) {
    if (!_curveSetNewPanel) return;
    if (_curveSetNewName) {
        _curveSetNewName->setStringValue(TQLocalizedString("Curve Editor Curve Set Untitled"));
        // Typing replaces the suggestion.
        _curveSetNewName->selectText();
        _curveSetNewPanel->makeFirstResponder(_curveSetNewName);
    }
    refreshPopUp();
    modal().runModalForWindow(*_curveSetNewPanel);
}

void TQCurveEditorCtrl::newCurveSetOk(RWActionSender*) {
    BNString name = _curveSetNewName ? _curveSetNewName->stringValue() : BNString();
    if (isBlank(name)) name = TQLocalizedString("Curve Editor Curve Set Untitled");
    // The new set starts from what the shown set holds now.
    cloneCurveSetWithName(name);
    // Counted although the name does not use it, as the numbering of added sets expects.
    ++gNewCurveSetIndex;
    modal().stopModal();
    if (_curveSetNewPanel) _curveSetNewPanel->setIsVisible(false);
    updateUI();
    refreshPopUp();
    if (_pAppDelegate)
        _pAppDelegate->addToUndo(this, kTQUndoTypeController, kTQUndoActionNewCurveSet,
                                 TQLocalizedString("Curve Editor Undo New Curve Set"));
}

void TQCurveEditorCtrl::newCurveSetCancel(RWActionSender*) {
    modal().stopModal();
    if (_curveSetNewPanel) _curveSetNewPanel->setIsVisible(false);
    updateUI();
    refreshPopUp();
}
