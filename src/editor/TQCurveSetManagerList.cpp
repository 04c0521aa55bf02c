#include "src/editor/TQCurveSetManagerList.h"

#include "src/editor/TQCurveEditorCtrl.h"

void TQCurveSetManagerList::setDelegate(TQCurveEditorCtrl* delegate) {
    setDataSource(delegate);
    setTableDelegate(delegate);
}

void TQCurveSetManagerList::delete_(RWActionSender*) {
    TQCurveEditorCtrl* controller = _mainCurveEditorController;
    const int64_t row = selectedRow();
    if (!controller || row < 0) return;
    std::vector<TQCurveSetPtr>& sets = controller->_mutableCurveSets();
    if (row >= static_cast<int64_t>(sets.size())) return;
    sets.erase(sets.begin() + row);
    if (!sets.empty()) {
        // The row above as an unsigned 32-bit number: below row 0 it wraps far past the end,
        // where the selection takes no row.
        const auto above = static_cast<uint32_t>(row - 1);
        selectRowIndexes(RWIndexSet{static_cast<int64_t>(above)}, false);
    }
    reloadData();
    // Word 8, the finished change of channels, is what the list has always posted here.
    if (TQCurveEditorAppDelegate* delegate = controller->appDelegate())
        delegate->postNotification(kTQNotifyChannelsChanged);
}
