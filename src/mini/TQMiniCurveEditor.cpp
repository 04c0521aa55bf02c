#include "src/mini/TQMiniCurveEditor.h"

#include "src/resources/TQStrings.h"

TQMiniCurveEditor::TQMiniCurveEditor(TQCurveEditorAppDelegate* hostDelegate)
    : _hostDelegate(hostDelegate),
      _curveEditorView(std::make_unique<TQMiniCurveEditorView>()),
      _axisX(std::make_shared<RWTextField>()),
      _axisY(std::make_shared<RWTextField>()) {
    _curveEditorView->setCurveEditor(this);
}

TQMiniCurveEditor::~TQMiniCurveEditor() {
    // The controller detaches itself from the view; it goes first.
    _curveEditorCtrl.reset();
}

void TQMiniCurveEditor::layOut(const CGRect& master, const CGRect& view, const CGRect& axisY,
                               const CGRect& axisX) {
    _masterFrame = master;
    _curveEditorViewFrame = view;
    _curveEditorView->setFrameSize(view.size);
    for (RWTextField* label : {_axisY.get(), _axisX.get()}) label->setEditable(false);
    _axisY->setFrame(axisY);
    _axisX->setFrame(axisX);
    _axisY->setPlaceholderString(TQLocalizedString("Mini Curve Editor Y Label"));
    _axisX->setPlaceholderString(TQLocalizedString("Mini Curve Editor X Label"));
}

void TQMiniCurveEditor::setCurveEditorViewFrame(const CGRect& frame) {
    _curveEditorViewFrame = frame;
    _curveEditorView->setFrameSize(frame.size);
}

std::unique_ptr<TQMiniCurveEditorCtrl> TQMiniCurveEditor::allocCurveEditorController(
    TQChannelBase* channel) {
    auto ctrl = std::make_unique<TQMiniCurveEditorCtrl>(_hostDelegate);
    ctrl->initWithView(_curveEditorView.get(), channel);
    return ctrl;
}

void TQMiniCurveEditor::setChannel(TQChannelBase* channel) {
    _curveEditorCtrl.reset();
    _curveEditorView->reset();
    _curveEditorCtrl = allocCurveEditorController(channel);
    _axisY->setStringValue(channel ? channel->getName() : BNString());
    _axisX->setStringValue(channel ? channel->getXAxisLabel() : BNString());
}

void TQMiniCurveEditor::update() {
    if (_curveEditorCtrl) _curveEditorCtrl->update();
    _curveEditorView->update();
}

void TQMiniCurveEditor::setEnabled(bool enabled) {
    _curveEditorView->setEnabled(enabled);
    _axisX->setEnabled(enabled);
    _axisY->setEnabled(enabled);
}

void TQMiniCurveEditor::setTotalRange(const CMTime* start, const CMTime* duration) {
    _curveEditorView->setTotalRange(start, duration);
    if (_curveEditorCtrl && start)
        _curveEditorCtrl->allowNegativeRange(CMTimeCompare(*start, kCMTimeZero) < 0);
}

void TQMiniCurveEditor::setDisplayRange(const CMTime* start, const CMTime* duration) {
    _curveEditorView->setDisplayRange(start, duration);
}

TQCurveEditorAppDelegate* TQMiniCurveEditor::appDelegate() const {
    return _curveEditorCtrl ? _curveEditorCtrl->appDelegate() : nullptr;
}

// ---- The selected keypoint -----------------------------------------------------------------

CMTime TQMiniCurveEditor::getSelectedValueX() const {
    return _curveEditorCtrl ? _curveEditorCtrl->getSelectedValueX() : kCMTimeZero;
}

double TQMiniCurveEditor::getSelectedValueY() const {
    return _curveEditorCtrl ? _curveEditorCtrl->getSelectedValueY() : 0.0;
}

bool TQMiniCurveEditor::hasSelection() const {
    return _curveEditorCtrl && _curveEditorCtrl->hasSelection();
}

void TQMiniCurveEditor::setSelectedValueY(double y) {
    if (_curveEditorCtrl) _curveEditorCtrl->moveSelectedInY(_curveEditorView->getSelection(), y);
}

void TQMiniCurveEditor::setSelectedValueX(CMTime x) {
    if (_curveEditorCtrl) _curveEditorCtrl->moveSelectedInX(_curveEditorView->getSelection(), x);
}

double TQMiniCurveEditor::getSelectedValueYForChannel(const TQChannelBase* channel) const {
    const auto* c = dynamic_cast<const TQChannel*>(channel);
    return c ? c->getCurveValue(getSelectedValueX(), false) : 0.0;
}

void TQMiniCurveEditor::setSelectedValueY(double y, TQChannelBase* channel) {
    auto* c = dynamic_cast<TQChannel*>(channel);
    if (!c) return;
    c->noteWillChange(true);
    c->setKeyframe(getSelectedValueX(), y, true);
    if (!_curveEditorCtrl) return;
    const TQCurveSetPtr& set = _curveEditorCtrl->selectedCurveSet();
    const TQCurveEditorItemPtr item = set ? set->itemWithChannel(c) : nullptr;
    if (auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get()))
        channelItem->setOriginalCurveDirty(1);
    const double v = _curveEditorCtrl->convertFromChannelCoords(item.get(), y);
    const CGRect& volume = _curveEditorView->getCurrentViewVolume();
    const CGPoint probe = CGPointMake(CGRectGetMidX(volume), v);
    if (_curveEditorView->autoZoom() && !CGRectContainsPoint(volume, probe))
        _curveEditorView->performAutoZoom(true);
}

void TQMiniCurveEditor::didEndModifyingSelectedX() {
    if (!_curveEditorCtrl) return;
    TQCurveSelectionList* list = _curveEditorView->getSelection();
    _curveEditorCtrl->validateSelection(list);
    _curveEditorCtrl->cleanSelection(list);
    _curveEditorCtrl->purgeSelected(list);
}

// ---- Heads-up form -------------------------------------------------------------------------

TQMiniCurveEditorHUD::TQMiniCurveEditorHUD(TQCurveEditorAppDelegate* hostDelegate)
    : TQMiniCurveEditor(hostDelegate) {
    _curveEditorView->setIsHUD(true);
    layOut(CGRectMake(1.0, 1.0, 226.0, 142.0), CGRectMake(22.0, 20.0, 177.0, 114.0),
           CGRectMake(20.0, 19.0, 76.0, 12.0), CGRectMake(20.0, 5.0, 76.0, 12.0));
}

void TQMiniCurveEditorHUD::setChannel(TQChannelBase* channel) {
    TQMiniCurveEditor::setChannel(channel);
    _curveEditorView->setAutoZoom(1);
}
